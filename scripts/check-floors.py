#!/usr/bin/env python3
"""Fails when a file of the library includes a header of a room above its own.

The floor order is read from scripts/floors.txt. A library file may include the
headers of its own room and of the rooms below it; the demonstration program
(demo/) may include the public headers (include/) and its own files only.
Usage: scripts/check-floors.py [SOURCE_DIR]
"""
import pathlib
import re
import sys

root = pathlib.Path(sys.argv[1] if len(sys.argv) > 1 else pathlib.Path(__file__).resolve().parent.parent)
floors = [line.strip() for line in (root / "scripts/floors.txt").read_text().splitlines()
          if line.strip() and not line.lstrip().startswith("#")]
floor_of = {room: n for n, room in enumerate(floors)}
public = {p.name for p in (root / "include").glob("*.h")}
include = re.compile(r'^\s*#\s*include\s+"([^"]+)"', re.M)

faults = []
for room in floors + ["demo"]:
    for path in sorted((root / room).glob("*")):
        if path.suffix not in (".h", ".c", ".cpp", ".rc"):
            continue
        for name in include.findall(path.read_text(errors="replace")):
            parts = name.split("/")
            target = parts[0] if len(parts) > 1 else None
            where = f"{path.relative_to(root)} includes \"{name}\""
            if room == "demo":
                if target is not None or not (name in public or (root / "demo" / name).exists()):
                    faults.append(f"{where}: the demo uses the public headers only")
            elif target is None:
                if name not in public and not (path.parent / name).exists():
                    faults.append(f"{where}: not a header of this room or a public one")
            elif target not in floor_of:
                faults.append(f"{where}: {target}/ is no room of {root / 'scripts/floors.txt'}")
            elif floor_of[target] > floor_of[room]:
                faults.append(f"{where}: {target}/ stands above {room}/")

for fault in faults:
    print(fault)
print(f"{len(faults)} include(s) climbing; floors: {' -> '.join(floors)}")
sys.exit(1 if faults else 0)
