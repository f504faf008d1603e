"""The list of faults: tests/mutants/*.txt, one file for each subject. tests/mutants/README.md describes the format."""

import hashlib
from dataclasses import dataclass
from pathlib import Path


class ListError(Exception):
    """An error in the list; the message names the place and what to do."""


@dataclass
class Fault:
    name: str  # "codec/interlaced-rows": the subject and the fault's own name
    place: str  # where it stands in the list, for messages
    file: str
    user: str  # what a user would notice
    old: str
    new: str
    preset: str = "debug"  # the build that it is run in
    tests: str = ""  # beside the folder's; see tests/mutants/programs
    unnoticed: str = ""  # why no user could notice it

    @property
    def key(self):
        """Identifies the fault by its change, so that results stay valid if it is renamed."""
        return hashlib.sha256("\0".join((self.file, self.preset, self.old, self.new)).encode()).hexdigest()[:16]


FIELDS = ("file", "user", "preset", "tests", "unnoticed")


def _read_stanza(subject, place, lines):
    fields, old, new, last = {}, [], [], None
    name = lines[0]
    for line in lines[1:]:
        if line[0] in "-+":
            (old if line[0] == "-" else new).append(line[2:])
            last = None
        elif line[0] == " " and last:
            fields[last] += " " + line.strip()
        else:
            last, colon, value = line.partition(":")
            if not colon or last not in FIELDS or last in fields:
                raise ListError(f"{place}: '{line}' is none of: {', '.join(FIELDS)}, '- text', '+ text', each once")
            fields[last] = value.strip()
    if not old or not fields.get("file") or not fields.get("user"):
        raise ListError(f"{place}: '{name}' needs 'file:', 'user:' and the text to replace, '- text'")
    if "preset" in fields and "tests" not in fields:
        raise ListError(f"{place}: '{name}' needs 'tests:', because it has a preset")
    return Fault(name=f"{subject}/{name}", place=place, file=fields["file"], user=fields["user"],
                 old="\n".join(old), new="\n".join(new), preset=fields.get("preset", "debug"),
                 tests=fields.get("tests", ""), unnoticed=fields.get("unnoticed", ""))


def read_list(folder):
    faults, names, keys = [], set(), set()
    for path in sorted(Path(folder).glob("*.txt")):
        stanza, start = [], 0
        for number, line in enumerate(path.read_text().splitlines() + [""], 1):
            if line.startswith("#"):
                continue
            if line.strip():
                start = start if stanza else number
                stanza.append(line.rstrip())
                continue
            if stanza:
                fault = _read_stanza(path.stem, f"{path.name}:{start}", stanza)
                if fault.name in names or fault.key in keys:
                    raise ListError(f"{fault.place}: '{fault.name}' stands in the list twice")
                names.add(fault.name)
                keys.add(fault.key)
                faults.append(fault)
            stanza = []
    return faults


def _find(text, wanted):
    """Begin and end of every occurrence of wanted, ignoring differences in spaces and line breaks."""
    places = [i for i, c in enumerate(text) if not c.isspace()]
    packed = "".join(text[i] for i in places)
    wanted = "".join(wanted.split())
    found, at = [], packed.find(wanted)
    while at >= 0:
        found.append((places[at], places[at + len(wanted) - 1] + 1))
        at = packed.find(wanted, at + 1)
    return found


def plant(text, fault):
    """The text with the fault in it."""
    found = _find(text, fault.old)
    if len(found) != 1:
        what = "not found" if not found else f"found {len(found)} times; quote more of it"
        raise ListError(f"{fault.place}: {fault.name}: its text in {fault.file} is {what}: {fault.old.strip()}")
    begin, end = found[0]
    return text[:begin] + fault.new + text[end:]


def check(root, faults):
    """The errors in the faults' texts, a line each."""
    problems = []
    for fault in faults:
        try:
            path = Path(root) / fault.file
            if not path.is_file():
                raise ListError(f"{fault.place}: {fault.name}: there is no file {fault.file}")
            if plant(text := path.read_text(), fault) == text:
                raise ListError(f"{fault.place}: {fault.name} replaces its text by itself")
        except ListError as error:
            problems.append(str(error))
    return problems
