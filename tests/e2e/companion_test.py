#!/usr/bin/python3
"""Tests the program beside others of its environment: see cases.py for the arguments."""

import os

import cases
from cases import MORE, REFS, EditorTest
from editor import FRAME, minimise, poll, windows_named, xdotool

INSERTION = "execute CommandLine: -s ({}) ...InsCite"
MANUAL = "Cartulo: the manual"
TOOL = 133, 20  # where the tool is in the window


class Cite(EditorTest):
    def setUp(self):
        super().setUp()
        self.write("refs.bib", REFS)
        self.service = self.start_peer()
        self.other = self.start_other()  # its window is the document's

    def click_tool(self, editor):
        """The other window may come forward then, so that the editor hears no more keys."""
        xdotool("mousemove", "--window", editor.frame, *TOOL, "click", 1)

    def assert_inserts(self, editor, key, by_tool=False):
        if by_tool:
            self.click_tool(editor)
        else:
            xdotool("key", "Return")
        poll(lambda: INSERTION.format(key) in self.peer_lines(), "the peer receives the key")
        self.assertEqual(1, self.peer_lines().count(INSERTION.format(key)))
        self.assertIn(f"Cartulo: Pass* -s ({key}) ...InsCite", editor.log())
        self.other.wait_until_active()

    def assert_sends_nothing(self, *arguments):
        editor = self.start(*arguments, "refs.bib").ready()
        editor.press("Return")
        self.assertIn("INFO: Cartulo::OnInsertCite", editor.log())
        self.assertNotIn("Pass* ", editor.log())
        self.assertNotIn("SendCommand", editor.log())
        self.assertEqual(["serving"], self.peer_lines())
        self.assertEqual(0, editor.close())

    def test_goes_to_the_editor_of_the_document(self):
        editor = self.start(f"-w{self.other.frame}:7/{self.service}", "refs.bib").ready()
        editor.press("Down")
        self.assert_inserts(editor, "beta")
        self.assertEqual(["serving", "accept CommandLine", INSERTION.format("beta"), "client left"],
                         self.peer_lines())

    def test_finds_a_minimised_window(self):
        minimise(self.other.frame)
        editor = self.start(f"-w{self.other.frame}/{self.service}", "refs.bib").ready()
        self.assert_inserts(editor, "alpha")
        self.assertEqual(self.other.frame, self.other.wait_for_window(FRAME))

    def test_takes_the_window_from_a_second_start(self):
        self.write("more.bib", MORE)
        option = "-d" + self.folder + "/"
        editor = self.start(option, "refs").ready()
        second = self.start(option, f"-w{self.other.frame}/{self.service}", "more")
        self.assertEqual(0, second.wait_for_end())
        editor.wait_for_log("Command: " + option + " -w")
        editor.wait_until_active()
        editor.settle()
        self.assert_inserts(editor, "delta", by_tool=True)

    def test_comes_with_its_tool(self):
        editor = self.start(f"-w{self.other.frame}/{self.service}", "refs.bib").ready()
        self.assert_inserts(editor, "alpha", by_tool=True)

    def test_has_no_tool_without_a_service(self):
        editor = self.start(f"-w{self.other.frame}", "refs.bib").ready()
        self.click_tool(editor)
        editor.settle()
        self.assertNotIn("OnInsertCite", editor.log())

    def test_outlives_its_editor(self):
        editor = self.start(f"-w{self.other.frame}/{self.service}.gone", "refs.bib").ready()
        self.other.kill()
        editor.wait_until_active()
        editor.press("Return")
        self.assertIn("Pass* -s (alpha) ...InsCite", editor.log())
        self.assertIn('topic="CommandLine" failed to connect', editor.log())
        self.assertEqual(["beta (refs)"], editor.press("Down"))
        self.assertEqual(0, editor.close())

    def test_is_sent_nowhere_without_a_window(self):
        self.assert_sends_nothing()
        self.assert_sends_nothing(f"-w0/{self.service}")
        self.assert_sends_nothing(f"-w{self.other.frame}")


class Help(EditorTest):
    def start_with_own_program(self):
        """The user's own help program writes down what it was given."""
        folder = os.path.join(self.environment["XDG_DATA_HOME"], "cartulo", "bin")
        os.makedirs(folder)
        script = os.path.join(folder, "metahelp")
        with open(script, "w", encoding="utf-8") as stream:
            stream.write('#!/bin/sh\n{ echo "$#: $1"; env; } >"$HOME/new"\n'
                         'mv "$HOME/new" "$HOME/started"\n')
        os.chmod(script, 0o700)
        return self.start("refs.bib").ready()

    def started_lines(self):
        path = os.path.join(self.home, "started")
        poll(lambda: os.path.exists(path), "the help program is started")
        with open(path, encoding="utf-8") as stream:
            return stream.read().splitlines()

    def test_comes_by_key(self):
        self.write("refs.bib", REFS)
        editor = self.start("refs.bib").ready()
        editor.begin("ctrl+F1")
        editor.wait_for_log("INFO: Running ")
        self.assertRegex(editor.log(), 'INFO: Running "/.*/metahelp" .QRL.Cartulo\n')
        window = editor.wait(lambda: windows_named(MANUAL), "the manual is shown")[0]
        editor.activate(window)
        xdotool("key", "Escape")
        editor.wait(lambda: not windows_named(MANUAL), "the manual closes")
        editor.activate(editor.frame)
        self.assertEqual(["beta (refs)"], editor.press("Down"))

    def test_comes_with_its_tool(self):
        self.write("refs.bib", REFS)
        editor = self.start_with_own_program()
        for x in range(380, 790, 12):
            editor.click(x, 20)
            if "INFO: Running " in editor.log():
                break
        self.assertEqual("1: .QRL.Cartulo", self.started_lines()[0])

    def test_program_is_told_the_window(self):
        self.write("refs.bib", REFS)
        editor = self.start_with_own_program()
        editor.press("ctrl+F1")
        self.assertIn("QUARLOSTERWINDOW=" + editor.frame, self.started_lines())


if __name__ == "__main__":
    cases.run()
