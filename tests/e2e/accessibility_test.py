#!/usr/bin/env python3
"""accessibility_test.py ROOT BIN: what a screen reader finds in the real recorder. Run it on a session bus of its own."""
import os
import sys
import time

ROOT, BIN = sys.argv[1:3]
sys.path.insert(0, os.path.join(ROOT, "tools"))
from accessibility_tree import Bus, Unavailable  # noqa: E402
from virtual_place import Place  # noqa: E402

SKIPPED = 77


def buttons(bus):
    return sorted(name for _, role, name in bus.controls() if role == "push button")


def walk(place, bus):
    place.wait_for("the window", place.window, 30)
    place.wait_for("the ready recorder", lambda: place.recorder_state() == "1")
    time.sleep(0.5)  # the first frame; before it the window takes no clicks
    place.wait_for("the ready screen's names", lambda: buttons(bus) == ["More options", "Record", "Recordings"])
    place.big_button()
    recording = ["Bookmark", "Discard", "More options", "Pause", "Stop"]
    place.wait_for("the recording screen's names", lambda: buttons(bus) == recording)
    place.click(80, 40)  # discard
    place.wait_for("the question's names", lambda: buttons(bus) == sorted(recording + ["Cancel", "Discard"]))
    text = "The recording will be stopped and not be saved."
    assert ("dialog", text) in [(role, name) for _, role, name in bus.controls()], "the question itself"


def main():
    session = os.environ["DBUS_SESSION_BUS_ADDRESS"]
    try:
        bus = Bus(session)
    except Unavailable as error:
        print(f"no accessibility bus here: {error}")
        sys.exit(SKIPPED)
    place = Place(BIN)
    try:
        place.env.update(DBUS_SESSION_BUS_ADDRESS=session, ELM_ATSPI_MODE="1")
        place.make_noise(60)
        place.start(os.path.join(BIN, "mewlo-lite"))
        walk(place, bus)
    except (AssertionError, TimeoutError) as error:
        print(f"{error}; found {list(bus.controls())}", file=sys.stderr)
        sys.exit(1)
    finally:
        place.end()


main()
