#!/usr/bin/env python3
"""Keeps the floors of the source: a folder includes the folders below it, and no files in a circle.

    tests/layers.py [ROOT]

A unit is a header and the source of its name, also for one platform (Sys.h and Sys-posix.cpp).
Prints the lines that go up and the circles of units; the status is 1 when there are some.
"""

import os
import re
import sys

# Each may include itself and what stands before it; help/ and tools/ stand beside app/.
FLOORS = ["base", "encoding", "store", "session", "ui"]
TOP = ["app", "help", "tools"]


def main():
    root = sys.argv[1] if len(sys.argv) > 1 else os.path.join(os.path.dirname(__file__), "..")
    includes = [line for folder in FLOORS + TOP for line in includes_in(root, folder)]
    if not includes:
        sys.exit("layers.py: no source in " + root)
    faults = [line for line in includes if not may_include(line[0], line[2])]
    for path, number, included in faults:
        print(f'{path}:{number}: #include "{included}" goes up')
    circles = find_circles(includes)
    for units in circles:
        print("circle: " + " -> ".join(units + units[:1]))
    sys.exit(1 if faults or circles else 0)


def includes_in(root, folder):
    """(path, line number, included path) for each line that includes a file of ours."""
    path = os.path.join(root, folder)
    for name in sorted(os.listdir(path)) if os.path.isdir(path) else []:
        if not name.endswith((".h", ".cpp")):
            continue
        with open(os.path.join(path, name), encoding="utf-8") as file:
            for number, line in enumerate(file, 1):
                if match := re.match(r'\s*#\s*include\s+"([^"]+)"', line):
                    yield f"{folder}/{name}", number, match[1]


def may_include(path, included):
    folder, other = path.split("/")[0], included.split("/")[0]
    below = FLOORS if folder in TOP else FLOORS[: FLOORS.index(folder)]
    return other == folder or other in below


def unit_of(path):
    return re.sub(r"(-\w+)?\.\w+$", "", path)


def find_circles(includes):
    """The units of each circle, in the order of their arrows; every unit in one at most."""
    arrows = {}
    for path, _, included in includes:
        if unit_of(path) != unit_of(included):
            arrows.setdefault(unit_of(path), set()).add(unit_of(included))
    circles, done = [], set()
    for unit in sorted(arrows):
        follow(unit, [], arrows, done, circles)
    return circles


def follow(unit, way, arrows, done, circles):
    if unit in way:
        circles.append(way[way.index(unit) :])
    if unit in way or unit in done:
        return
    for other in sorted(arrows.get(unit, ())):
        follow(other, way + [unit], arrows, done, circles)
    done.add(unit)


if __name__ == "__main__":
    main()
