#!/usr/bin/python3
"""Whether the folders of src/ include each other as docs/architecture.md draws it, no more and no less:
tools/arrows.py [CHECKOUT]"""
import pathlib
import re
import sys

root = pathlib.Path(sys.argv[1] if len(sys.argv) > 1 else __file__).resolve()
root = root if root.is_dir() else root.parent.parent
rows = re.findall(r"^\| `([a-z/]+)` \| (.*) \|", (root / "docs/architecture.md").read_text(), re.M)
drawn = {(folder, other) for folder, others in rows for other in re.findall("`([a-z/]+)`", others)}
folders = {folder for folder, _ in rows}


def arrow(file, included):
    """From folder to folder, each as the table names it; of those that are drawn, where one is."""
    ends = [next((str(end) for end in pathlib.Path(path).parents if str(end) in folders), path) for path in (file, included)]
    return next((end for end in drawn if end[0] == ends[0] and (ends[1] + "/").startswith(end[1] + "/")), tuple(ends))


found = {}
for path in sorted((root / "src").rglob("*.*")):
    for included in re.findall('^ *# *include "(.+)"', path.read_text(), re.M) if path.suffix in (".h", ".cpp") else ():
        file = str(path.relative_to(root / "src"))
        found.setdefault(arrow(file, included), f"src/{file} includes {included}")
faults = [where for ends, where in found.items() if ends[0] != ends[1] and ends not in drawn]
faults += [f"nothing in src/{folder} includes {other}, though it is drawn" for folder, other in sorted(drawn - set(found))]
if faults or not found:
    sys.exit("\n".join(["arrows: not as docs/architecture.md draws them:", *faults]))
print(f"arrows: {len(drawn)} between {len(folders)} folders, as drawn")
