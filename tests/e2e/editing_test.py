#!/usr/bin/python3
"""Edits entries by keyboard alone: see cases.py for the arguments."""

import os
import subprocess

import cases
from cases import REFS, SOURCE, EditorTest
from editor import COMMIT_BOX, OPEN_BOX, is_locked, use_keyboard, xdotool

STYLE = os.path.join(SOURCE, "tests", "data", "entries.bst")
NEW_ENTRY = "Creating New Bibliography Entry"
RENAME_ENTRY = "Renaming Bibliography Entry"
REMOVE_ENTRY = "Removing Entry"
EDIT_FIELD = "Editing Field"
RENAME_FIELD = "Renaming Field"

LIBRARY = b"""@string{jgo = "Journal of Good Order"}

@article{doe99,
  author  = {Jane Doe},
  title   = {Old Maps},
  journal = jgo,
  year    = 1999
}

@misc{dull, note = {Not worth keeping}}

@proceedings{order01,
  booktitle = {Meeting on Good Order},
  title     = {Meeting on Good Order},
  editor    = {Joan Roe},
  year      = 2001
}
"""

EDITED = b"""@STRING{jgo = {Journal of Good Order}}

@inproceedings{kay01,
	crossref = {order01},
	title = {How to Keep Order},
	author = {Ann Kay},
	pages = {1--9}
}
@article{kay1977,
	author = {Ann Kay and {\\'E}. Roe},
	title = {Even {Older} Maps},
	journal = jgo,
	year = 1977
}
@article{doe99,
	author = {Jane Doe},
	title = {Old Maps of Ports},
	journal = jgo,
	year = 1999,
	month = jan
}
@proceedings{order01,
	booktitle = {Meeting on Good Order},
	title = {Meeting on Good Order},
	editor = {Joan Roe},
	year = 2001
}
"""

READ_BY_BIBTEX = """inproceedings kay01
author = Ann Kay
title = How to Keep Order
booktitle = Meeting on Good Order
year = 2001
pages = 1--9
article kay1977
author = Ann Kay and {\\'E}. Roe
title = Even {Older} Maps
journal = Journal of Good Order
year = 1977
article doe99
author = Jane Doe
title = Old Maps of Ports
journal = Journal of Good Order
year = 1999
month = January
proceedings order01
title = Meeting on Good Order
year = 2001
editor = Joan Roe
"""


class ByKeyboard(EditorTest):
    def start_library(self):
        use_keyboard("gb")  # it has guillemets
        self.addCleanup(use_keyboard, "us")
        path = self.write("library.bib", LIBRARY)
        editor = self.start().ready()
        editor.begin("alt+o")
        editor.activate(editor.wait_for_window(OPEN_BOX))
        xdotool("type", path)
        editor.answer(OPEN_BOX)
        editor.wait_for_log(f"Loading: {path}")
        editor.wait_until_active()
        return editor

    def fill(self, editor, *values):
        """Types a value into each row from the next one on."""
        for value in values:
            editor.press("Tab")
            editor.type(value)

    def add_field(self, editor, key, value):
        """The cursor is in the last row."""
        editor.press("Tab")
        editor.type(key)
        editor.press("alt+a")
        editor.type(value)

    def edit_entry(self, editor):
        editor.type("doe")
        editor.press("Escape", "Tab", "Tab", "End")
        editor.type(" of Ports")
        editor.press("Tab", "Tab")
        self.add_field(editor, "month", "«jan»")
        editor.commit()

    def add_entry(self, editor):
        editor.run_dialog("alt+a", NEW_ENTRY, "kay77")
        editor.press("Escape")
        self.fill(editor, "Ann Kay and {\\'E}. Roe", "Even {Older} Maps", "«jgo»", "1977")
        editor.commit()

    def rename_entry(self, editor):
        editor.run_dialog("alt+n", RENAME_ENTRY, "kay1977")
        self.assertEqual(["doe99 (library)", "kay1977 (library)"], editor.press("Home", "k"))

    def add_child(self, editor):
        self.assertEqual(["order01 (library)"], editor.press("End"))
        editor.begin("alt+a")
        editor.type_into(NEW_ENTRY, "kay01")
        xdotool("key", "Tab", *["Up"] * 5, "Tab", "space")  # the type before its parent's
        editor.answer(NEW_ENTRY)
        editor.wait_until_active()
        editor.press("Escape")
        self.add_field(editor, "title", "How to Keep Order")  # not that of its parent
        self.add_field(editor, "author", "Ann Kay")
        self.add_field(editor, "pages", "1--9")
        editor.commit()

    def remove_entry(self, editor):
        self.assertEqual(["doe99 (library)", "dull (library)"], editor.type("du"))
        editor.begin("alt+d")
        editor.answer(REMOVE_ENTRY)
        editor.wait_until_active()
        editor.settle()

    def test_a_library_is_worked_on_and_bibtex_reads_it(self):
        editor = self.start_library()
        self.edit_entry(editor)
        self.add_entry(editor)
        self.rename_entry(editor)
        self.add_child(editor)
        self.remove_entry(editor)
        editor.press("alt+b")
        self.assertEqual(EDITED, self.read("library.bib"))
        said, made = self.run_bibtex()
        self.assertNotIn("Warning", said)
        self.assertEqual(READ_BY_BIBTEX, made)
        self.assertEqual(0, editor.close())

    def test_bibtex_warns_of_what_is_missing(self):
        self.write("library.bib", EDITED.replace(b"\tjournal = jgo,\n", b"", 1))
        self.assertIn("Warning--journal is missing in kay1977", self.run_bibtex()[0])

    def run_bibtex(self):
        """What BibTeX says, and what the style makes of the file."""
        with open(os.path.join(self.work, "all.aux"), "w", encoding="ascii") as stream:
            stream.write("\\citation{*}\n\\bibstyle{entries}\n\\bibdata{library}\n")
        environment = dict(os.environ, BIBINPUTS=self.folder, BSTINPUTS=os.path.dirname(STYLE))
        done = subprocess.run(["bibtex", "all"], cwd=self.work, env=environment, text=True,
                              stdin=subprocess.DEVNULL, capture_output=True, check=False)
        self.assertEqual((0, ""), (done.returncode, done.stderr), done.stdout)
        with open(os.path.join(self.work, "all.bbl"), encoding="ascii") as stream:
            return done.stdout, stream.read()

    def test_keys_that_come_before_a_box_are_for_the_box(self):
        self.write("a.bib", b"@misc{a, note = {A}}\n@misc{b, note = {B}}\n@misc{c, note = {C}}\n")
        editor = self.start("a.bib").ready()
        # No letter of these answers the box, where some may come when it is open already.
        xdotool("key", "--delay", 0, "alt+d", "alt+d", "alt+a")
        editor.answer(REMOVE_ENTRY)
        editor.wait_until_active()
        editor.press("alt+b")
        self.assertEqual(b"@misc{b,\n\tnote = {B}\n}\n@misc{c,\n\tnote = {C}\n}\n",
                         self.read("a.bib"))
        self.assertEqual([], editor.windows(NEW_ENTRY))

    def test_a_dialog_is_done_before_the_next_key(self):
        self.write("a.bib", b"@misc{a, note = {A}}\n")
        editor = self.start("a.bib").ready()
        editor.begin("alt+n")
        editor.type_into(RENAME_ENTRY, "b")
        xdotool("key", "--delay", 0, "Return", "Escape")
        editor.wait_for_log("Fix crossref's on the entry: a")
        editor.wait(lambda: not editor.windows(RENAME_ENTRY), "the dialog closes")


class Fields(EditorTest):
    def start_on(self, contents):
        self.write("a.bib", contents)
        return self.start("a.bib").ready()

    def assert_becomes(self, contents, editor):
        editor.press("alt+b")
        self.assertEqual(contents, self.read("a.bib"))

    def test_are_edited_renamed_and_removed(self):
        editor = self.start_on(b"@misc{a, title = {Old}, note = {Gone}, year = 1999}\n")
        editor.press("Escape", "Tab")
        editor.begin("alt+e")
        editor.type_into(EDIT_FIELD, "New")
        editor.answer(EDIT_FIELD, "ctrl+Return")
        editor.wait_until_active()
        editor.run_dialog("alt+n", RENAME_FIELD, "booktitle")
        editor.press("Tab", "alt+d")
        editor.commit()
        self.assert_becomes(b"@misc{a,\n\tbooktitle = {New},\n\tyear = 1999\n}\n", editor)

    def test_keep_their_type_when_the_wheel_turns_over_it(self):
        editor = self.start_on(b"@misc{a, title = {T}}\n")
        editor.press("Escape")
        for y in range(60, 160, 8):
            xdotool("mousemove", "--window", editor.frame, 600, y, "click", 5, "click", 4)
        editor.settle()
        self.assertNotIn("Cartulo::OnChangeType", editor.log())
        self.assertIn("Update_Tools(): EditMode", editor.log())

    def test_keep_their_values_when_the_changes_are_dropped(self):
        editor = self.start_on(b"@misc{a, note = {Old}}\n")
        editor.press("Escape", "Tab")
        editor.type("New")
        editor.begin("Escape")
        editor.answer(COMMIT_BOX, "alt+n")
        editor.wait_until_active()
        self.assert_becomes(b"@misc{a, note = {Old}}\n", editor)
        self.assertEqual(0, editor.close())

    def test_wait_for_the_answer_before_the_window_closes(self):
        editor = self.start_on(b"@misc{a, note = {Old}}\n")
        editor.press("Escape", "Tab")
        editor.type("New")
        editor.begin("alt+F4")
        editor.answer(COMMIT_BOX, "Escape")
        editor.wait_until_active()
        editor.type("er")
        editor.begin("alt+F4")
        editor.answer(COMMIT_BOX)
        self.assertEqual(0, editor.wait_for_end())
        self.assertEqual(b"@misc{a,\n\tnote = {Newer}\n}\n", self.read("a.bib"))

    def test_are_not_taken_away_by_another_start(self):
        self.write("b.bib", REFS)
        option = "-d" + self.folder + "/"
        self.write("a.bib", b"@misc{a, note = {Old}}\n")
        editor = self.start(option, "a").ready()
        editor.press("Escape", "Tab")
        editor.type("New")
        self.assertEqual(0, self.start(option, "b").wait_for_end())
        editor.answer(COMMIT_BOX, "Escape")
        editor.wait_until_active()
        editor.type("er")
        self.assertTrue(is_locked(self.path("a.bib")))
        editor.commit()
        editor.wait_for_log(f"Loading: {self.path('b.bib')}")
        editor.settle()
        self.assertEqual(b"@misc{a,\n\tnote = {Newer}\n}\n", self.read("a.bib"))


WORLD = """\ufeff% Библиотека, до 2001
@STRING{zürich = {Zürich}}
% between

@misc{müller,
	title = {שלום e\u0301 €},
	note = {«😀»},
	year = 2001
}
 free text
@misc{nagy,
	year = 2002
}
% конец
""".replace("\n", "\r\n")
LATIN = "% Alt: Müller\n@misc{ölaf,\n\tauthor = {Jürgen},\n\tyear = 1950\n}\n"


class WhatAFileHeld(EditorTest):
    def test_is_still_there_after_an_edit(self):
        world = WORLD.replace("% between\r\n\r\n", "\r\n% between\r\n")  # as a save writes it
        self.write("world.bib", WORLD.encode())
        self.write("latin.bib", LATIN.encode("cp1252"))
        editor = self.start("world.bib", "latin.bib").ready()
        editor.press("Escape", "Tab", "Tab", "Tab", "End")
        editor.type("0")
        editor.commit()
        self.assertEqual(["ölaf (latin)"], editor.press("End"))
        editor.press("Escape", "Tab", "Tab", "End")
        editor.type("1")
        editor.commit()
        editor.press("alt+b")
        self.assertEqual(LATIN.replace("1950", "19501").encode("cp1252"), self.read("latin.bib"))
        self.assertEqual(world.replace("2001\r\n}", "20010\r\n}").encode(),
                         self.read("world.bib"))

    def test_goes_to_the_next_entry_when_one_is_removed(self):
        self.write("world.bib", WORLD.encode())
        editor = self.start("world.bib").ready()
        editor.begin("alt+d")
        editor.answer(REMOVE_ENTRY)
        editor.wait_until_active()
        editor.press("alt+b")
        start, rest = WORLD.split("% between")
        expected = start + "\r\n% between\r\n free text" + rest.split(" free text")[1]
        self.assertEqual(expected.encode(), self.read("world.bib"))


if __name__ == "__main__":
    cases.run()
