#!/usr/bin/env python3
"""What a screen reader finds: role and name of every control of the applications on the accessibility bus.

Start the recorder on the same session bus with ELM_ATSPI_MODE=1, then run this. Needs busctl and at-spi2-core."""
import json
import os
import subprocess

REGISTRY = "org.a11y.atspi.Registry"
ROOT = "/org/a11y/atspi/accessible/root"
ACCESSIBLE = "org.a11y.atspi.Accessible"


class Unavailable(RuntimeError):
    """There is no accessibility bus, or an object has gone."""


class Bus:
    def __init__(self, session):
        self._address = session
        self._run("set-property", "org.a11y.Bus", "/org/a11y/bus", "org.a11y.Status", "ScreenReaderEnabled", "b", "true")
        self._address = self._run("call", "org.a11y.Bus", "/org/a11y/bus", "org.a11y.Bus", "GetAddress")[0]

    def _run(self, *arguments):
        command = ["busctl", f"--address={self._address}", "--json=short", "--timeout=10", *arguments]
        try:
            done = subprocess.run(command, capture_output=True, text=True)
        except FileNotFoundError as error:
            raise Unavailable(str(error)) from error
        if done.returncode != 0:
            raise Unavailable(done.stderr.strip())
        return json.loads(done.stdout)["data"] if done.stdout.strip() else None

    def _children(self, name, path):
        return self._run("call", name, path, ACCESSIBLE, "GetChildren")[0]

    def _walk(self, name, path, depth):
        try:
            role = self._run("call", name, path, ACCESSIBLE, "GetRoleName")[0]
            yield depth, role, self._run("get-property", name, path, ACCESSIBLE, "Name")
            children = self._children(name, path)
        except Unavailable:
            return  # it went away meanwhile
        for child in children:
            yield from self._walk(*child, depth + 1)

    def controls(self):
        """(depth, role, name) of everything, parents first."""
        for child in self._children(REGISTRY, ROOT):
            yield from self._walk(*child, 0)


if __name__ == "__main__":
    for depth, role, name in Bus(os.environ["DBUS_SESSION_BUS_ADDRESS"]).controls():
        print("  " * depth + role + (f": {name}" if name else ""))
