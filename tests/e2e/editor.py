"""Runs the editor on the present screen as a user would, for the tests beside this file.

What it does is read from its log, its windows and the files on disk. Everything waits for a
condition; DEADLINE only bounds how long a failure takes to show.
"""

import fcntl
import itertools
import os
import re
import subprocess
import time

DEADLINE = 60  # seconds
FRAME = "Quarlo Cartulo"
MESSAGES = "Bibliography File Loading Error Messages"
LOCK_BOX = "Openning BIB file"
OPEN_BOX = "Open BIB file"
COMMIT_BOX = "Commit of Bibliography Entry - Question"

# Keys that mean nothing to the editor, with their codes in its log. They take turns, so that one
# that comes late is not taken for the next.
MARKS = itertools.cycle([("F2", 341), ("F3", 342), ("F4", 343), ("F5", 344), ("F7", 346)])


def poll(condition, what):
    """The first true answer of `condition`."""
    end = time.monotonic() + DEADLINE
    while True:
        answer = condition()
        if answer:
            return answer
        if time.monotonic() > end:
            raise AssertionError(f"not within {DEADLINE} s: {what}")
        time.sleep(0.02)


def xdotool(*arguments):
    done = subprocess.run(["xdotool", *map(str, arguments)], stdin=subprocess.DEVNULL,
                          stdout=subprocess.PIPE, stderr=subprocess.DEVNULL, text=True, check=False)
    return done.stdout.split()


def use_keyboard(layout):
    """xdotool can type letters that no key has, but the keyboard changes under its hands then."""
    subprocess.run(["setxkbmap", "-layout", layout], check=True)


def is_locked(path):
    """Whether another process holds the lock of the file."""
    with open(path, "rb") as stream:
        try:
            fcntl.flock(stream, fcntl.LOCK_EX | fcntl.LOCK_NB)
        except BlockingIOError:
            return True
    return False


def picture_of_files(folder):
    """Name, contents and time of change of all that lies in a folder."""
    picture = {}
    for entry in os.scandir(folder):
        if entry.is_file(follow_symlinks=False):
            with open(entry.path, "rb") as stream:
                picture[entry.name] = (stream.read(), entry.stat().st_mtime_ns)
        else:
            picture[entry.name] = (entry.stat(follow_symlinks=False).st_mode, None)
    return picture


def user_environment(home):
    """Variables for programs of a user whose files are all below `home`."""
    environment = dict(os.environ, HOME=home, LC_ALL="C.UTF-8")
    for name, folder in [("XDG_CONFIG_HOME", "config"), ("XDG_DATA_HOME", "data"),
                         ("XDG_RUNTIME_DIR", "run"), ("TMPDIR", "tmp")]:
        environment[name] = os.path.join(home, folder)
        os.makedirs(environment[name], mode=0o700, exist_ok=True)
    environment.pop("BIBINPUTS", None)
    return environment


def active_window():
    return (xdotool("getactivewindow") or [None])[0]


def windows_named(title):
    """The visible windows of all programs with exactly this title."""
    return xdotool("search", "--onlyvisible", "--name", f"^{re.escape(title)}$")


def window_state(window):
    """What the window manager says: names like _NET_WM_STATE_HIDDEN."""
    answer = subprocess.run(["xprop", "-id", window, "_NET_WM_STATE"], stdout=subprocess.PIPE,
                            stderr=subprocess.DEVNULL, text=True, check=False).stdout
    return re.findall(r"_NET_WM_STATE_\w+", answer)


def minimise(window):
    xdotool("windowminimize", window)
    poll(lambda: "_NET_WM_STATE_HIDDEN" in window_state(window), "the window is minimised")


def ask_manager(*arguments):
    subprocess.run(["wmctrl", "-i", *arguments], check=True)


class Editor:
    """One running editor, started in `folder`. Its log and its output lie in the user's home."""

    count = 0

    def __init__(self, command, folder, environment):
        Editor.count += 1
        own = os.path.join(environment["HOME"], str(Editor.count))
        self.log_path = own + ".log"
        self.output_path = own + ".output"
        environment = dict(environment, CARTULO_LOG="1:" + self.log_path)
        with open(self.output_path, "wb") as output:
            self.process = subprocess.Popen(command, cwd=folder, env=environment,
                                            stdin=subprocess.DEVNULL, stdout=output, stderr=output)
        self.frame = None

    # --- What can be seen ---

    def log(self):
        try:
            with open(self.log_path, encoding="utf-8", errors="backslashreplace") as stream:
                return stream.read()
        except FileNotFoundError:
            return ""

    def output(self):
        with open(self.output_path, encoding="utf-8", errors="backslashreplace") as stream:
            return stream.read()

    def fail(self, text):
        log = "\n".join(self.log().splitlines()[-40:])
        raise AssertionError(f"{text}\n{log}\n{self.output()}")

    def wait(self, condition, what):
        def alive_or_done():
            answer = condition()
            if not answer and self.process.poll() is not None:
                self.fail(f"the editor ended with status {self.process.returncode} before: {what}")
            return answer
        try:
            return poll(alive_or_done, what)
        except AssertionError as error:
            self.fail(str(error))

    def wait_for_log(self, text, count=1):
        self.wait(lambda: self.log().count(text) >= count, f"log line {text!r}")

    def windows(self, title):
        """The visible windows of this editor with exactly this title."""
        return xdotool("search", "--all", "--onlyvisible", "--pid", self.process.pid,
                       "--name", f"^{re.escape(title)}$")

    def wait_for_window(self, title):
        return self.wait(lambda: self.windows(title), f"window {title!r}")[0]

    def place(self):
        """Where the main window's contents are: left, top, width, height."""
        text = subprocess.run(["xwininfo", "-id", self.frame], stdout=subprocess.PIPE,
                              stderr=subprocess.DEVNULL, text=True, check=False).stdout
        names = "Absolute upper-left X", "Absolute upper-left Y", "Width", "Height"
        return tuple(int(re.search(rf"{name}: +(-?\d+)", text).group(1)) for name in names)

    def selections(self):
        """The rows that were selected, first to last."""
        return re.findall(r"^INFO: Cartulo::OnIndexChanged to (.*)$", self.log(), re.MULTILINE)

    def colours(self, window):
        picture = subprocess.run(["import", "-window", window, "png:-"], stdout=subprocess.PIPE,
                                 stderr=subprocess.DEVNULL, check=False).stdout
        answer = subprocess.run(["identify", "-format", "%k", "png:-"], input=picture,
                                stdout=subprocess.PIPE, stderr=subprocess.DEVNULL, check=False)
        return int(answer.stdout or 0)

    # --- What a user does ---

    def activate(self, window):
        xdotool("windowactivate", window)
        self.wait_until_active(window)

    def wait_until_active(self, window=None):
        self.wait(lambda: active_window() == (window or self.frame), "the window becomes active")

    def await_frame(self):
        self.wait_for_log("Cartulo::Frame --- End.")
        self.frame = self.wait_for_window(FRAME)
        return self

    def ready(self):
        """Waits until the main window takes keys."""
        self.await_frame()
        self.activate(self.frame)
        self.settle()
        return self

    def show_messages(self, key):
        before = self.log().count("INFO: Cartulo::OnShowMessages")
        xdotool("key", key)
        self.wait_for_log("INFO: Cartulo::OnShowMessages", before + 1)

    def answer(self, title, key="Return"):
        """Ends a dialog with a key."""
        window = self.wait_for_window(title)
        self.activate(window)
        xdotool("key", key)
        self.wait(lambda: window not in self.windows(title), f"{title!r} closes")

    def begin(self, key):
        """Presses a key that opens a dialog."""
        xdotool("key", key)

    def type_into(self, title, text):
        """Types a text instead of the one in the field of a dialog that has the focus."""
        self.activate(self.wait_for_window(title))
        xdotool("key", "ctrl+a")
        xdotool("type", text)

    def run_dialog(self, key, title, text):
        """Opens a dialog with a key, types a text into it, and accepts it with Enter."""
        self.begin(key)
        self.type_into(title, text)
        self.answer(title)
        self.wait_until_active()

    def settle(self):
        """Returns when the main window has handled all keys and clicks so far."""
        key, code = next(MARKS)
        line = f"INFO: MyFrame::OnCharHook Key={code}("
        before = self.log().count(line)
        xdotool("key", key)
        self.wait_for_log(line, before + 1)

    def press(self, *keys):
        """Presses keys and returns the rows that this selected."""
        before = len(self.selections())
        xdotool("key", *keys)
        self.settle()
        return self.selections()[before:]

    def type(self, text):
        """Types a text and returns the rows that this selected."""
        before = len(self.selections())
        xdotool("type", text)
        self.settle()
        return self.selections()[before:]

    def click(self, x, y):
        before = len(self.selections())
        xdotool("mousemove", "--window", self.frame, x, y, "click", 1)
        self.settle()
        return self.selections()[before:]

    def rows(self):
        """The rows of the list from first to last, at least two; leaves the last selected."""
        self.press("Home")
        self.press("End")
        rows = self.press("Home")
        while True:
            row = self.press("Down")
            if not row:
                return rows
            rows += row

    def await_place(self):
        """Waits until the window is the user's: in its first second it goes where it belongs.

        That second counts from the focus, so the window is ready before."""
        ready = time.monotonic()
        poll(lambda: time.monotonic() > ready + 1, "a second")
        self.settle()

    def change(self):
        """Puts a letter at the end of the first value of the selected entry."""
        self.press("Escape", "Tab", "End", "X")
        self.commit()

    def commit(self):
        """Leaves the entry that is edited and takes the changes over."""
        self.begin("Escape")
        self.answer(COMMIT_BOX)
        self.wait_until_active()
        self.settle()

    def messages(self):
        """The text of the messages window, which ends here; it comes by way of the search box."""
        self.activate(self.wait_for_window(MESSAGES))
        xdotool("key", "Tab", "ctrl+a", "ctrl+c", "Tab")
        self.answer(MESSAGES)
        self.activate(self.frame)
        before = len(self.log())
        self.press("ctrl+f", "ctrl+v")
        text = self.log()[before:].partition("INFO: Cartulo::OnSearch ")[2]
        self.press("ctrl+f", "BackSpace", "Down")
        return text.partition("QListBox::")[0]

    def close(self):
        """Closes the main window by keyboard and returns the exit status."""
        self.activate(self.frame)
        xdotool("key", "alt+F4")
        return self.wait_for_end()

    def wait_for_end(self):
        try:
            return self.process.wait(DEADLINE)
        except subprocess.TimeoutExpired:
            return self.fail("the editor does not end")

    def kill(self):
        self.process.kill()
        self.process.wait()
