#!/usr/bin/python3
"""Tests what the built program does with BIB files: see cases.py for the arguments."""

import getpass
import os
import shutil
import subprocess

import cases
from cases import ALL_ROWS, BROKEN, HOSTILE, MORE, MORE_ROWS, REFS, SOURCE, EditorTest
from editor import LOCK_BOX, MESSAGES, is_locked, picture_of_files, use_keyboard


class List(EditorTest):
    def test_shows_the_entries_of_all_files_in_one_order(self):
        editor = self.open_both()
        self.assertEqual(ALL_ROWS, editor.rows())
        self.assertEqual([], editor.windows(MESSAGES))

    def test_is_drawn(self):
        editor = self.open_both()
        editor.wait(lambda: editor.colours(editor.frame) > 8, "the window is drawn")

    def test_finds_keys_by_their_first_letters(self):
        self.write("refs.bib", b"@misc{aBc, note={}}\n@misc{ABD, note={}}\n@misc{b, note={}}\n")
        editor = self.start("refs").ready()
        self.assertEqual(["b (refs)"], editor.type("b"))
        self.assertEqual(["aBc (refs)", "aBc (refs)", "ABD (refs)"], editor.type("abd"))
        self.assertEqual([], editor.type("x"))

    def test_follows_the_arrows(self):
        editor = self.open_both()
        self.assertEqual(ALL_ROWS[1:3], editor.press("Down", "Down"))
        self.assertEqual(ALL_ROWS[1::-1], editor.press("Up", "Up"))
        self.assertEqual([], editor.press("Up"))

    def test_follows_the_mouse(self):
        editor = self.open_both()
        for y in range(40, 200, 8):  # the first row is selected already
            rows = editor.click(60, y)
            if rows:
                break
        self.assertEqual(["beta (refs)"], rows)
        self.assertEqual(["delta (more)"], editor.press("Down"))

    def test_is_narrowed_by_the_search_box(self):
        editor = self.open_both()
        editor.press("ctrl+f")
        self.assertEqual([], editor.type("OLD"))
        self.assertIn("INFO: Cartulo::OnSearch OLD", editor.log())
        editor.press("Down")
        self.assertEqual(["alpha (refs)", "delta (more)"], editor.rows())

        editor.press("alt+f")
        editor.press("BackSpace")
        editor.press("Down")
        self.assertEqual(ALL_ROWS, editor.rows())

    def test_narrowed_to_nothing_takes_keys_and_comes_back(self):
        editor = self.open_both()
        editor.press("ctrl+f")
        editor.type("no such text")
        editor.press("Down")
        self.assertEqual([], editor.press("Down", "End", "Home", "Return", "z"))
        editor.press("ctrl+f")
        editor.press("BackSpace")
        editor.press("Down")
        self.assertEqual(ALL_ROWS, editor.rows())

    def test_is_empty_without_files(self):
        editor = self.start()
        editor.await_frame()
        editor.activate(editor.frame)
        editor.wait(lambda: editor.colours(editor.frame) > 8, "the window is drawn")
        self.assertEqual(0, editor.close())


class Messages(EditorTest):
    def test_open_and_close_by_key(self):
        editor = self.open_both()
        for number, (key, end) in enumerate([("alt+m", "Return"), ("ctrl+m", "space")], 1):
            editor.show_messages(key)
            editor.answer(MESSAGES, end)
            editor.wait_for_log("INFO: Cartulo_Messages::OnOK", number)
            editor.activate(editor.frame)
        self.assertEqual(["zeta (more)"], editor.type("z"))

    def test_show_a_syntax_error_by_themselves(self):
        self.write("refs.bib", REFS)
        path = self.write("broken.bib", BROKEN)
        before = picture_of_files(self.folder)
        editor = self.start_with_messages("broken.bib", "refs.bib")
        self.assertEqual(["kept (broken)"], editor.type("k"))
        self.assertEqual(["gamma (refs)"], editor.press("Up"))
        self.assertFalse(is_locked(path))
        self.assertEqual(0, editor.close())
        self.assertEqual(before, picture_of_files(self.folder))

    def test_show_a_missing_file_by_themselves(self):
        self.write("more.bib", MORE)
        before = picture_of_files(self.folder)
        editor = self.start("missing.bib", "more.bib").await_frame()
        self.assertIn("ERROR: The file 'missing.bib' not found", editor.messages())
        self.assertIn("ERROR: Can't locate Bib-file: missing.bib", editor.log())
        self.assertEqual(MORE_ROWS, editor.rows())
        self.assertEqual(0, editor.close())
        self.assertEqual(before, picture_of_files(self.folder))


class Lock(EditorTest):
    def test_keeps_a_second_editor_out_of_one_file(self):
        first = self.open_both()
        third = self.write("third.bib", b"@misc{third, note = {}}\n")
        before = picture_of_files(self.folder)
        second = self.start("more.bib", "third.bib")
        second.answer(LOCK_BOX)
        second.await_frame()
        self.assertIn("ERROR: File: `more.bib'", second.messages())
        self.assertTrue(is_locked(third))
        self.assertIn("third (third)", second.selections())
        self.assertEqual([], second.type("z"))
        self.assertEqual(0, second.close())

        first.activate(first.frame)
        self.assertEqual(["zeta (more)"], first.type("z"))
        self.assertEqual(0, first.close())
        self.assertEqual(before, picture_of_files(self.folder))

    def test_ends_with_a_killed_editor(self):
        editor = self.open_both()
        path = os.path.join(self.folder, "refs.bib")
        self.assertTrue(is_locked(path))
        editor.kill()
        self.assertFalse(is_locked(path))
        self.assert_opens("g", "gamma (refs)", "refs.bib")
        self.assertEqual(["more.bib", "refs.bib"], sorted(os.listdir(self.folder)))


class Close(EditorTest):
    def test_leaves_files_as_they_are(self):
        editor = self.open_both()
        before = picture_of_files(self.folder)
        for name in before:
            self.assertTrue(is_locked(os.path.join(self.folder, name)))
        editor.press("Down", "alt+b", "ctrl+b", "End")
        self.assertEqual(0, editor.close())
        self.assertIn("INFO: MyApp:OnExit End", editor.log())
        self.assertEqual("", editor.output())
        self.assertEqual(before, picture_of_files(self.folder))
        for name in before:
            self.assertFalse(is_locked(os.path.join(self.folder, name)))


class Save(EditorTest):
    """REFS holds one letter more after each change."""

    def start_changed(self):
        self.write_both()
        editor = self.start("refs.bib", "more.bib").ready()
        editor.change()
        self.assertEqual(REFS, self.read("refs.bib"))
        return editor

    def assert_saved(self, text, name="refs.bib"):
        self.assertIn(text, self.read(name))
        copies = [other for other in os.listdir(self.folder) if "Backup" in other]
        self.assertEqual([name + ".Backup"], [copy.partition("-")[0] for copy in copies])
        self.assertIn(self.read(copies[0]), (REFS, MORE))
        self.assertTrue(is_locked(self.path(name)))

    def test_follows_search_selection_and_change(self):
        self.write_both()
        editor = self.start("refs.bib", "more.bib").ready()
        editor.press("ctrl+f")
        editor.type("old")
        editor.press("Down")
        self.assertEqual(["delta (more)"], editor.press("End"))
        editor.change()
        self.assertEqual(MORE, self.read("more.bib"))
        editor.press("alt+b")
        self.assert_saved(b"old wineX", "more.bib")
        self.assertEqual(REFS, self.read("refs.bib"))
        self.assertEqual(0, editor.close())
        self.assert_opens("d", "delta (more)", "more.bib")

    def test_comes_with_its_tool(self):
        editor = self.start_changed()
        editor.click(24, 20)
        self.assert_saved(b"Old MapsX")
        editor.change()
        editor.click(24, 20)
        self.assert_saved(b"Old MapsXX")

    def test_comes_with_leaving_the_program(self):
        editor = self.start_changed()
        self.start_other()
        editor.wait_for_log("INFO: Cartulo is now+ Disactivated")
        editor.wait(lambda: b"Old MapsX" in self.read("refs.bib"), "the change is saved")
        editor.activate(editor.frame)
        editor.settle()
        self.assert_saved(b"Old MapsX")
        self.assertEqual(1, editor.log().count("INFO: Cartulo is now+ Disactivated"))
        self.assertEqual(1, editor.log().count("INFO: Cartulo is now+ Activated"))

    def test_does_not_come_with_a_window_of_its_own(self):
        editor = self.start_changed()
        editor.show_messages("alt+m")
        editor.answer(MESSAGES)
        editor.activate(editor.frame)
        editor.settle()
        self.assertNotIn("Disactivated", editor.log())
        self.assertEqual(REFS, self.read("refs.bib"))

    def test_comes_with_closing(self):
        editor = self.start_changed()
        self.assertEqual(0, editor.close())
        self.assertIn(b"Old MapsX", self.read("refs.bib"))
        self.assertEqual("", editor.output())


class Start(EditorTest):
    def test_and_end_are_logged_in_their_order(self):
        path = self.write("refs.bib", REFS)
        editor = self.start("-d" + self.folder + "/", "refs").ready()
        self.assertEqual(0, editor.close())
        instance = f"Cartulo-{self.folder}/"
        log = editor.log()
        for line in ("Cartulo: Cartulo::OnInit --- Start",
                     "Cartulo: TNS Control: ",
                     "Cartulo: TNS Control: ",
                     "Cartulo: INFO: Selecting Encoding: CP1252",
                     "Cartulo: Cartulo::OnInit --- Command_Line",
                     f"INFO: Command_Line - -d{self.folder}/ refs",
                     f"INFO: Cartulo::Single Quarlo-{instance}-{getpass.getuser()}",
                     "Cartulo: Cartulo::OnInit --- Names",
                     "Cartulo: Cartulo::OnInit --- pConfig",
                     "Cartulo: Cartulo::OnInit --- Frame ...",
                     "Cartulo: Cartulo::Frame --- Creating Helper ...",
                     "Cartulo: IFNO: Cartulo::Cartulo Parse_Command_Line",
                     "Cartulo: Command: refs",
                     f"Cartulo: Check: {path}",
                     f"Cartulo: Loading: {path}",
                     "Cartulo: More ...",
                     "INFO: Cartulo::OnIndexChanged to alpha (refs)",
                     "Cartulo: Cartulo::Frame --- Status Bar.",
                     "Cartulo: Cartulo::Frame --- End.",
                     f"INFO: DDE server started /tmp/Quarlo-DDE-{instance}",
                     "INFO: DDE server uses DDE",
                     "INFO: Cartulo is now+ Disactivated",
                     "INFO: MyFrame::~MyFrame Begin",
                     "INFO: MyFrame::~MyFrame End",
                     "INFO: Cartulo::~Cartulo Begin",
                     "INFO: Cartulo::~Cartulo End",
                     "INFO: MyApp:OnExit Begin",
                     "INFO: DDE server Disconnected client",
                     "INFO: MyApp:OnExit End"):
            _, found, log = log.partition(line + "\n")
            self.assertTrue(found, f"{line!r} is missing or too early\n{editor.log()}")

    def test_needs_no_standard_streams(self):
        path = self.write("refs.bib", REFS)
        closing = ["sh", "-c", 'exec "$@" <&- >&- 2>&-', "sh", cases.program]
        editor = self.start("refs.bib", command=closing).ready()
        self.assertEqual(ALL_ROWS[:2] + ["gamma (refs)"], editor.rows())
        self.assertTrue(is_locked(path))
        self.assertEqual(0, editor.close())
        self.assertEqual(REFS, self.read("refs.bib"))


class Environment(EditorTest):
    """Files that are not in the base folder."""

    def setUp(self):
        super().setUp()
        self.elsewhere = os.path.join(self.work, "texmf", "below")
        os.makedirs(self.elsewhere)
        with open(os.path.join(self.elsewhere, "refs.bib"), "wb") as stream:
            stream.write(REFS)
        self.programs = os.path.join(self.work, "bin")
        os.mkdir(self.programs)
        self.environment["PATH"] = self.programs  # no other TeX

    def test_finds_what_tex_finds(self):
        script = os.path.join(self.programs, "kpsewhich")
        with open(script, "w", encoding="utf-8") as stream:
            stream.write('#!/bin/sh\necho "$#: $@" >>"$HOME/asked"\n'
                         f'[ "$3" = refs ] && echo "{self.elsewhere}/refs.bib"\n')
        os.chmod(script, 0o700)
        editor = self.start("refs", "missing").await_frame()
        text = editor.messages()
        self.assertIn("The file 'missing' not found", text)
        self.assertIn(f"The file: '{self.elsewhere}/refs.bib'", text)
        self.assertEqual("gamma (refs)", editor.rows()[-1])
        self.assertEqual(0, editor.close())
        with open(os.path.join(self.home, "asked"), encoding="utf-8") as stream:
            self.assertEqual(["3: -format=bib -- refs", "3: -format=bib -- missing"],
                             stream.read().splitlines())

    def test_finds_files_in_the_folders_of_bibinputs(self):
        self.environment["BIBINPUTS"] = f"/nowhere:{os.path.dirname(self.elsewhere)}//:"
        self.assert_opens("g", "gamma (refs)", "refs")

    def test_prefers_the_base_folder(self):
        self.environment["BIBINPUTS"] = self.elsewhere
        self.write("refs.bib", MORE)
        self.assert_opens("z", "zeta (refs)", "refs")


class HostileFiles(EditorTest):
    """Many files in one run, a good one behind them."""

    def chunks(self):
        """The names of the hostile files, as many at a time as a command line holds."""
        names = sorted(os.listdir(HOSTILE))
        self.assertGreater(len(names), 90)
        chunk = []
        for name in names:
            if len(" ".join(chunk + [name, "last.bib"])) > 1000:
                yield chunk
                chunk = []
            chunk.append(name)
        yield chunk

    def copy(self, names):
        for name in names:
            shutil.copy2(os.path.join(HOSTILE, name), self.folder)

    def test_leave_the_editor_and_the_next_file_unharmed(self):
        last = self.write("last.bib", b"@misc{zzz, note = {Unharmed}}\n")
        for names in self.chunks():
            with self.subTest(first=names[0]):
                self.copy(names)
                before = picture_of_files(self.folder)
                editor = self.start_with_messages(*names, "last.bib")
                self.assertEqual(len(names) + 1, editor.log().count("Cartulo: Loading: "))
                self.assertEqual("zzz (last)", editor.type("zzz")[-1])
                self.assertTrue(is_locked(last))
                editor.press("Home", "Next", "Next", "End")
                editor.show_messages("alt+m")
                editor.answer(MESSAGES)
                self.assertEqual(0, editor.close())
                self.assertEqual(before, picture_of_files(self.folder))

    def test_too_many_for_one_command_line_are_refused(self):
        names = sorted(os.listdir(HOSTILE))
        self.copy(names)
        before = picture_of_files(self.folder)
        editor = self.start(*names)
        editor.answer("Cartulo")
        self.assertNotEqual(0, editor.wait_for_end())
        self.assertIn("ERROR: Command line too long: ", editor.log())
        self.assertEqual(before, picture_of_files(self.folder))

    def test_what_is_no_file_is_refused_without_waiting(self):
        os.mkdir(os.path.join(self.folder, "folder.bib"))
        os.mkfifo(os.path.join(self.folder, "pipe.bib"))
        os.symlink("/dev/zero", os.path.join(self.folder, "zero.bib"))
        os.symlink("nowhere", os.path.join(self.folder, "nowhere.bib"))
        self.write("more.bib", MORE)
        before = picture_of_files(self.folder)
        device = os.path.relpath("/dev/zero", self.folder)  # any dot: no ending is added
        editor = self.start("folder", "pipe", "zero", device, "nowhere", "more")
        for _ in ("folder", "pipe", "zero", device):
            editor.answer(LOCK_BOX)
        editor.await_frame()
        editor.answer(MESSAGES)
        editor.ready()
        self.assertEqual(MORE_ROWS, editor.rows())
        self.assertEqual(0, editor.close())
        self.assertEqual(before, picture_of_files(self.folder))


class Names(EditorTest):
    def test_may_hold_blanks(self):
        self.write("my old refs.bib", REFS)
        self.assert_opens("g", "gamma (my old refs)", "my old refs.bib")

    def test_may_hold_letters_beyond_ascii(self):
        self.write("Müller.bib", REFS)
        self.assert_opens("g", "gamma (Müller)", "Müller.bib")

    def test_need_no_ending_and_may_lead_elsewhere(self):
        self.write("refs.bib", REFS)
        self.write("below/more.bib", MORE)
        editor = self.start("below/more", os.path.join(self.folder, "refs")).ready()
        self.assertEqual(ALL_ROWS, editor.rows())

    def test_start_from_the_base_folder(self):
        self.write("below/refs.bib", REFS)
        self.write("refs.bib", MORE)
        self.assert_opens("g", "gamma (refs)", "-d" + self.folder + "/below/", "refs")


class CodePage(EditorTest):
    def test_is_chosen_by_option(self):
        text = ("@misc{жук, note = {Старые карты}}\n@misc{ива, note = {Ђ}}\n"
                "@misc{як, note = {Новые карты}}\n")
        self.write("rus.bib", text.encode("cp1251"))
        use_keyboard("ru")
        self.addCleanup(use_keyboard, "us")
        editor = self.start("-eCP1251", "rus.bib").ready()
        self.assertEqual(["жук (rus)", "ива (rus)", "як (rus)"], editor.rows())
        self.assertEqual(["ива (rus)", "ива (rus)"], editor.type("ив"))

        editor.press("ctrl+Cyrillic_a")  # the key that is F elsewhere
        editor.type("карты")
        editor.press("Down")
        self.assertEqual(["жук (rus)", "як (rus)"], editor.rows())

    def test_is_the_western_one_by_default(self):
        self.write("west.bib", "@misc{a-Größe, note = {}}\n@misc{b, note = {}}\n".encode("cp1252"))
        self.assert_opens("a", "a-Größe (west)", "west.bib")


class WithoutDisplay(EditorTest):
    def run_without_display(self, *command):
        environment = {name: value for name, value in os.environ.items()
                       if name not in ("DISPLAY", "WAYLAND_DISPLAY")}
        return subprocess.run(command, cwd=self.folder, env=environment, text=True, timeout=300,
                              stdin=subprocess.DEVNULL, capture_output=True, check=False)

    def test_help_and_version_are_answered(self):
        for option, text in [("--help", "Usage: cartulo "), ("--version", "cartulo ")]:
            done = self.run_without_display(cases.program, option)
            self.assertEqual((0, ""), (done.returncode, done.stderr))
            self.assertTrue(done.stdout.startswith(text), done.stdout)

    def test_the_start_fails_at_once(self):
        done = self.run_without_display(cases.program, "refs.bib")
        self.assertNotEqual(0, done.returncode)
        self.assertNotEqual("", done.stderr)

    def test_run_sh_starts_the_release(self):
        release = os.path.join(SOURCE, "build", "release", "cartulo")
        if not os.path.exists(release) or not os.path.samefile(cases.program, release):
            self.skipTest("the program is not the one that run.sh starts")
        done = self.run_without_display(os.path.join(SOURCE, "run.sh"), "--version")
        version = self.run_without_display(cases.program, "--version").stdout
        self.assertEqual((0, version), (done.returncode, done.stdout), done.stderr)


if __name__ == "__main__":
    cases.run()
