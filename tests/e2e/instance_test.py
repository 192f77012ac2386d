#!/usr/bin/python3
"""Tests starts of the program while it runs already: see cases.py for the arguments."""

import os
import signal

import cases
from cases import ALL_ROWS, MORE, MORE_ROWS, REFS, EditorTest
from editor import FRAME, LOCK_BOX, MESSAGES, OPEN_BOX, is_locked, minimise, windows_named

REFS_ROWS = ["alpha (refs)", "beta (refs)", "gamma (refs)"]


class InstanceTest(EditorTest):
    def setUp(self):
        super().setUp()
        self.option = "-d" + self.folder + "/"

    def start_first(self, *arguments):
        return self.start(self.option, *arguments).ready()

    def hand_over(self, *arguments, option=None):
        """A second start from another folder; it ends and says nothing."""
        second = self.start(option or self.option, *arguments, folder=self.work)
        self.assertEqual(0, second.wait_for_end(), second.log())
        self.assertEqual("", second.output())
        return second

    def assert_carries_out(self, editor, *arguments):
        """Hands a command over and returns when it has been carried out."""
        line = f"Cartulo: Command: {self.option} {' '.join(arguments)}\n"
        before = editor.log().count(line)
        self.hand_over(*arguments)
        editor.wait_for_log(line, before + 1)
        editor.wait_until_active()
        editor.settle()


class HandOver(InstanceTest):
    def test_replaces_the_open_files(self):
        refs, more = self.write_both()
        third = self.write("third.bib", b"@misc{third, note = {}}\n")
        first = self.start_first("refs", "more")
        self.assert_carries_out(first, "more", "third")
        self.assertEqual(MORE_ROWS[:1] + ["third (third)"] + MORE_ROWS[1:], first.rows())
        self.assertIn(f"Close Unused Bib file: {refs}", first.log())
        self.assertIn(f"Reused Bib file: {more}", first.log())
        self.assertEqual([False, True, True], [is_locked(path) for path in (refs, more, third)])

        self.assert_carries_out(first, "refs")
        self.assertEqual(REFS_ROWS, first.rows())
        self.assertEqual(0, first.close())
        self.assertEqual("", first.output())

    def test_ignores_the_case_of_the_option(self):
        self.write_both()
        first = self.start("-D" + self.folder + "/", "more").ready()
        for option in ("-D", "-d"):
            second = self.hand_over("refs", option=option + self.folder + "/")
            self.assertIn(f"SendCommand {option}{self.folder}/ refs", second.log())
            self.assertEqual(2, second.log().count("INFO: Command_Line - "))
            first.wait_for_log(f"Command: {option}{self.folder}/ refs")
        first.settle()

    def test_saves_what_it_closes(self):
        self.write_both()
        first = self.start_first("refs")
        first.change()
        self.assertEqual(REFS, self.read("refs.bib"))
        self.assert_carries_out(first, "more")
        self.assertIn(b"Old MapsX", self.read("refs.bib"))
        self.assertEqual(MORE_ROWS, first.rows())
        self.assert_carries_out(first, "refs")  # its own backup does not come in the way
        first.change()
        first.press("alt+b")
        self.assertIn(b"Old MapsXX", self.read("refs.bib"))

    def test_takes_names_with_blanks_and_letters_beyond_ascii(self):
        self.write("refs.bib", REFS)
        names = "my old refs.bib", "Müller.bib", "Zoë's größte.bib"
        for name in names:
            self.write(name, b"@misc{a, note = {}}\n@misc{b, note = {}}\n")
        first = self.start_first("refs")
        self.hand_over(*names)
        first.wait_for_log(f"Loading: {self.path(names[-1])}")
        first.wait_until_active()
        bases = sorted(name[:-4] for name in names)
        self.assertEqual([f"{key} ({base})" for key in "ab" for base in bases],
                         sorted(first.rows()))

    def test_shows_what_is_missing(self):
        self.write("more.bib", MORE)
        first = self.start_first("more")
        self.hand_over("more", "missing")
        self.assertIn("ERROR: The file 'missing' not found", first.messages())
        self.assertEqual(MORE_ROWS, first.rows())

    def test_shows_what_is_missing_in_open_messages_too(self):
        self.write("more.bib", MORE)
        first = self.start(self.option, "more", "early").await_frame()
        window = first.wait_for_window(MESSAGES)
        self.hand_over("more", "late")
        first.wait_for_log("INFO: Cartulo::OnShowMessages", 2)
        self.assertEqual([window], first.windows(MESSAGES))
        self.assertIn("ERROR: The file 'late' not found", first.messages())
        self.assertEqual(MORE_ROWS, first.rows())

    def assert_waits_for(self, first, title):
        """Commands that come while a dialog is open are carried out when it has ended."""
        first.wait_for_window(title)
        commands = first.log().count("Cartulo: Command: ")
        for name in ("more", "refs"):  # after the second the first would long be carried out
            self.hand_over(name)
            first.wait_for_log(f"INFO: DDE server Execute {self.option} {name}")
        self.assertEqual(commands, first.log().count("Cartulo: Command: "))
        first.answer(title, "Escape")
        first.wait_for_log(f"Command: {self.option} more")
        first.wait_for_log(f"Command: {self.option} refs")

    def test_waits_for_the_file_dialog(self):
        self.write_both()
        first = self.start_first("more")
        first.press("Down")
        first.begin("ctrl+o")
        self.assert_waits_for(first, OPEN_BOX)
        first.activate(first.frame)
        self.assertEqual(REFS_ROWS, first.rows())

    def test_waits_for_a_question(self):
        self.write_both()
        self.write("third.bib", b"@misc{third, note = {}}\n")
        self.start("third.bib").ready()  # no instance of the folder, and keeps the file
        first = self.start_first("more")
        self.hand_over("third")
        self.assert_waits_for(first, LOCK_BOX)
        first.messages()
        self.assertEqual(REFS_ROWS, first.rows())

    def test_waits_until_files_are_loaded(self):
        refs = self.write("refs.bib", REFS)
        self.write("big.bib", b"".join(b"@misc{k%d, note = {%s}}\n" % (number, b"x" * 200)
                                       for number in range(90000)))
        first = self.start(self.option, "big")
        first.wait_for_log("Loading: ")
        first.process.send_signal(signal.SIGSTOP)  # so that any machine is too slow
        self.assertNotIn("DDE server started", first.log())
        second = self.start(self.option, "refs", folder=self.work)
        second.wait_for_log("failed to connect")
        first.process.send_signal(signal.SIGCONT)
        self.assertEqual((0, ""), (second.wait_for_end(), second.output()))
        first.wait_for_log(f"Loading: {refs}")
        first.await_frame().wait_until_active()
        self.assertEqual(REFS_ROWS, first.rows())

    def test_is_needless_when_the_first_ends_instead(self):
        self.write_both()
        first = self.start_first("refs")
        first.process.send_signal(signal.SIGSTOP)
        second = self.start(self.option, "more")
        second.wait_for_log("SendCommand")
        first.kill()
        self.assertEqual(MORE_ROWS, second.ready().rows())
        self.assert_carries_out(second, "refs")
        self.assertEqual(REFS_ROWS, second.rows())

    def test_ends_with_a_message_when_nobody_answers(self):
        self.write("refs.bib", REFS)
        first = self.start_first("refs")
        first.process.send_signal(signal.SIGSTOP)
        self.addCleanup(first.process.send_signal, signal.SIGCONT)
        second = self.start(self.option, "more")
        self.assertNotEqual(0, second.wait_for_end())
        self.assertIn("the running Cartulo does not answer; these files were not opened: "
                      f"{self.option} more\n", second.output())

        first.process.send_signal(signal.SIGCONT)
        first.settle()
        self.assertNotIn("Command: " + self.option, first.log())
        self.assertEqual(REFS_ROWS, first.rows())


class ComesForward(InstanceTest):
    """The window of the first start, when there is a second."""

    def start_behind_another(self):
        self.write_both()
        first = self.start_first("refs")
        other = self.start_other()
        self.assertEqual([], first.windows(MESSAGES))
        return first, other

    def test_from_behind_another(self):
        first, _ = self.start_behind_another()
        self.assert_carries_out(first, "more")
        self.assertEqual(MORE_ROWS, first.rows())

    def test_from_being_minimised(self):
        first, other = self.start_behind_another()
        minimise(first.frame)
        other.wait_until_active()
        self.assert_carries_out(first, "more")
        self.assertEqual(first.frame, first.wait_for_window(FRAME))
        self.assertEqual(MORE_ROWS, first.rows())

    def test_from_being_minimised_as_the_only_one(self):
        self.write_both()
        first = self.start_first("refs")
        minimise(first.frame)
        self.assert_carries_out(first, "more")
        self.assertEqual(MORE_ROWS, first.rows())

    def test_without_any_files(self):
        first, _ = self.start_behind_another()
        self.hand_over()
        first.wait_until_active()
        first.wait_for_log("WARNING: Cartulo::OnIndexChanged no selection in index")
        self.assertFalse(is_locked(self.path("refs.bib")))


class Instances(InstanceTest):
    def test_run_side_by_side_without_a_base_folder(self):
        self.write_both()
        first = self.start("refs.bib").ready()
        second = self.start("more.bib").ready()
        self.assertEqual(MORE_ROWS, second.rows())
        self.assertEqual(0, second.close())
        first.activate(first.frame)
        self.assertEqual(REFS_ROWS, first.rows())

    def test_serve_one_folder_each(self):
        self.write_both()
        self.write("below/refs.bib", MORE)
        first = self.start_first("refs")
        second = self.start(self.option + "below/", "refs").ready()
        self.assertEqual(2, len(windows_named("Quarlo Cartulo")))
        self.assertEqual(["delta (refs)", "zeta (refs)"], second.rows())
        self.assert_carries_out(first, "refs", "more")
        self.assertEqual(ALL_ROWS, first.rows())
        self.assertNotIn("DDE server Execute", second.log())

    def test_leave_the_folder_to_the_next_when_they_are_killed(self):
        refs, more = self.write_both()
        first = self.start_first("refs", "more")
        first.kill()
        next_one = self.start_first("refs")
        self.assertEqual(REFS_ROWS, next_one.rows())
        self.assertEqual([True, False], [is_locked(path) for path in (refs, more)])
        self.assert_carries_out(next_one, "more")
        self.assertEqual(MORE_ROWS, next_one.rows())
        self.assertEqual(0, next_one.close())

    def test_run_alone_where_they_cannot_be_locked(self):
        self.write_both()
        self.assertEqual(0, self.start_first("more").close())
        folder = os.path.join(self.home, "run", "quarlo")
        lock, = [name for name in os.listdir(folder) if name.endswith(".lock")]
        os.remove(os.path.join(folder, lock))
        os.mkdir(os.path.join(folder, lock))
        editor = self.start_first("refs")
        self.assertIn("ERROR: No instance lock: Is a directory", editor.log())
        self.assertEqual(REFS_ROWS, editor.rows())

    def test_leave_nothing_to_be_met_when_they_are_closed(self):
        self.write_both()
        self.assertEqual(0, self.start_first("refs").close())
        notes = os.listdir(os.path.join(self.home, "run", "quarlo"))
        self.assertEqual([], [name for name in notes if name.endswith(".sock")])
        self.assertEqual(MORE_ROWS, self.start_first("more").rows())

    def test_need_not_have_the_slash_of_their_folder(self):
        self.write_both()
        self.option = "-d" + self.folder + "/x"  # what stands behind the slash is dropped
        first = self.start_first("refs")
        self.assert_carries_out(first, "more")
        self.assertEqual(MORE_ROWS, first.rows())


if __name__ == "__main__":
    cases.run()
