"""The order of gateway/'s folders, checked on every include.

gateway/Gateway.h's header comment lists the folders from the bottom up,
one level a line ("//   sip/  ...", siblings on one line). A file in a
folder may include from its own folder and from the levels below it; an
include of a sibling, of a level above, of a folder the list leaves out or
of a header beside Gateway.h (the top) fails the check, as does a folder of
gateway/ that the list leaves out. The list is read from the header itself
so that the rule is written once.

Usage: folder-order.py [GATEWAY_DIR]   (default: gateway/ of this tree)
"""

import os
import re
import sys

LEVEL_LINE = re.compile(r"^//\s{3}((?:[a-z][a-z0-9_]*/\s+)+)")
INCLUDE = re.compile(r'^\s*#\s*include\s+"([^"]+)"')


def levels_of(header):
    """{folder: level} from the leading comment of header, bottom level 0."""
    levels = {}
    with open(header, encoding="utf-8") as text:
        for line in text:
            if not line.startswith("//"):
                break
            match = LEVEL_LINE.match(line)
            if not match:
                continue
            level = len(set(levels.values()))
            for folder in match.group(1).split():
                levels[folder.rstrip("/")] = level
    return levels


def main():
    here = os.path.dirname(os.path.abspath(__file__))
    gateway = sys.argv[1] if len(sys.argv) > 1 else os.path.join(here, "..", "..", "gateway")
    header = os.path.join(gateway, "Gateway.h")
    if not os.path.isfile(header):
        print(f"folder-order: no {header} to read the order from")
        return 1
    levels = levels_of(header)
    if len(set(levels.values())) < 2:
        print(f"folder-order: {header}'s comment lists no folder order")
        return 1
    folders = sorted(name for name in os.listdir(gateway) if os.path.isdir(os.path.join(gateway, name)))
    top = {name for name in os.listdir(gateway) if os.path.isfile(os.path.join(gateway, name))}
    faults = []
    for folder in folders:
        if folder not in levels:
            faults.append(f"gateway/{folder}/ is not in Gateway.h's folder order")
            continue
        for name in sorted(os.listdir(os.path.join(gateway, folder))):
            path = os.path.join(gateway, folder, name)
            with open(path, encoding="utf-8") as text:
                for number, line in enumerate(text, 1):
                    match = INCLUDE.match(line)
                    if not match:
                        continue
                    included = match.group(1)
                    where = f"gateway/{folder}/{name}:{number}: includes \"{included}\""
                    if "/" not in included:
                        if included in top:
                            faults.append(f"{where}, which is above every folder")
                        continue
                    other = included.split("/", 1)[0]
                    if other == folder:
                        continue
                    if other not in levels:
                        if other in folders:
                            faults.append(f"{where}, whose folder is not in Gateway.h's folder order")
                        continue
                    if levels[other] > levels[folder]:
                        faults.append(f"{where}, a folder above {folder}/")
                    elif levels[other] == levels[folder]:
                        faults.append(f"{where}, a folder beside {folder}/")
    for fault in faults:
        print(fault)
    return 1 if faults else 0


if __name__ == "__main__":
    sys.exit(main())
