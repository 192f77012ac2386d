#!/usr/bin/env python3
"""Looks for code that changes the records of an open file around session/Changes.

    tests/source/changes_door.py [ROOT]

The store builds and reads records; above it only session/Changes may write to them, hand on the text
between them, or count a change. Prints the lines that do.
"""

import re

import tree

ABOVE_THE_STORE = ["session", "ui"] + tree.TOP
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
    tree.finish(
        [
            f"{path}:{number}: changes an open file: {line.strip()}"
            for path in tree.files(ABOVE_THE_STORE)
            if path != DOOR
            for number, line in tree.lines(path)
            if any(write.search(tree.code(line)) for write in WRITES)
        ]
    )


if __name__ == "__main__":
    main()
