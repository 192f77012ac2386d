#!/usr/bin/env python3
"""Keeps the floors of the source: a folder includes the folders below it, and no files in a circle.

    tests/source/layers.py [ROOT]

A unit is a header and the source of its name, also for one platform (Sys.h and Sys-posix.cpp).
Prints the lines that go up, and the circles of units.
"""

import re

import tree


def main():
    includes = [line for path in tree.files(tree.FLOORS + tree.TOP) for line in includes_in(path)]
    faults = [
        f'{path}:{number}: #include "{included}" goes up'
        for path, number, included in includes
        if not may_include(path, included)
    ]
    circles = ["circle: " + " -> ".join(units + units[:1]) for units in find_circles(includes)]
    tree.finish(faults + circles)


def includes_in(path):
    """(path, line number, included path) for each line that includes a file of ours."""
    for number, line in tree.lines(path):
        if match := re.match(r'\s*#\s*include\s+"([^"]+)"', line):
            yield path, number, match[1]


def may_include(path, included):
    folder, other = path.split("/")[0], included.split("/")[0]
    below = tree.FLOORS if folder in tree.TOP else tree.FLOORS[: tree.FLOORS.index(folder)]
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
