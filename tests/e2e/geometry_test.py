#!/usr/bin/python3
"""Tests that the window opens where it was left: see cases.py for the arguments."""

import configparser
import os
import re

import cases
from cases import REFS, EditorTest
from editor import ask_manager, minimise, poll, window_state, xdotool

SASH = 300  # where it is without a stored place
SCREEN = 1280, 1024


class GeometryTest(EditorTest):
    def setUp(self):
        super().setUp()
        self.write("refs.bib", REFS)

    def settings(self):
        path = os.path.join(self.environment["XDG_CONFIG_HOME"], "Cartulo.conf")
        parser = configparser.ConfigParser()
        with open(path, encoding="utf-8") as stream:
            parser.read_file(stream)
        return {name: int(value) for name, value in parser["MainWindow"].items()}

    def store(self, **settings):
        path = os.path.join(self.environment["XDG_CONFIG_HOME"], "Cartulo.conf")
        with open(path, "w", encoding="utf-8") as stream:
            stream.write("[MainWindow]\n")
            stream.writelines(f"{name}={value}\n" for name, value in settings.items())

    def start_editor(self):
        editor = self.start("refs.bib").ready()
        editor.await_place()
        return editor

    def arrange(self, editor, left, top, width, height):
        """Moves and resizes the window and returns where the manager has put it."""
        before = editor.place()
        xdotool("windowsize", editor.frame, width, height)
        editor.wait(lambda: editor.place()[2:] == (width, height), "the window is resized")
        xdotool("windowmove", editor.frame, left, top)
        editor.wait(lambda: editor.place()[:2] != before[:2], "the window is moved")
        editor.settle()
        return editor.place()

    def close_arranged(self):
        editor = self.start_editor()
        place = self.arrange(editor, 220, 160, 900, 650)
        self.assertEqual(0, editor.close())
        return place

    def assert_opens_at(self, place):
        editor = self.start_editor()
        editor.wait(lambda: editor.place() == place, f"the window is at {place}")
        return editor

    def drag_sash(self, editor, start, way):
        """Returns where the sash says that it is then; nothing when it was not at `start`."""
        before = len(editor.log())
        move = ["mousemove", "--window", editor.frame]
        xdotool(*move, start + 2, 300)
        editor.settle()
        xdotool("mousedown", 1, *move, start + 2 + way // 2, 300, *move, start + 2 + way, 300,
                "mouseup", 1)
        editor.settle()
        return [int(place) for place in
                re.findall(r"OnSashMOve sash pos=(-?\d+)", editor.log()[before:])][-1:]


class Place(GeometryTest):
    def test_is_the_usual_one_at_first(self):
        self.assertEqual(0, self.start_editor().close())
        self.assertEqual({"x": 50, "y": 50, "w": 800, "h": 600, "max": 0, "splitter": SASH},
                         self.settings())

    def test_and_size_survive_restarts(self):
        place = self.close_arranged()
        stored = self.settings()
        self.assertGreaterEqual(stored["w"], 900)
        self.assertGreaterEqual(stored["h"], 650)
        for _ in range(2):  # nothing creeps
            self.assertEqual(0, self.assert_opens_at(place).close())
            self.assertEqual(stored, self.settings())

    def test_outlasts_closing_maximised(self):
        place = self.close_arranged()
        stored = self.settings()
        editor = self.assert_opens_at(place)
        ask_manager("-r", editor.frame, "-b", "add,maximized_vert,maximized_horz")
        editor.wait(lambda: editor.place()[2] > 1200, "the window is maximised")
        editor.settle()
        self.assertEqual(0, editor.close())
        self.assertEqual(dict(stored, max=1, splitter=0), dict(self.settings(), splitter=0))

        editor = self.assert_opens_at(place)
        self.assertNotIn("_NET_WM_STATE_MAXIMIZED_VERT", window_state(editor.frame))
        self.assertEqual(0, editor.close())
        self.assertEqual(dict(stored, splitter=0), dict(self.settings(), splitter=0))

    def test_outlasts_closing_minimised(self):
        place = self.close_arranged()
        stored = self.settings()
        editor = self.assert_opens_at(place)
        self.arrange(editor, 20, 40, 1000, 700)
        minimise(editor.frame)
        ask_manager("-c", editor.frame)
        self.assertEqual(0, editor.wait_for_end())
        self.assertEqual(dict(stored, splitter=0), dict(self.settings(), splitter=0))
        self.assert_opens_at(place)

    def test_is_on_the_screen_in_any_case(self):
        self.store(x=5000, y=-300, w=300, h=5000)
        editor = self.start_editor()
        left, top, width, height = editor.place()
        self.assertGreaterEqual(left, 0)
        self.assertGreaterEqual(top, 0)
        self.assertLessEqual(left + width, SCREEN[0])
        self.assertLessEqual(top + height, SCREEN[1])
        self.assertEqual(0, editor.close())
        stored = self.settings()
        self.assertEqual((480, 0, 800), (stored["x"], stored["y"], stored["w"]))


class Sash(GeometryTest):
    def test_survives_restarts(self):
        editor = self.start_editor()
        self.assertEqual([SASH + 100], self.drag_sash(editor, SASH, 100))
        self.assertEqual(0, editor.close())
        self.assertEqual(SASH + 100, self.settings()["splitter"])

        editor = self.start_editor()
        self.assertEqual([], self.drag_sash(editor, SASH, 50))
        self.assertEqual([SASH + 60], self.drag_sash(editor, SASH + 100, -40))
        self.assertEqual(0, editor.close())
        self.assertEqual(SASH + 60, self.settings()["splitter"])

    def test_and_a_large_window_survive_restarts(self):
        editor = self.start_editor()
        self.arrange(editor, 20, 40, 1100, 800)
        self.assertEqual(0, editor.close())
        stored = self.settings()
        self.assertGreater(stored["splitter"], SASH)  # it takes part in the window's growth
        self.assertEqual(0, self.start_editor().close())
        self.assertEqual(stored, self.settings())

    def test_is_kept_by_a_run_without_files(self):
        editor = self.start_editor()
        self.drag_sash(editor, SASH, 100)
        self.assertEqual(0, editor.close())
        stored = self.settings()
        self.assertEqual(SASH + 100, stored["splitter"])
        editor = self.start().await_frame()
        editor.activate(editor.frame)
        self.assertEqual(0, editor.close())
        self.assertEqual(stored, self.settings())


if __name__ == "__main__":
    cases.run()
