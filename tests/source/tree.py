"""What the looks at the source have in common: its files, their lines, and how a look ends."""

import os
import sys

# Each folder may include itself and those before it; help/ and tools/ stand beside app/.
FLOORS = ["base", "encoding", "store", "session", "ui"]
TOP = ["app", "help", "tools"]


def files(folders):
    """The paths of all headers and sources below the folders, from the root that is named."""
    paths = [path for folder in folders for path in files_below(folder)]
    if not paths:
        sys.exit(f"no source in {root()}")
    return paths


def files_below(folder):
    for place, _, names in sorted(os.walk(os.path.join(root(), folder))):
        for name in sorted(names):
            if name.endswith((".h", ".cpp")):
                yield os.path.relpath(os.path.join(place, name), root())


def root():
    above = os.path.join(os.path.dirname(__file__), "..", "..")
    return sys.argv[1] if len(sys.argv) > 1 else above


def lines(path):
    """Numbered from 1."""
    with open(os.path.join(root(), path), encoding="utf-8") as file:
        return list(enumerate(file, 1))


def code(line):
    """Without its comment."""
    return line.split("//")[0]


def finish(faults):
    """Prints what was found; the status is 1 when that is something."""
    for fault in faults:
        print(fault)
    sys.exit(1 if faults else 0)
