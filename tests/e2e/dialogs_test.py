#!/usr/bin/python3
"""Abbreviations, preambles and messages, in their windows: see cases.py for the arguments."""

import cases
from cases import EditorTest
from editor import MESSAGES, use_keyboard, xdotool

STRINGS = "Editing Strings"
NEW_STRING = "Creating New String Entry"
EDIT_STRING = "Editing the String Entry"
PREAMBLE = "Editing Preamble"
SYNTAX_ERROR = "Editing Preamble - Syntax Error"

LIBRARY = b"""@string{jgo = "Journal of Good Order"}
@article{doe99, title = {Old Maps}, journal = {}}
"""

WITH_STRING = b"""@STRING{jgo = {Journal of Good Order}}
@STRING{ade = {Annals of } # jgo}

@article{doe99,
	title = {Old Maps},
	journal = ade # {, and more}
}
"""

PREAMBLES = b"""@preamble{{\\def\\a{x}} # "\\def\\b{y}"}
@misc{one, note = {N}}
"""

NEW_PREAMBLES = b"""@PREAMBLE{{\\def\\a{x}}
	# {\\def\\b{y}}
	# {\\def\\c{
z}} }

@misc{one,
	note = {N}
}
"""

FAULTY = b"""stray text
@misc{kept, note = {x}}
@misc{broken, note = {y} M\xfcller = {z}}
"""


class Dialogs(EditorTest):
    def setUp(self):
        super().setUp()
        use_keyboard("gb")  # it has guillemets
        self.addCleanup(use_keyboard, "us")

    def start_on(self, contents):
        self.write("a.bib", contents)
        return self.start("a.bib").ready()

    def open(self, editor, key, title):
        editor.begin(key)
        window = editor.wait_for_window(title)
        editor.activate(window)
        return window

    def test_abbreviations_are_added_and_inserted(self):
        editor = self.start_on(LIBRARY)
        editor.press("Escape", "Tab", "Tab")
        strings = self.open(editor, "alt+s", STRINGS)
        editor.begin("a")
        editor.type_into(NEW_STRING, "ade")  # letters that are commands in the list
        xdotool("key", "Tab")
        xdotool("type", "Annals of «jgo»")
        editor.answer(NEW_STRING)
        editor.wait_until_active(strings)
        editor.answer(STRINGS)
        editor.wait_until_active()
        editor.type(", and more")
        editor.commit()
        editor.press("alt+b")
        self.assertEqual(WITH_STRING, self.read("a.bib"))
        self.assertEqual(0, editor.close())
        again = self.start("a.bib").ready()
        again.press("Escape", "Tab", "Tab", "Home", "shift+End", "ctrl+c", "Escape", "ctrl+f",
                    "ctrl+v")
        again.wait_for_log("INFO: Cartulo::OnSearch «ade», and more\n")
        self.assertEqual(0, again.close())

    def test_abbreviations_are_changed_and_deleted_by_plain_letters(self):
        editor = self.start_on(b"@string{a = {A}}\n@string{b = {B}}\n@string{c = {C}}\n")
        strings = self.open(editor, "alt+s", STRINGS)
        xdotool("key", "Down", "d", "e")
        editor.type_into(EDIT_STRING, "Changed")
        editor.answer(EDIT_STRING)
        editor.wait_until_active(strings)
        editor.answer(STRINGS, "Escape")
        editor.wait_until_active()
        editor.press("alt+b")
        self.assertEqual(b"@STRING{a = {A}}\n@STRING{c = {Changed}}\n\n", self.read("a.bib"))
        self.assertEqual(0, editor.close())

    def add_piece_and_save(self, editor):
        xdotool("key", "ctrl+End")
        xdotool("type", "\\def\\c{")
        xdotool("key", "Return")
        xdotool("type", "z}")
        editor.answer(PREAMBLE, "ctrl+Return")
        editor.wait_until_active()
        editor.press("alt+b")
        self.assertEqual(NEW_PREAMBLES, self.read("a.bib"))
        self.assertEqual(0, editor.close())

    def test_a_preamble_keeps_its_pieces(self):
        editor = self.start_on(PREAMBLES)
        self.open(editor, "alt+p", PREAMBLE)
        self.add_piece_and_save(editor)

    def test_a_preamble_that_is_refused_can_be_pasted(self):
        editor = self.start_on(PREAMBLES)
        self.open(editor, "alt+p", PREAMBLE)
        xdotool("key", "ctrl+Home")
        xdotool("type", "oops}")
        xdotool("key", "Return")
        editor.begin("ctrl+Return")
        editor.answer(SYNTAX_ERROR)
        editor.wait(lambda: not editor.windows(PREAMBLE), "the window closes")
        editor.activate(editor.frame)  # box and window close at once, which confuses openbox
        self.open(editor, "alt+p", PREAMBLE)
        xdotool("key", "ctrl+a", "ctrl+v", "ctrl+Home", *["Delete"] * len("oops}\n"))
        self.add_piece_and_save(editor)

    def test_messages_of_a_broken_library_can_be_copied(self):
        self.write("a.bib", FAULTY)
        editor = self.start("a.bib").await_frame()
        text = editor.messages()
        self.assertEqual(
            "The file: 'a.bib' has 1 error and 1 warning: "
            "WARNING: line 2: 9 characters of junk seen at toplevel "
            'SYNTAX ERROR: line 3: found "Müller", expected end of entry ("}" or ")") '
            '(skipping to next "@")', text.strip())
        editor.show_messages("alt+m")
        editor.answer(MESSAGES)
        self.assertEqual(0, editor.close())


if __name__ == "__main__":
    cases.run()
