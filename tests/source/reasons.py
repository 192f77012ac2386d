#!/usr/bin/env python3
"""Keeps our code from asking the system afterwards why something failed.

    tests/source/reasons.py [ROOT]

By then another call may have failed for a reason of its own, so the reason comes with the failure
(SysReason). Prints the lines that ask.
"""

import re

import tree

ABOVE_THE_SYSTEM = tree.FLOORS[1:] + tree.TOP


def main():
    tree.finish(
        [
            f"{path}:{number}: take the reason from a SysReason"
            for path in tree.files(ABOVE_THE_SYSTEM)
            for number, line in tree.lines(path)
            if re.search(r"\b(Sys_LastErrorText|errno)\b", tree.code(line))
        ]
    )


if __name__ == "__main__":
    main()
