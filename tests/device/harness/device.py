# SPDX-License-Identifier: MIT
"""The simulated device of one test: a directory of state, namespaces, a screen, and the program."""

import functools
import json
import os
import re
import shutil
import subprocess
import tempfile
from dataclasses import dataclass

from probe import LIMIT, wait_until
from support.grammar import scan_text, to_bytes

from .app import App, child_ids, kill
from .clock import Clock
from .display import Display

TOP = os.path.dirname(os.path.dirname(os.path.dirname(os.path.dirname(os.path.abspath(__file__)))))

# Where the program looks for its message catalogues.
CATALOGUES = os.environ.get("WIRELESS_LAN_LOCALEDIR", "/share/locale")

# What a healthy program never prints.
COMPLAINT = re.compile(
    r"^(?:.*(?:-WARNING|-CRITICAL|-ERROR) \*\*:.*|.*(?:AddressSanitizer|LeakSanitizer|"
    r"UndefinedBehaviorSanitizer|runtime error:).*|.*Segmentation fault.*)$", re.M)


@dataclass
class Command:
    """One command as the device received it."""
    path: str
    argv: list
    pid: int
    parent: int             # its parent when it began, and when it ended
    end_parent: int = None
    status: int = None      # None: still running, or killed

    @property
    def name(self):
        return os.path.basename(self.path)


@functools.cache
def built():
    """The directory with the device's tools and the probe, built when their sources are newer."""
    directory = subprocess.run([f"{TOP}/device/sim/build"], check=True, stdout=subprocess.PIPE,
                            text=True).stdout.strip()
    subprocess.run([f"{TOP}/tests/probe/build", f"{directory}/probe.so"], check=True)
    return directory


@functools.cache
def shared_library(source, *flags):
    """What C (text) compiles to: the bytes of a library that a program can be made to load."""
    with tempfile.TemporaryDirectory() as directory:
        path = f"{directory}/library.so"
        subprocess.run(["cc", "-w", "-O1", "-shared", "-fPIC", "-x", "c", "-", "-o", path, *flags],
                       check=True, input=source, text=True)
        with open(path, "rb") as file:
            return file.read()


class Device:
    def __init__(self, scenario="street", rate=None, files=None, interfaces=None, scan=None,
                 size="1024x768", window_manager=True):
        """`rate`: rule the program's time (see clock); `files`: {path: content} on the device;
        `interfaces`: names instead of the scenario's; `scan`: what iwlist prints instead."""
        tools = built()
        self.state = tempfile.mkdtemp(prefix="wlan-", dir="/tmp")
        self.display = None
        self.window_manager = window_manager
        self._simulate = None
        self.apps = []
        self.expected = []
        try:
            os.mkdir(f"{self.state}/home")
            shutil.copy(f"{tools}/probe.so", self.state)
            self.clock = None if rate is None else Clock(f"{self.state}/clock", rate)
            for path, content in (files or {}).items():
                self.put(f"files/{path.lstrip('/')}", content)
            if interfaces is not None:
                self.put("interfaces", "".join(name + "\n" for name in interfaces))
            self.display = Display(self.state, size, window_manager)
            self._log = open(f"{self.state}/simulate.log", "wb")
            self._simulate = subprocess.Popen(
                ["setpriv", "--pdeathsig", "KILL", f"{TOP}/device/simulate", scenario, "sh", "-c",
                 ": >/device/state/ready; exec sleep infinity"],
                env={**os.environ, "SIMULATE_STATE": self.state}, stdin=subprocess.DEVNULL,
                stdout=self._log, stderr=self._log)
            wait_until(lambda: os.path.exists(f"{self.state}/ready") or
                       self._simulate.poll() is not None,
                       lambda: self.state_file("simulate.log").decode(), 60)
            assert self._simulate.poll() is None, self.state_file("simulate.log").decode()
            self.init = child_ids(self._simulate.pid)[0]
            if scan is not None:
                self.set_scan(scan)
        except BaseException:
            self.close()
            raise

    def __enter__(self):
        return self

    def __exit__(self, kind, value, traceback):
        try:
            if kind is None:
                self.check_quiet()
        finally:
            self.close()

    def close(self):
        if self._simulate is not None and self._simulate.poll() is None:
            for child in child_ids(self._simulate.pid):
                kill(child)
            self._simulate.wait()
        for app in self.apps:
            app.disconnect()
            app.wait_end()
        if self.display is not None:
            self.display.close()
            self.display = None
        shutil.rmtree(self.state, ignore_errors=True)

    # The program.
    def start(self, *arguments, wait=True, environment=None, device_path=False):
        """Starts it, and waits for its window. `device_path`: the program as it is built for a
        device that has a directory of commands, /usr/lib/wireless-lan/device."""
        number = len(self.apps)
        build = os.path.abspath(os.environ.get("WIRELESS_LAN_BUILD", f"{TOP}/build"))
        program = os.path.abspath(os.environ.get("WIRELESS_LAN",
                                                 f"{build}/wireless-lan/wireless-lan"))
        if device_path:
            program = os.environ.get("WIRELESS_LAN_WITH_DEVICE_PATH",
                                     f"{build}/tests/with-device-path")
        assert os.path.exists(program), f"{program} is not built"
        settings = {
            "DISPLAY": self.display.name, "HOME": "/device/state/home", "LANG": "C.UTF-8",
            "GTK2_RC_FILES": "/dev/null", "GTK_IM_MODULE": "gtk-im-context-simple",
            "GTK_MODULES": f"{self.state}/probe.so", "PROBE_SOCKET": self.probe_path(number),
            "NO_AT_BRIDGE": "1", "PATH": "/usr/sbin:/usr/bin:/sbin:/bin",
            "UBSAN_OPTIONS": "print_stacktrace=1",
            "LSAN_OPTIONS": f"suppressions={TOP}/tests/leaks.supp:print_suppressions=0",
        }
        for name in ("ASAN_OPTIONS", "UBSAN_OPTIONS", "LSAN_OPTIONS"):
            if name in os.environ:
                settings[name] = os.environ[name]
        settings.update(environment or {})
        with open(f"{self.state}/stdout.{number}", "wb") as out, \
                open(f"{self.state}/stderr.{number}", "wb") as error:
            process = subprocess.Popen(
                self._inside("/device/run", program, *arguments), env=settings,
                stdin=subprocess.DEVNULL, stdout=out, stderr=error)
        app = App(self, process, number)
        self.apps.append(app)
        if wait:
            app.wait(60)
        return app

    def preload(self, name, source):
        """The environment of a program that finds the functions of this C source before its
        own libraries'."""
        self.put(f"{name}.so", shared_library(source))
        return {"LD_PRELOAD": f"{self.state}/{name}.so"}

    def probe_path(self, number):
        return f"{self.state}/probe.{number}"

    def expect(self, pattern):
        """Declares a warning, critical or sanitizer line that this test wants (a regular
        expression)."""
        self.expected.append(re.compile(pattern))

    def complaints(self):
        """Warnings, criticals and sanitizer reports that the program printed and no test wanted."""
        return [line for app in self.apps for line in COMPLAINT.findall(app.stderr())
                if not any(pattern.search(line) for pattern in self.expected)]

    def check_quiet(self):
        """Ends what still runs, and fails when the program complained."""
        for app in self.apps:
            if app.running():
                app.kill()
        assert not self.complaints(), "\n".join(self.complaints())

    # The namespaces.
    def _inside(self, *command):
        own_user = ["--user", "--preserve-credentials"]
        if os.readlink(f"/proc/{self.init}/ns/user") == os.readlink("/proc/self/ns/user"):
            own_user = []
        return ["nsenter", "--target", str(self.init), *own_user, "--mount", "--net", "--pid",
                "--root", "--wd", *command]

    def sh(self, script):
        """Runs a shell script on the device (as its root) and gives what it printed."""
        done = subprocess.run(
            self._inside("sh", "-euc", script), stdin=subprocess.DEVNULL, stdout=subprocess.PIPE,
            stderr=subprocess.STDOUT, check=False,
            env={"PATH": "/device/bin:/usr/sbin:/usr/bin:/sbin:/bin", "LC_ALL": "C.UTF-8"})
        assert done.returncode == 0, f"{script}: {done.stdout.decode(errors='replace')}"
        return done.stdout.decode("utf-8", "surrogateescape")

    def outer(self, path):
        """Where this machine sees a path of the device."""
        return f"/proc/{self.init}/root{path}"

    def file(self, path):
        """Content of a file on the device (bytes), None when there is none."""
        try:
            with open(self.outer(path), "rb") as file:
                return file.read()
        except FileNotFoundError:
            return None

    def write(self, path, content):
        os.makedirs(os.path.dirname(self.outer(path)), exist_ok=True)
        with open(self.outer(path), "wb") as file:
            file.write(to_bytes(content))

    def remove(self, path):
        os.unlink(self.outer(path))

    def wait_file(self, path, content, limit=LIMIT):
        wait_until(lambda: self.file(path) == to_bytes(content),
                   lambda: f"{path} to be {content!r}; it is {self.file(path)!r}", limit)

    # What the device answers.
    def state_file(self, name):
        try:
            with open(f"{self.state}/{name}", "rb") as file:
                return file.read()
        except FileNotFoundError:
            return b""

    def put(self, name, content, mode=0o644):
        """Writes a file of the state directory, whole at once."""
        path = f"{self.state}/{name}"
        os.makedirs(os.path.dirname(path), exist_ok=True)
        with open(path + ".new", "wb") as file:
            file.write(to_bytes(content))
        os.chmod(path + ".new", mode)
        os.rename(path + ".new", path)

    def drop(self, name):
        """Removes a file of the state directory, if there is one."""
        try:
            os.unlink(f"{self.state}/{name}")
        except FileNotFoundError:
            pass

    def set_scan(self, text):
        """What "iwlist IF scan" prints from now on (bytes or str)."""
        self.put("scan", text)

    def set_networks(self, *networks):
        """The same from (essid, key, quality, mode, mac) tuples; all but the name may be left out:
        "off", "70/100", "Master", 02:00:00:00:00:01 and so on."""
        self.set_scan(scan_text(*networks))

    def set_wireless(self, text):
        """What "cat /proc/net/wireless" prints."""
        self.put("wireless", text)

    def set_interfaces(self, *names):
        """The interfaces in the kernel's list; the real ones are left as they are."""
        self.put("wireless", self.sh("wireless-list " + " ".join(names)))

    def command(self, name, delay=None, status=None, stdout=None, stderr=None, hook=None,
                missing=False):
        """How a command behaves from now on; what is not given goes back to normal. `hook` is a
        shell script that it runs, with its arguments."""
        for suffix, value in ((".delay", delay), (".exit", status), (".stdout", stdout),
                              (".stderr", stderr)):
            if value is None:
                self.drop(name + suffix)
            else:
                self.put(name + suffix, value if isinstance(value, (bytes, str)) else str(value))
        if hook is not None:
            self.put(f"hooks/{name}", "#!/bin/sh\nPATH=/device/bin:$PATH\n" + hook, 0o755)
        path = "/usr/bin/cat" if name == "cat" else f"/usr/sbin/{name}"
        if missing:
            self.remove(path)
        elif not os.path.exists(self.outer(path)):
            shutil.copy(f"{built()}/command", self.outer(path))

    def associate(self, mac, after=0, count=None):
        """Joins an access point: `after` further requests still find none; for `count` requests."""
        self.put("ap", f"{mac} {after}" + ("" if count is None else f" {count}"))

    def dissociate(self):
        self.drop("ap")

    def address(self, ip, interface="wlan0"):
        """Gives the interface a real address; None takes it away."""
        self.sh(f"no-address {interface}" if ip is None else f"address {ip} {interface}")

    # What the device saw.
    def commands(self, *names):
        """All commands so far in the order in which they began, or those with these names."""
        found, by_pid = [], {}
        # A line that is being written is not there yet.
        for line in self.state_file("log").split(b"\n")[:-1]:
            entry = json.loads(line)
            if entry["event"] == "start":
                texts = [one.encode("latin-1").decode("utf-8", "surrogateescape")
                         for one in [entry["path"]] + entry["argv"]]
                command = Command(texts[0], texts[1:], entry["pid"], entry["ppid"])
                by_pid[entry["pid"]] = command
                found.append(command)
            elif entry["pid"] in by_pid:
                by_pid[entry["pid"]].end_parent = entry["ppid"]
                by_pid[entry["pid"]].status = entry["status"]
        return [one for one in found if not names or one.name in names]

    def clear_commands(self):
        """Forgets the commands so far, those included that have begun and are not written yet."""
        self.wait_commands_ended()
        with open(f"{self.state}/log", "wb"):
            pass

    def wait_command(self, name, count=1, ended=True, limit=LIMIT):
        """The `count`th command of that name, once it has begun (and ended)."""
        def there():
            found = self.commands(name)
            return len(found) >= count and (not ended or found[count - 1].status is not None) \
                and found[count - 1]
        return wait_until(there, lambda: f"{name} {count} times in {self.commands()}", limit)

    def wait_commands_ended(self):
        """Until none runs that the program has left to init, a begun one included that the log does
        not show yet."""
        wait_until(lambda: len(child_ids(self.init)) == 1,
                   lambda: f"the commands to end: {self.commands()}")

    # What the desktop is told.
    def notices(self):
        """(name, text) of every notice on the root window so far, in order."""
        return [(name, value.decode()) for name, _, _, _, value in self.display.root_changes()
                if name.startswith("_NET_WIFI")]

    def states(self):
        """The state numbers sent so far."""
        return [int(value) for name, value in self.notices() if name == "_NET_WIFI_CHANGE_STATUS"]

    def wait_states(self, *states, limit=LIMIT):
        wait_until(lambda: self.states() == list(states),
                   lambda: f"states {states}; they are {self.states()}", limit)

    def keep(self, directory):
        """Saves what a failed test needs to be understood."""
        os.makedirs(directory, exist_ok=True)
        if self.display is not None and self.display.alive():
            self.display.screenshot(f"{directory}/screen.png")
        for name in os.listdir(self.state):
            if re.match(r"(stdout|stderr|log|scan|wireless|ap|simulate|display)", name):
                shutil.copy(f"{self.state}/{name}", directory)
