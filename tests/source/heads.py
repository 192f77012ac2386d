#!/usr/bin/env python3
"""Looks whether each source file starts with its path and what is in it.

    tests/source/heads.py [ROOT]
"""

import tree


def main():
    paths = tree.files(tree.FLOORS + tree.TOP + ["bench", "tests"])
    headless = [path for path in paths if not first_line(path).startswith(f"// {path} - ")]
    tree.finish([f"{path}:1: does not start with its path and what is in it" for path in headless])


def first_line(path):
    return next((line for _, line in tree.lines(path)), "")


if __name__ == "__main__":
    main()
