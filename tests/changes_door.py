#!/usr/bin/env python3
"""Looks for code that changes the records of an open file around session/Changes.

    tests/changes_door.py [ROOT]

The store builds and reads records; above it only session/Changes may write to them, hand on the text
between them, or count a change. Prints the lines that do; the status is 1 when there are some.
"""

import os
import re
import sys

FOLDERS = ["session", "ui", "app", "help", "tools"]
DOOR = "session/Changes.cpp"

# What is no record of an open file but has fields of the same names.
OTHERS = r"(?:row|grid|edit|state|item|match|spec|type|message|name)"

FIELD = r"(?:key|name|value|type|text|next|fields|fieldCount|entries|strings|comments|preamble|origin)"
PLACE = rf"\b(?!{OTHERS}\b)\w+(?:->\w+|\[\w+\])*(?:->|\.\w+->){FIELD}\b(?:\[[^\]]*\](?:\.{FIELD})?)?"
WRITES = [
    re.compile(rf"{PLACE}\s*(?:[-+|&]?=[^=]|\+\+|--)"),
    re.compile(rf"(?:\+\+|--)\s*{PLACE}"),
    re.compile(rf"\b(?:mem\w+|str\w*cpy|strcat|snprintf|free|swap|GiveUp)\(\s*[*&]?{PLACE}"),
    re.compile(r"&\w+->(?:entries|strings|comments|preamble|key|value)\b(?!\[)"),
    # Counting: `modified` of a file, not a count of somebody else's.
    re.compile(r"(?:->|\.)modified\s*(?:[-+]?=[^=]|\+\+|--)|(?:\+\+|--)[\w\[\]>.-]*->modified\b"),
    # The store's functions that change a file, or the text between its items.
    re.compile(r"\b(?:Bib_NewEntry|Bib_AllocEntry|Bib_FindLink|Outside_\w+)\s*\("),
]


def main():
    root = sys.argv[1] if len(sys.argv) > 1 else os.path.join(os.path.dirname(__file__), "..")
    looked, faults = 0, 0
    for path in sources(root):
        looked += 1
        with open(os.path.join(root, path), encoding="utf-8") as file:
            for number, line in enumerate(file, 1):
                code = line.split("//")[0]
                if any(write.search(code) for write in WRITES):
                    faults += 1
                    print(f"{path}:{number}: changes an open file: {line.strip()}")
    if looked == 0:
        sys.exit("changes_door.py: no source in " + root)
    sys.exit(1 if faults else 0)


def sources(root):
    for folder in FOLDERS:
        path = os.path.join(root, folder)
        for name in sorted(os.listdir(path)) if os.path.isdir(path) else []:
            if name.endswith((".h", ".cpp")) and f"{folder}/{name}" != DOOR:
                yield f"{folder}/{name}"


if __name__ == "__main__":
    main()
