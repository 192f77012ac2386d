"""What the tests beside this file share.

Each is started as: TEST.py PROGRAM PEER [TEST...], on a private screen. PEER stands for another
program of the channel.
"""

import os
import shutil
import subprocess
import sys
import tempfile
import unittest

from editor import MESSAGES, Editor, poll, user_environment

SOURCE = os.path.dirname(os.path.dirname(os.path.dirname(os.path.abspath(__file__))))
HOSTILE = os.path.join(SOURCE, "tests", "data", "hostile")
program = peer = ""

REFS = b"""@article{alpha, title = {Old Maps}, year = 1999}
@book{beta, title = {New Maps}}
@misc{gamma, note = {Nothing}}
"""
MORE = b"""@misc{delta, note = {old wine}}
@misc{zeta, note = {Last}}
"""
ALL_ROWS = ["alpha (refs)", "beta (refs)", "delta (more)", "gamma (refs)", "zeta (more)"]
MORE_ROWS = ["delta (more)", "zeta (more)"]
BROKEN = b"@misc{kept, note = {x}}\n@misc{broken, note = {y} title = {z}}\n"


def run():
    global program, peer
    program, peer = (os.path.abspath(path) for path in sys.argv[1:3])
    del sys.argv[1:3]
    unittest.main(verbosity=2)


class EditorTest(unittest.TestCase):
    """Gives each test a user with a folder for BIB files, and closes what it leaves open."""

    def setUp(self):
        self.work = tempfile.mkdtemp(prefix="cartulo-e2e-")
        self.addCleanup(shutil.rmtree, self.work)
        self.folder = os.path.join(self.work, "files")
        self.home = os.path.join(self.work, "home")
        os.mkdir(self.folder)
        os.mkdir(self.home)
        self.environment = user_environment(self.home)

    def path(self, name):
        return os.path.join(self.folder, name)

    def write(self, name, contents):
        path = self.path(name)
        os.makedirs(os.path.dirname(path), exist_ok=True)
        with open(path, "wb") as stream:
            stream.write(contents)
        os.utime(path, (1e9, 1e9))  # a write would show even within one tick
        return path

    def write_both(self):
        return self.write("refs.bib", REFS), self.write("more.bib", MORE)

    def read(self, name):
        with open(self.path(name), "rb") as stream:
            return stream.read()

    def start(self, *arguments, command=None, folder=None):
        editor = Editor((command or [program]) + list(arguments), folder or self.folder,
                        self.environment)
        self.addCleanup(editor.kill)
        return editor

    def start_other(self):
        """An editor without files, for its window."""
        return self.start(folder=self.work).ready()

    def open_both(self):
        self.write_both()
        return self.start("refs.bib", "more.bib").ready()

    def start_with_messages(self, *arguments):
        """Starts the editor, which must show its messages unasked, and closes these."""
        editor = self.start(*arguments)
        editor.await_frame()
        editor.answer(MESSAGES)
        return editor.ready()

    def assert_opens(self, key, row, *arguments):
        editor = self.start(*arguments).ready()
        self.assertEqual([row], editor.type(key))
        self.assertEqual([], editor.windows(MESSAGES))
        self.assertEqual(0, editor.close())

    def start_peer(self):
        """A program that serves a socket; what it receives comes as lines of peer_lines()."""
        path = os.path.join(self.work, "peer")
        output = open(path + ".output", "wb")
        self.addCleanup(output.close)
        process = subprocess.Popen([peer, "serve", path], env=self.environment, stdout=output,
                                   stdin=subprocess.DEVNULL, stderr=subprocess.STDOUT)
        self.addCleanup(process.wait)
        self.addCleanup(process.kill)
        poll(lambda: self.peer_lines() == ["serving"], "the peer serves")
        return path

    def peer_lines(self):
        with open(os.path.join(self.work, "peer.output"), encoding="utf-8") as stream:
            return stream.read().splitlines()
