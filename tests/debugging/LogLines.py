"""Every line that the library can log is in docs/debugging.md, as it begins: up to its first two words that are no values."""
import pathlib
import re
import sys

root = pathlib.Path(sys.argv[1])
page = (root / "docs/debugging.md").read_text()
LITERAL = r'"(?:[^"\\]|\\.)*"'
# The priority, the tag, and the format's literals, where the format is no bare conversion.
CALL = re.compile(r"__android_log_print\(\s*\w+,\s*(?:%s|[\w:<>]+),\s*((?:%s\s*)+)" % (LITERAL, LITERAL))
count = 0
unknown = 0
for file in sorted([*root.glob("moka/**/*.cpp"), *root.glob("moka/**/*.h")]):
    for call in CALL.finditer(file.read_text()):
        text = "".join(part[1:-1] for part in re.findall(LITERAL, call.group(1)))
        begins = [" ".join(part.split()[:2]) for part in re.split(r"""%[-.0-9z]*\w|\\"|'""", text)]
        begins = [part for part in begins if len(re.findall("[A-Za-z]", part)) > 4]
        count += 1
        if begins and begins[0] not in page:
            print(f"{file.relative_to(root)}: docs/debugging.md does not tell of \"{begins[0]}\": {text}")
            unknown += 1
if unknown > 0 or count < 50:
    sys.exit(f"of {count} log lines {unknown} are not described; there were 50 at least")
