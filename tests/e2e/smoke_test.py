#!/usr/bin/env python3
"""smoke_test.py ROOT BIN CASE: drives the real recorder in a real window on a virtual display, as its user would."""
import glob
import os
import re
import shutil
import signal
import sqlite3
import subprocess
import sys
import time

ROOT, BIN, CASE = sys.argv[1:4]
sys.path.insert(0, os.path.join(ROOT, "tools"))
from virtual_place import Place  # noqa: E402


def check(condition, what):
    if not condition:
        raise AssertionError(what)


def start_recorder(place):
    recorder = place.start(os.path.join(BIN, "mewlo-lite"))
    place.wait_for("the window", place.window, 30)
    place.wait_for("the ready recorder", lambda: place.recorder_state() == "1")
    time.sleep(0.5)  # the first frame; before it the window takes no clicks
    return recorder


def start_recording(place):
    place.big_button()
    place.wait_for("the recording", lambda: place.recorder_state() == "2")


def recordings(place):
    """(path, milliseconds, bookmarks) of each, newest first."""
    rows = [line.split("\t") for line in place.tool("list").splitlines()]
    return [(path, int(duration), int(bookmarks)) for path, duration, bookmarks in rows]


def decoded(path, *options):
    return subprocess.run(["ffmpeg", "-v", "error", "-i", path, *options, "-f", "s16le", "-ac", "1", "-"],
                          stdin=subprocess.DEVNULL, capture_output=True, check=True).stdout


def decoded_ms(path):
    raw = decoded(path, "-ar", "8000")
    check(max(abs(b - 128) for b in raw[1::2]) > 0 and raw.strip(b"\0"), f"{path} is silent")
    return len(raw) // 16


def record_pause_bookmark_stop(place):
    start_recorder(place)
    place.make_noise(20)
    start_recording(place)
    began = time.time()
    time.sleep(1.2)
    place.click(250, 883)  # bookmark
    time.sleep(0.6)
    place.call("xdotool", "key", "space")  # pause
    place.wait_for("the pause", lambda: place.recorder_state() == "3")
    recorded = time.time() - began
    time.sleep(1.5)
    place.click(750, 883)  # resume
    place.wait_for("the resumed recording", lambda: place.recorder_state() == "2")
    began = time.time()
    time.sleep(1)
    place.call("xdotool", "key", "Return")  # stop
    place.wait_for("the end", lambda: place.recorder_state() == "1")
    recorded += time.time() - began
    place.wait_for("the row", lambda: len(recordings(place)) == 1)
    path, duration, bookmarks = recordings(place)[0]
    check(bookmarks == 1, "one bookmark")
    check(os.path.basename(path) == "Voice 001.m4a", path)
    check(abs(decoded_ms(path) - recorded * 1000) < 900, f"{decoded_ms(path)} ms of {recorded * 1000:.0f}")
    check(abs(decoded_ms(path) - duration) < 100, "the row tells the length of the file")
    check(not glob.glob(place.env["MEWLO_DEVICE_ROOT"] + "/.mw_*"), "nothing is left beside it")
    with sqlite3.connect(place.env["XDG_DATA_HOME"] + "/mewlo-lite/media.db") as catalogue:
        waveforms = catalogue.execute("SELECT WAVEFORM_PATH, max(WAVEFORM_SAMPLES) > zeroblob(180) FROM waveform").fetchall()
    check(waveforms == [(path, 1)], f"its waveform was measured while it was recorded: {waveforms}")


def killed_recorder_loses_nothing(place):
    recorder = start_recorder(place)
    place.make_noise(20)
    start_recording(place)
    began = time.time()
    time.sleep(1.5)
    place.click(250, 883)
    time.sleep(1.5)
    recorder.send_signal(signal.SIGKILL)
    recorder.wait()
    recorded = (time.time() - began) * 1000
    place.start(os.path.join(BIN, "mewlo-lite"))
    place.wait_for("the rescued recording", lambda: len(recordings(place)) == 1, 20)
    path, _, bookmarks = recordings(place)[0]
    check(bookmarks == 1, "its bookmark")
    check(recorded - decoded_ms(path) < 1000, f"{decoded_ms(path)} ms of {recorded:.0f}")


def minimised_goes_on_and_close_saves(place):
    recorder = start_recorder(place)
    place.make_noise(20)
    start_recording(place)
    window = place.window()
    place.tool("state", "set", "db/menu_widget/language", "de_DE")
    place.wait_for("the German title", lambda: place.call("xdotool", "getwindowname", window).strip() == "Sprachaufnahme")
    place.call("xdotool", "windowminimize", window)
    time.sleep(1.5)
    check(place.recorder_state() == "2", "a minimised recorder goes on")
    recorder.send_signal(signal.SIGTERM)
    check(recorder.wait(15) == 0, "ended in order")
    place.wait_for("the saved recording", lambda: len(recordings(place)) == 1)
    check(decoded_ms(recordings(place)[0][0]) > 1300, "all of it")


def wakes(process):
    with open(f"/proc/{process.pid}/status") as status:
        return int(re.search(r"^voluntary_ctxt_switches:\s+(\d+)", status.read(), re.M).group(1))


def colours(place, window):
    """How many the middle of the window has: one, when it is not drawn."""
    return int(place.call("import", "-window", window, "-gravity", "center", "-crop", "50%x50%+0+0", "-format", "%k",
                          "info:") or 0)


def minimise(place):
    main = place.window()
    place.call("xdotool", "windowminimize", main)
    place.wait_for("the surface", lambda: place.window() not in (None, main))
    time.sleep(1)  # the first frame; before it the surface takes no clicks


def surface_controls_what_is_minimised(place):
    recorder = start_recorder(place)
    place.make_noise(20)
    start_recording(place)
    main = place.window()
    check(len(place.call("xdotool", "search", "--onlyvisible", "--class", "mewlo-lite").split()) == 1, "no surface in front of it")
    minimise(place)
    before = wakes(recorder)
    time.sleep(1)
    check(wakes(recorder) - before < 100, "minimised, it does not wake for every frame and every bit of sound")
    place.click(678, 500)
    place.wait_for("the pause", lambda: place.recorder_state() == "3")
    place.click(70, 500)
    place.wait_for("the window", lambda: place.window() == main)
    place.wait_for("its picture", lambda: colours(place, main) > 50)
    minimise(place)
    place.click(678, 500)
    place.wait_for("the resume", lambda: place.recorder_state() == "2")
    time.sleep(1)
    place.click(811, 500)
    place.wait_for("the saved recording", lambda: len(recordings(place)) == 1)
    place.wait_for("the end of the surface", lambda: place.window() is None)


def request_once(place, end):
    request = place.start(os.path.join(BIN, "mewlo-tool"), "request", "--mime", "audio/AMR", "--max-kb", "100",
                          stdout=subprocess.PIPE, text=True)
    place.wait_for("the window", place.window, 30)
    time.sleep(1)
    place.make_noise(20)
    place.big_button()
    temporary = place.env["MEWLO_DEVICE_ROOT"] + "/.mw_temp"
    place.wait_for("the recording", lambda: os.path.exists(temporary))
    time.sleep(1.5)
    if end == "minimise":
        place.call("xdotool", "windowminimize", place.window())
    else:
        place.call("xdotool", "key", "Return")  # where there is nothing to choose, it is the answer
    if end == "choose":
        place.wait_for("the row", lambda: len(recordings(place)) == 3)
        time.sleep(1)
        place.click(900, 40)  # done, with the recording just made selected
    path = request.communicate(timeout=20)[0].strip()
    check(request.returncode == 0, "status 0")
    check(path.endswith(".amr") and decoded_ms(path) > 1000, path)
    place.wait_for("the end of the window", lambda: place.window() is None)


def control(place, *words):
    return place.call("playerctl", "--player=mewlo_lite", *words).strip()


def trash(place):
    files = place.env["XDG_DATA_HOME"] + "/Trash/files"
    return os.listdir(files) if os.path.isdir(files) else []


def find_play_bookmark_rename_delete(place):
    place.start_bus()
    start_recorder(place)
    place.make_noise(20)
    start_recording(place)
    time.sleep(5)
    place.call("xdotool", "key", "Return")
    place.wait_for("the row", lambda: recordings(place))
    time.sleep(1)
    place.click(500, 120)  # the first row of the list that opened
    place.wait_for("playback", lambda: control(place, "status") == "Playing")
    check(control(place, "metadata", "title") == "Voice 001", "its title")
    place.call("xdotool", "key", "space")
    place.wait_for("the pause", lambda: control(place, "status") == "Paused")
    control(place, "position", "3")
    place.wait_for("the other place", lambda: abs(float(control(place, "position")) - 3) < 0.1)
    place.click(115, 911)  # bookmark
    place.wait_for("the bookmark", lambda: recordings(place)[0][2] == 1)

    place.call("xdotool", "key", "F2")
    time.sleep(1)
    place.call("xdotool", "type", "Harbour")
    place.call("xdotool", "key", "Return")
    place.wait_for("the new name", lambda: recordings(place)[0][0].endswith("/Harbour.m4a"))
    path, duration, bookmarks = recordings(place)[0]
    check(os.path.exists(path) and bookmarks == 1, "the file and its bookmark")
    check(abs(decoded_ms(path) - duration) < 100, "the whole of it")

    shutil.copy(path, os.path.dirname(path) + "/From outside.m4a")
    place.wait_for("the foreign file", lambda: len(recordings(place)) == 2, 2)
    time.sleep(2)  # until the list follows; that closes an open question
    place.call("xdotool", "key", "Delete")
    time.sleep(1)
    place.call("xdotool", "key", "Tab", "Return")  # from cancel to delete
    place.wait_for("the end of the file", lambda: not os.path.exists(path))
    place.wait_for("the row that is left", lambda: len(recordings(place)) == 1)
    check(trash(place) == ["Harbour.m4a"], "it lies in the trash")


def trims_what_it_records(place):
    start_recorder(place)
    place.make_noise(20)
    start_recording(place)
    time.sleep(4)
    place.call("xdotool", "key", "Return")
    place.wait_for("the row", lambda: recordings(place))
    path, duration, _ = recordings(place)[0]
    time.sleep(1)
    place.click(500, 120)  # the first row of the list that opened
    time.sleep(1)
    place.click(885, 911)  # trim
    time.sleep(1)
    place.call("xdotool", "key", "shift+Right", "Right", "Right")  # the start, which has the keyboard
    place.call("xdotool", "key", "Return")
    time.sleep(0.5)
    place.call("xdotool", "key", "Down", "Return")  # as a new file
    place.wait_for("the trimmed recording", lambda: len(recordings(place)) == 2)
    trimmed = path.replace(".m4a", "_001.m4a")
    check(sorted(row[0] for row in recordings(place)) == sorted([path, trimmed]), "its name")
    length = [row[1] for row in recordings(place) if row[0] == trimmed][0]
    check(abs(duration - 1200 - length) < 30, f"{length} of {duration} ms")
    whole, part = decoded(path), decoded(trimmed)
    begin = 44100 * 12 // 10 * 2
    check(part[:length // 2 * 88] == whole[begin:begin + length // 2 * 88], "every sample of it")

    time.sleep(1)
    place.click(885, 911)
    time.sleep(1)
    place.call("xdotool", "key", "shift+Right", "Return")
    time.sleep(0.5)
    place.call("xdotool", "key", "Down", "Down", "Return")  # over the original
    place.wait_for("the replaced recording", lambda: trash(place))
    check(trash(place) == ["Voice 001 (original).m4a"], "the original lies in the trash")
    check(abs(decoded_ms(path) - duration + 1000) < 60, f"{decoded_ms(path)} of {duration} ms")


def request_returns_a_path(place):
    for end in ("stop", "minimise", "choose"):
        request_once(place, end)
    small = subprocess.run([os.path.join(BIN, "mewlo-tool"), "request", "--max-kb", "2"], env=place.env, capture_output=True,
                           text=True, timeout=30)
    check(small.returncode == 1 and "min_size_error" in small.stderr, small.stderr)


def interrupted_request_ends_its_recorder(place):
    """Ctrl-C ends the other instance, and what it had recorded is not lost."""
    for records in (False, True):
        request = place.start(os.path.join(BIN, "mewlo-tool"), "request", stdout=subprocess.PIPE, text=True)
        place.wait_for("the window", place.window, 30)
        time.sleep(1)
        if records:
            place.make_noise(20)
            place.big_button()
            temporary = place.env["MEWLO_DEVICE_ROOT"] + "/.mw_temp"
            place.wait_for("the recording", lambda: os.path.exists(temporary))
            time.sleep(1.5)
        request.send_signal(signal.SIGINT)
        path = request.communicate(timeout=20)[0].strip()
        check((request.returncode == 0) == records, f"status {request.returncode}, recording: {records}")
        check(not records or decoded_ms(path) > 1000, "saved")
        place.wait_for("the end of the window", lambda: place.window() is None)


def main():
    place = Place(BIN)
    try:
        globals()[CASE](place)
    except (AssertionError, TimeoutError) as error:
        print(f"{CASE}: {error}", file=sys.stderr)
        if place.window():
            place.call("import", "-window", "root", f"/tmp/{CASE}.png")
        sys.exit(1)
    finally:
        place.end()


main()
