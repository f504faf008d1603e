"""Results by fault and tree, in .cache/mutants/results.jsonl, and their sums."""

import json
from collections import Counter, defaultdict
from pathlib import Path

# ABSENT: this machine does not build the source.
CAUGHT, MISSED, BROKEN, ABSENT = "caught", "missed", "broken", "absent"
PIXEL = ("moka_pixel_", "angle:", "moka_app_tests", "readme.")  # these need a driver


class Results:
    def __init__(self, root):
        self._path = Path(root) / ".cache/mutants/results.jsonl"
        self._path.parent.mkdir(parents=True, exist_ok=True)
        self._latest = {}  # by fault and tree, and the latest of any tree by fault alone
        if self._path.is_file():
            for line in self._path.read_text().splitlines():
                self._take(json.loads(line))

    def _take(self, result):
        for place in ((result["key"], result["tree"]), result["key"]):
            # A run that stopped at the first program says less than a whole one on the same tree.
            kept = self._latest.get(place)
            if kept and kept["whole"] and not result["whole"] and kept["tree"] == result["tree"]:
                continue
            self._latest[place] = result

    def add(self, result):
        self._take(result)
        with open(self._path, "a") as file:
            file.write(json.dumps(result) + "\n")

    def on_tree(self, fault, tree):
        return self._latest.get((fault.key, tree))

    def latest(self, fault, tree):
        return self.on_tree(fault, tree) or self._latest.get(fault.key)


def line_of(fault, result):
    seen = result["seen"]
    told = "  ".join(f"{program} ({what})" for program, what in seen.items())
    if result["outcome"] in (BROKEN, ABSENT):
        return f"{result['outcome']:9} {fault.name}  {result['why']}"
    if result["outcome"] == MISSED:
        kind = "unnoticed" if fault.unnoticed else "MISSED"
        return f"{kind:9} {fault.name}  {fault.unnoticed or fault.user}  ({', '.join(result['ran']) or 'nothing ran'})"
    return f"caught    {fault.name}  {told}"


def _sight(seen):
    pixel = [program for program in seen if program.startswith(PIXEL)]
    if len(pixel) == len(seen):
        return "pixel"
    return "both" if pixel else "unit"


def _folder(fault):
    return fault.file.rpartition("/")[0]


class Summary:
    """Counts over the latest results of these faults."""

    def __init__(self, faults, results, tree):
        self.total = len(faults)
        self.outcomes, self.sights = Counter(), Counter()
        self.by_folder = defaultdict(Counter)
        self.saw, self.alone = Counter(), Counter()
        self.older = self.not_run = self.unnoticed = 0
        for fault in faults:
            result = results.latest(fault, tree)
            folder = self.by_folder[_folder(fault)]
            folder["faults"] += 1
            if not result:
                self.not_run += 1
                continue
            self.older += result["tree"] != tree
            self.outcomes[result["outcome"]] += 1
            folder[result["outcome"]] += 1
            if result["outcome"] == MISSED and fault.unnoticed:
                self.unnoticed += 1
                folder["unnoticed"] += 1
            if result["outcome"] == CAUGHT:
                self.sights[_sight(result["seen"])] += 1
                for program in result["seen"]:
                    self.saw[program] += 1
                    self.alone[program] += len(result["seen"]) == 1

    @property
    def missed(self):
        return self.outcomes[MISSED] - self.unnoticed

    def print(self):
        print(f"\n{self.total} faults: {self.outcomes[CAUGHT]} caught ({self.sights['unit']} without a driver alone, "
              f"{self.sights['pixel']} with a driver alone, {self.sights['both']} by both), {self.missed} missed, "
              f"{self.unnoticed} that no user could notice, {self.outcomes[BROKEN]} broken, {self.outcomes[ABSENT]} not in this machine's "
              f"build, {self.not_run} not run"
              + (f"; {self.older} of these results are of an older tree" if self.older else ""))
        for folder in sorted(self.by_folder):
            counts = self.by_folder[folder]
            print(f"  {folder:28} {counts['faults']:4} faults {counts[CAUGHT]:4} caught "
                  f"{counts[MISSED] - counts['unnoticed']:4} missed")
        for program, count in self.saw.most_common():
            print(f"  {program:34} saw {count:4}, {self.alone[program]:3} of them alone")

    def print_figures(self):
        """Rows for docs/quality.md."""
        row = "| {} | {} | `scripts/mutate --report` |".format
        print(row("planted faults", f"{self.total}: {self.outcomes[CAUGHT]} caught, {self.missed} missed, "
                                    f"{self.unnoticed} that no user could notice"))
        print(row("of those caught", f"{self.sights['unit']} by programs without a driver alone, "
                                     f"{self.sights['pixel']} by programs with one alone, "
                                     f"{self.sights['both']} by both"))
        print(row("seen by one program alone", ", ".join(
            f"{count} by `{program}`" for program, count in self.alone.most_common() if count)))
