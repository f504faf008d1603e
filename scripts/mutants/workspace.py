"""A copy of the tree with its own builds, in which faults are planted; and the test programs that run there."""

import fcntl
import hashlib
import json
import os
import re
import resource
import shutil
import signal
import subprocess
import time
from pathlib import Path

from mutants.faults import plant

# The folders that affect which faults are seen.
WATCHED = ("CMakeLists.txt", "CMakePresets.json", "apps", "cmake", "java", "moka", "scenes", "tests")
# Entries of CTest that are no GoogleTest program of their name, by the beginning of theirs: the folder that has them
# (CTest looks through the others for nothing), and what they need built.
ENTRIES = {
    "moka_java": ("tests/jvm", ("moka_jvm_host", "moka_jvm_test_programs", "moka_graphics")),
    "moka_drawable_shaders": ("tests/unit/drawable", ()),
    "moka_pixel_window_tests": ("tests/pixel/host", ("moka_pixel_window_tests",)),
    "moka_soak_gles": ("tests/trust", ("moka_soak_gles",)),
    "readme.Draw": ("tests/readme", ("moka_readme", "moka")),
}
ANGLE = "angle:"  # before a program's name: on the second driver, as scripts/fetch-angle has brought it
MEMORY_LIMIT = 16 << 30  # bytes of address space: a fault may allocate without end
PATIENCE = 3  # times as long as without a fault, then a program hangs


class WorkspaceError(Exception):
    """The copy without a fault does not build or does not pass its tests."""


def _git_files(root):
    listed = subprocess.run(["git", "ls-files", "-z", "--cached", "--others", "--exclude-standard"], cwd=root,
                            check=True, stdout=subprocess.PIPE).stdout.decode()
    return sorted(name for name in set(listed.split("\0")) if name and (Path(root) / name).is_file())


def tree_hash(root):
    """A hash of all files in the working tree that affect which faults are seen."""
    digest = hashlib.sha256()
    for name in _git_files(root):
        if name.split("/")[0] in WATCHED and not name.startswith("tests/mutants/"):
            digest.update(f"{name}\0{hashlib.sha256((Path(root) / name).read_bytes()).hexdigest()}\n".encode())
    return digest.hexdigest()[:12]


class Workspace:
    def __init__(self, root):
        self.root = Path(root)
        self.folder = self.root / "build/mutants"
        self.tree = self.folder / "tree"
        self.planted = None
        self.baselines = {}
        self.folder.mkdir(parents=True, exist_ok=True)
        self._lock = open(self.folder / "lock", "w")
        try:
            fcntl.flock(self._lock, fcntl.LOCK_EX | fcntl.LOCK_NB)
        except OSError:
            raise WorkspaceError(f"another run is using {self.folder}; wait for it") from None
        self.tree_hash = tree_hash(root)
        self._refresh()

    # --- the copy

    def _refresh(self):
        """Makes the copy equal to the working tree, also where an interrupted run left a fault in it."""
        names = _git_files(self.root)
        for name in names:
            source, target = self.root / name, self.tree / name
            if target.is_file() and target.read_bytes() == source.read_bytes():
                continue
            target.parent.mkdir(parents=True, exist_ok=True)
            shutil.copyfile(source, target)
            shutil.copymode(source, target)
        known = set(names)
        for folder, folders, files in os.walk(self.tree):
            relative = os.path.relpath(folder, self.tree)
            if relative == ".":
                folders[:] = [name for name in folders if name != "build"]
            for name in files:
                path = os.path.normpath(os.path.join(relative, name))
                if path not in known:
                    (self.tree / path).unlink()

    def build_folder(self, preset):
        return self.tree / "build" / preset

    def configure(self, preset):
        environment = dict(os.environ)
        if shutil.which("ccache"):
            # The objects of the working tree's own build then serve here as well.
            environment.setdefault("CMAKE_CXX_COMPILER_LAUNCHER", "ccache")
        # A changed library changes what runs against it without linking it anew; and linking takes the longest.
        command = ["cmake", "--preset", preset, "-DMOKA_BUILD_BENCHMARKS=OFF", "-DCMAKE_LINK_DEPENDS_NO_SHARED=ON",
                   "-DCMAKE_EXE_LINKER_FLAGS=-Wl,--strip-debug", "-DCMAKE_SHARED_LINKER_FLAGS=-Wl,--strip-debug"]
        self._run(command, environment)
        listed = self._run(["ninja", "-C", str(self.build_folder(preset)), "-t", "targets", "all"])
        self._targets = {line.partition(":")[0] for line in listed.splitlines()}
        self._compiled = {os.path.relpath(entry["file"], self.tree) for entry in
                          json.loads((self.build_folder(preset) / "compile_commands.json").read_text())}

    def _run(self, command, environment=None):
        done = subprocess.run(command, cwd=self.tree, env=environment, stdout=subprocess.PIPE,
                              stderr=subprocess.STDOUT)
        if done.returncode != 0:
            raise WorkspaceError(f"'{' '.join(command)}' failed:\n{done.stdout.decode(errors='replace')[-3000:]}")
        return done.stdout.decode(errors="replace")

    def is_compiled(self, fault):
        """False for a source that this machine does not build, for instance without a JDK."""
        return not fault.file.endswith(".cpp") or fault.file in self._compiled

    # --- building

    def has(self, program):
        """False for programs that this machine cannot run: without a JDK, or without ANGLE."""
        if program.startswith(ANGLE) and not (self.root / "third_party/angle").is_dir():
            return False
        return self._targets.issuperset(self.targets_of(program))

    def entry_of(self, program):
        """None for a GoogleTest program."""
        return ENTRIES.get(program.partition(".")[0], ENTRIES.get(program))

    def targets_of(self, program):
        entry = self.entry_of(program)
        return entry[1] if entry else (program.removeprefix(ANGLE),)

    def build(self, preset, programs):
        """None, or the compiler's error."""
        targets = sorted({target for program in programs for target in self.targets_of(program)})
        if not targets:
            return None
        command = ["cmake", "--build", "--preset", preset, "-j", str(os.cpu_count()), "--target", *targets]
        # Paths that the compiler's cache treats as equal.
        environment = {"CCACHE_BASEDIR": str(self.root), "CCACHE_NOHASHDIR": "1", **os.environ}
        done = subprocess.run(command, cwd=self.tree, env=environment, stdout=subprocess.PIPE,
                              stderr=subprocess.STDOUT)
        return None if done.returncode == 0 else done.stdout.decode(errors="replace")

    def plant(self, fault):
        path = self.tree / fault.file
        if self.planted and self.planted[2] is fault:
            return
        self.restore()
        original = path.read_text()
        self.planted = (path, original, fault)
        path.write_text(plant(original, fault))

    def restore(self):
        """Removes the planted fault. The next build compiles the file again."""
        if self.planted:
            path, original, _ = self.planted
            path.write_text(original)
            self.planted = None

    # --- running

    def _command(self, preset, program):
        build = self.build_folder(preset)
        if entry := self.entry_of(program):
            return ["ctest", "--test-dir", str(build / entry[0]), "-R", "^" + re.escape(program), "--no-tests=error",
                    "--stop-on-failure", "--output-on-failure"], build
        name = program.removeprefix(ANGLE)
        found = [path for path in build.glob(f"tests/**/{name}") if path.is_file()]
        if not found:
            raise WorkspaceError(f"there is no test program '{program}'; see tests/mutants/programs")
        return [str(found[0]), "--gtest_brief=1", "--gtest_color=no", "--gtest_fail_fast"], found[0].parent

    def run(self, preset, program, limit):
        """None when it passes; otherwise what failed first, in a few words."""
        command, folder = self._command(preset, program)
        environment = dict(os.environ)
        environment["LSAN_OPTIONS"] = (f"suppressions={self.tree}/tests/support/driver-leaks.txt:"
                                       "print_suppressions=0")
        if program.startswith(ANGLE):
            angle = self.root / "third_party/angle"
            environment |= {"LD_LIBRARY_PATH": str(angle), "VK_ICD_FILENAMES": str(angle / "vk_swiftshader_icd.json")}
        process = subprocess.Popen(command, cwd=folder, env=environment, stdin=subprocess.DEVNULL,
                                   stdout=subprocess.PIPE, stderr=subprocess.STDOUT, start_new_session=True,
                                   preexec_fn=_limit_memory if preset == "debug" else _limit_core)
        try:
            output, _ = process.communicate(timeout=limit)
        except subprocess.TimeoutExpired:
            _kill_all(process)
            return f"hangs, more than {limit:.0f} s"
        except BaseException:
            _kill_all(process)
            raise
        return None if process.returncode == 0 else _first_failure(output.decode(errors="replace"),
                                                                   process.returncode)

    def limit_of(self, preset, program):
        """The time limit of a program, from its time without a fault. It must be built, and no fault planted."""
        kept = self.folder / f"baseline-{preset}.json"
        if preset not in self.baselines:
            known = json.loads(kept.read_text()) if kept.is_file() else {}
            self.baselines[preset] = known if known.get("tree") == self.tree_hash else {"tree": self.tree_hash}
        seconds = self.baselines[preset]
        if program not in seconds:
            # Twice, since a busy machine can be too slow for a test once.
            for _ in range(2):
                start = time.monotonic()
                failure = self.run(preset, program, 600)
                if not failure:
                    break
            if failure:
                raise WorkspaceError(f"{program} ({preset}) fails without a fault: {failure}")
            seconds[program] = time.monotonic() - start
            kept.write_text(json.dumps(seconds, indent=1))
        return 10 + PATIENCE * seconds[program]

    def has_limit(self, preset, program):
        return program in self.baselines.get(preset, {})


def _limit_core():
    resource.setrlimit(resource.RLIMIT_CORE, (0, 0))


def _limit_memory():
    _limit_core()
    resource.setrlimit(resource.RLIMIT_AS, (MEMORY_LIMIT, MEMORY_LIMIT))


def _kill_all(process):
    """Kills a process and its children."""
    try:
        os.killpg(process.pid, signal.SIGKILL)
    except ProcessLookupError:
        pass
    process.communicate()


def _first_failure(output, status):
    # GoogleTest's line, then CTest's, which begins with "1/4 Test #612: ".
    for pattern in (r"\[  FAILED  \] ([\w/]+\.[\w/]+)", r"Test +#\d+: (\S+)[ .]*\*\*\*", r"\[ RUN      \] (\S+)"):
        if found := re.search(pattern, output):
            return found.group(1)
    for pattern in (r"(ThreadSanitizer: [^(\n]*)", r"(AddressSanitizer: [\w-]+)", r"(LeakSanitizer: [\w ]+)"):
        if found := re.search(pattern, output):
            return found.group(1).strip()
    return f"ended by signal {-status}" if status < 0 else f"exit status {status}"
