"""A virtual display, window manager, sound server with a microphone, and directories, all of one run alone."""
import os
import re
import shutil
import subprocess
import tempfile
import time


class Place:
    """Display, window manager, sound server and directories of this run alone."""

    def __init__(self, bin_dir):
        self.bin = bin_dir
        self.dir = tempfile.mkdtemp(prefix="mewlo-place-")
        self.children = []
        self.env = dict(os.environ, LC_ALL="C.UTF-8", MEWLO_HOST="none", HOME=self.dir)
        for name in ("DBUS_SESSION_BUS_ADDRESS", "WAYLAND_DISPLAY"):
            self.env.pop(name, None)
        for name in ("XDG_RUNTIME_DIR", "XDG_CONFIG_HOME", "XDG_DATA_HOME", "XDG_STATE_HOME", "MEWLO_DEVICE_ROOT"):
            self.env[name] = os.path.join(self.dir, name)
            os.makedirs(self.env[name], mode=0o700)
        self._display()
        self._sound()

    def start(self, *command, **kwargs):
        kwargs.setdefault("stdout", subprocess.DEVNULL)
        child = subprocess.Popen(command, env=self.env, stdin=subprocess.DEVNULL, stderr=subprocess.DEVNULL, **kwargs)
        self.children.append(child)
        return child

    def call(self, *command):
        return subprocess.run(command, env=self.env, capture_output=True, text=True).stdout

    def wait_for(self, what, condition, limit=15):
        end = time.time() + limit
        while not condition():
            if time.time() > end:
                raise TimeoutError(f"{what} did not happen")
            time.sleep(0.05)

    def _display(self):
        read, write = os.pipe()
        self.start("Xvfb", "-displayfd", str(write), "-screen", "0", "1000x900x24", "-nolisten", "tcp", pass_fds=(write,))
        self.env["DISPLAY"] = ":" + os.read(read, 16).decode().strip()
        manager = [self.start("openbox")]

        def managed():
            if manager[0].poll() is not None:  # lost a race for the new display
                manager[0] = self.start("openbox")
            return "window id" in self.call("xprop", "-root", "_NET_SUPPORTING_WM_CHECK")
        self.wait_for("the window manager", managed, 30)

    def _sound(self):
        runtime = self.env["XDG_RUNTIME_DIR"]
        self.env.update(PULSE_RUNTIME_PATH=runtime, PULSE_STATE_PATH=runtime, PULSE_COOKIE=runtime + "/cookie",
                        PULSE_SERVER=f"unix:{runtime}/native")
        self.start("pulseaudio", "-n", "--daemonize=no", "--exit-idle-time=-1", "--disallow-exit=yes", "--use-pid-file=no",
                   "-L", f"module-native-protocol-unix socket={runtime}/native auth-anonymous=1",
                   "-L", "module-null-sink sink_name=spk norewinds=1",
                   "-L", "module-null-sink sink_name=mic norewinds=1 rate=44100 channels=1",
                   "-L", "module-remap-source source_name=micsrc master=mic.monitor")
        self.wait_for("the sound server", lambda: "Server Name" in self.call("pactl", "info"))
        self.call("pactl", "set-default-source", "micsrc")

    def start_bus(self):
        """A session bus of this run alone, for what is started from now on."""
        address = f"unix:path={self.env['XDG_RUNTIME_DIR']}/bus"
        self.start("dbus-daemon", "--session", "--nofork", f"--address={address}")
        self.wait_for("the session bus", lambda: os.path.exists(self.env["XDG_RUNTIME_DIR"] + "/bus"))
        self.env["DBUS_SESSION_BUS_ADDRESS"] = address

    def make_noise(self, seconds):
        """Plays noise into the microphone for that long."""
        noise = os.path.join(self.dir, "noise.wav")
        subprocess.run(["sox", "-n", "-r", "44100", "-c", "1", noise, "synth", str(seconds), "pinknoise", "vol", "0.4"], check=True)
        return self.start("paplay", "--latency-msec=20", "--device=mic", noise)

    def end(self):
        for child in reversed(self.children):
            child.terminate()
        for child in self.children:
            try:
                child.wait(10)
            except subprocess.TimeoutExpired:
                child.kill()
        shutil.rmtree(self.dir, ignore_errors=True)

    def tool(self, *arguments):
        """What mewlo-tool prints."""
        return self.call(os.path.join(self.bin, "mewlo-tool"), *arguments).strip()

    def recorder_state(self):
        """The state the recorder publishes: 1 ready, 2 recording, 3 paused."""
        return self.tool("pref", "get", "MainRecordingState")

    def window(self):
        found = self.call("xdotool", "search", "--onlyvisible", "--class", "mewlo-lite").split()
        return found[-1] if found else None

    def click(self, x, y):
        """A click at thousandths of the recorder's window."""
        window = self.window()
        geometry = self.call("xwininfo", "-id", window)
        width, height = (int(re.search(name + r": (\d+)", geometry).group(1)) for name in ("Width", "Height"))
        self.call("xdotool", "mousemove", "--window", window, str(width * x // 1000), str(height * y // 1000), "click", "1")

    def big_button(self):
        """Record, or stop while recording."""
        self.click(500, 555)
