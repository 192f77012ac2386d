#!/usr/bin/env python3
"""Keeps our code from asking the system afterwards why something failed.

    tests/reasons.py [ROOT]

By then another call may have failed for a reason of its own, so the reason comes with the failure
(SysReason). Prints the lines that ask; the status is 1 when there are some.
"""

import os
import re
import sys

FOLDERS = ["encoding", "store", "session", "ui", "app", "help"]


def main():
    root = sys.argv[1] if len(sys.argv) > 1 else os.path.join(os.path.dirname(__file__), "..")
    sources = [path for folder in FOLDERS for path in sources_in(root, folder)]
    if not sources:
        sys.exit("reasons.py: no source in " + root)
    faults = [fault for path in sources for fault in faults_of(root, path)]
    for path, number in faults:
        print(f"{path}:{number}: take the reason from a SysReason")
    sys.exit(1 if faults else 0)


def sources_in(root, folder):
    path = os.path.join(root, folder)
    names = sorted(os.listdir(path)) if os.path.isdir(path) else []
    return [f"{folder}/{name}" for name in names if name.endswith((".h", ".cpp"))]


def faults_of(root, path):
    with open(os.path.join(root, path), encoding="utf-8") as file:
        for number, line in enumerate(file, 1):
            if re.search(r"\b(Sys_LastErrorText|errno)\b", line.split("//")[0]):
                yield path, number


if __name__ == "__main__":
    main()
