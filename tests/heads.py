#!/usr/bin/env python3
"""Looks whether each source file starts with its path and what is in it.

    tests/heads.py [ROOT]

Prints the files that don't; the status is 1 when there are some.
"""

import os
import sys

FOLDERS = "base encoding store session ui app help tools bench tests".split()


def main():
    root = sys.argv[1] if len(sys.argv) > 1 else os.path.join(os.path.dirname(__file__), "..")
    paths = [path for folder in FOLDERS for path in sources(root, folder)]
    if not paths:
        sys.exit("heads.py: no source in " + root)
    headless = [path for path in paths if not first_line(root, path).startswith(f"// {path} - ")]
    for path in headless:
        print(f"{path}:1: does not start with its path and what is in it")
    sys.exit(1 if headless else 0)


def sources(root, folder):
    for place, _, names in sorted(os.walk(os.path.join(root, folder))):
        for name in sorted(names):
            if name.endswith((".h", ".cpp")):
                yield os.path.relpath(os.path.join(place, name), root)


def first_line(root, path):
    with open(os.path.join(root, path), encoding="utf-8") as file:
        return file.readline()


if __name__ == "__main__":
    main()
