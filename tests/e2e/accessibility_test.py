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


def has_named(bus, expected):
    """Covered screens are still in the tree, so there may be more; but each has a name."""
    return all(buttons(bus)) and set(expected) <= set(buttons(bus))


def walk_recordings(place, bus):
    place.click(500, 883)
    place.wait_for("the list's names", lambda: has_named(bus, ["Back", "More options", "Record"]))
    tabs = [name for _, role, name in bus.controls() if role == "page tab"]
    assert "Recordings" in tabs, "the title's name"
    time.sleep(0.5)
    place.click(500, 120)
    panel = ["Back", "Bookmark", "More options", "Next", "Previous", "Trim"]
    # A slow machine reads the names when the recording has been played to its end.
    place.wait_for("the player's names",
                   lambda: has_named(bus, panel) and {"Pause", "Play"} & set(buttons(bus)))
    assert ("slider", "Position") in [(role, name) for _, role, name in bus.controls()], "the slider's name"
    place.click(885, 911)  # trim
    bars = {("slider", "Start"), ("slider", "Position"), ("slider", "End")}
    place.wait_for("the names of the trim panel", lambda: has_named(bus, ["Cancel", "Play", "Save"])
                   and bars <= {(role, name) for _, role, name in bus.controls()})
    place.click(178, 911)  # cancel
    place.wait_for("the player again", lambda: has_named(bus, panel))
    place.click(50, 40)
    place.wait_for("the list again", lambda: not has_named(bus, ["Bookmark"]))
    place.click(50, 40)


def walk(place, bus):
    place.wait_for("the window", place.window, 30)
    place.wait_for("the ready recorder", lambda: place.recorder_state() == "1")
    time.sleep(0.5)  # the first frame; before it the window takes no clicks
    ready = ["More options", "Record", "Recordings"]
    place.wait_for("the ready screen's names", lambda: buttons(bus) == ready)
    walk_recordings(place, bus)
    place.wait_for("the ready screen again", lambda: buttons(bus) == ready)
    time.sleep(0.5)
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
        place.tool("record", "2")
        place.start(os.path.join(BIN, "mewlo-lite"))
        walk(place, bus)
    except (AssertionError, TimeoutError) as error:
        print(f"{error}; found {list(bus.controls())}", file=sys.stderr)
        sys.exit(1)
    finally:
        place.end()


main()
