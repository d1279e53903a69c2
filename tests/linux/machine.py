# SPDX-License-Identifier: MIT
"""The machine on which the device commands are tested: its own /run, /etc, /sys and /usr/sbin, the
stubs that stand in for its tools, and what is left there afterwards.

A test chooses the tools that are installed (choose), tells the stubs what to answer (note), runs a
command (run) and looks at its result, at what the stubs were called with (calls) and at the
processes and files that stay."""

import os
import re
import shutil
import signal
import subprocess
import tempfile
import time

HERE = os.path.dirname(os.path.abspath(__file__))
TOP = os.path.dirname(os.path.dirname(HERE))
DEVICE = os.path.join(TOP, "device", "linux")
SAMPLES = os.path.join(HERE, "samples")
EXPECTED = os.path.join(HERE, "expected")

COMMANDS = ("iwset", "lnk-ifup", "lnk-ifdown", "wireless-lan-auto", "iwlist", "cat", "ap-address",
            "udhcpc-script", "dhcpcd-script", "name-servers", "wpa-action")
LIBRARIES = ("wireless-lan.sh", "address.sh", "automatic.sh", "managers.sh", "preferred.sh",
             "settings.sh", "wpa-network.sh", "hosting.sh", "real-tool.sh", "dhclient-hook")
STUBS = ("iwlist", "cat", "wpa_supplicant", "wpa_cli", "ip", "iw", "dhcpcd", "udhcpc", "dhclient",
         "nmcli", "connmanctl", "networkctl", "ifquery", "ifdown", "iwd", "hostapd",
         "systemd-network", "resolvectl", "resolvconf")
CLIENTS = ("dhcpcd", "udhcpc", "dhclient")
SHELLS = (None, ("busybox", "sh"), ("bash", "--posix"))
AWKS = ("mawk", "gawk", "busybox")
STATE = "/run/wireless-lan/wlan0"

ROOT = ""    # a scratch directory
_hidden = []  # tools of /usr/sbin that the test is without
LOG = ""     # what the stubs note and answer, since the last choose()
CHOSEN = ""  # the stubs that are installed: where root's commands look first


def write(path, text):
    with open(path, "wb") as file:
        file.write(text if isinstance(text, bytes) else text.encode())


def read(path):
    """The bytes of a file; none when there is no such file (any more)."""
    try:
        with open(path, "rb") as file:
            return file.read()
    except (FileNotFoundError, ProcessLookupError):  # a process can go while its file is open
        return b""


def sh(*command):
    subprocess.run(command, check=True, stdout=subprocess.DEVNULL)


def wait_for(condition, limit=90):
    """Waits until the condition holds; whether it came about within the limit in seconds."""
    end = time.monotonic() + limit
    while not condition():
        if time.monotonic() > end:
            return False
        time.sleep(0.05)
    return True


# ---- setting up


def set_up():
    """Once: a /run, /etc and /sys of our own and a /usr/sbin without DHCP clients."""
    global ROOT, CHOSEN
    ROOT = tempfile.mkdtemp(prefix="device-linux-")
    sh("mount", "-t", "tmpfs", "none", ROOT)
    CHOSEN = "/usr/local/sbin"
    sh("mount", "-t", "tmpfs", "none", "/run")
    etc = os.path.join(ROOT, "etc")
    subprocess.run(["cp", "-a", "/etc", etc], stderr=subprocess.DEVNULL, check=False)
    sh("mount", "--bind", etc, "/etc")
    os.makedirs(os.path.join(ROOT, "logs"))
    tools = os.path.join(ROOT, "sbin")
    real = real_sbin()
    os.makedirs(tools)
    os.makedirs(real)
    sh("mount", "--bind", "/usr/sbin", real)
    for name in os.listdir(real):
        if name not in CLIENTS:
            os.symlink(real_tool(name), os.path.join(tools, name))
    sh("mount", "--bind", tools, "/usr/sbin")
    sh("mount", "-t", "tmpfs", "none", CHOSEN)
    os.environ["PATH"] = "/usr/sbin:/usr/bin:/sbin:/bin"  # the tests themselves meet no stub
    sh("mount", "-t", "sysfs", "none", "/sys")
    for place in ("/var/lib/dhcp", "/var/lib/dhcpcd"):  # leases
        if os.path.isdir(place):
            sh("mount", "-t", "tmpfs", "none", place)
    for name in AWKS:
        os.makedirs(awk_directory(name))
        os.symlink(shutil.which(name), os.path.join(awk_directory(name), "awk"))


def tear_down():
    """Nothing is ever deleted below the scratch directory, which shows other places of the machine:
    it is taken off with all that is mounted there."""
    clean()
    os.chdir("/")
    subprocess.run(["umount", "-l", ROOT], check=True)
    os.rmdir(ROOT)


def clean():
    """No process, interface or file of an earlier test."""
    try:
        os.kill(-1, signal.SIGKILL)  # this is process 1: everybody but itself
    except ProcessLookupError:
        pass
    try:
        while os.waitpid(-1, 0)[0] > 0:
            pass
    except ChildProcessError:
        pass
    subprocess.run(["umount", "/sys/class/net"], stderr=subprocess.DEVNULL, check=False)
    for name in os.listdir("/sys/class/net"):
        if name != "lo":
            # The other end of a pair goes with the first.
            subprocess.run(["ip", "link", "del", name], stderr=subprocess.DEVNULL, check=False)
    for name in os.listdir("/run"):
        path = os.path.join("/run", name)
        shutil.rmtree(path) if os.path.isdir(path) and not os.path.islink(path) else os.remove(path)
    for path in ("/etc/wireless.conf", "/etc/default/wireless-lan"):
        if os.path.exists(path):
            os.remove(path)
    while _hidden:
        name = _hidden.pop()
        os.symlink(real_tool(name), f"/usr/sbin/{name}")
    choose()


def real_sbin():
    """Where the machine's own /usr/sbin is found."""
    return os.path.join(ROOT, "real-sbin")


def real_tool(name):
    """Where a tool of the machine's own /usr/sbin is. A link there may lead to a neighbouring
    directory, ../bin/busybox, from where it was."""
    path = os.path.join(real_sbin(), name)
    if os.path.islink(path):
        return os.path.normpath(os.path.join("/usr/sbin", os.readlink(path)))
    return path


def awk_directory(name):
    """A directory with this awk alone, to be put on PATH."""
    return os.path.join(ROOT, "awk", name)


def choose(*names):
    """Which of the stubs are installed; the log begins anew. What an earlier command has left in
    the background goes on in the log that it was started with."""
    global LOG
    for name in os.listdir(CHOSEN):
        os.remove(os.path.join(CHOSEN, name))
    for name in names:
        install(name)
    LOG = tempfile.mkdtemp(dir=f"{ROOT}/logs")


def install(name, target=os.path.join(HERE, "stub")):
    """Installs one more stub, or another program under this name."""
    assert name in STUBS or not target.startswith(HERE)
    os.symlink(target, os.path.join(CHOSEN, name))


def hide(name):
    """For this test a tool of /usr/sbin is not installed."""
    if os.path.lexists(f"/usr/sbin/{name}"):
        os.remove(f"/usr/sbin/{name}")
        _hidden.append(name)


def note(file, text=""):
    """What the stubs answer: written whole, since they may read it at any time."""
    write(f"{ROOT}/note", text)
    os.rename(f"{ROOT}/note", f"{LOG}/{file}")


def forget(file):
    os.remove(f"{LOG}/{file}")


def make_interfaces(*interfaces):
    """/sys/class/net with these: (name, index, type, what tells that it is wireless)."""
    subprocess.run(["umount", "/sys/class/net"], stderr=subprocess.DEVNULL, check=False)
    sh("mount", "-t", "tmpfs", "none", "/sys/class/net")
    for name, index, kind, mark in interfaces:
        directory = f"/sys/class/net/{name}"
        os.makedirs(f"{directory}/{mark}" if mark else directory)
        write(f"{directory}/ifindex", f"{index}\n")
        write(f"{directory}/type", f"{kind}\n")


def make_wlan0():
    make_interfaces(("wlan0", 3, 1, "phy80211"))


def in_busybox():
    """What runs a command where busybox is the only userland; the stubs and files are the same."""
    root = f"{ROOT}/busybox"
    enter = ["/usr/sbin/chroot", root]
    if os.path.isdir(root):
        return enter
    for name in ("bin", "sbin", "usr/bin", "usr/sbin", "tmp"):
        os.makedirs(f"{root}/{name}")
    libraries = subprocess.run(["ldd", "/bin/busybox"], stdout=subprocess.PIPE, check=False).stdout
    for path in ["/bin/busybox", *re.findall(r"/\S+", libraries.decode())]:
        os.makedirs(root + os.path.dirname(path), exist_ok=True)
        shutil.copy(path, root + path)
    sh(*enter, "/bin/busybox", "--install", "-s")
    for path in ("/proc", "/sys", "/run", "/etc", "/dev", CHOSEN, TOP, f"{ROOT}/logs"):
        os.makedirs(root + path, exist_ok=True)
        sh("mount", "--rbind", path, root + path)
    return enter


# ---- running


def path_line(*more):
    """PATH of a command: MORE first, then the chosen stubs."""
    return ":".join([*more, CHOSEN, "/usr/bin", "/bin"])


def environment(*more):
    return {"PATH": path_line(*more), "STUB_LOG": LOG}


def run(command, *arguments, path="", shell=None, more_environment=None, wrap=()):
    """Runs a command of the device as the program would: its status, output and error output. PATH
    is used as it is given; SHELL reads the command; WRAP runs it."""
    variables = dict(more_environment or {}, **environment())
    if path:
        variables["PATH"] = path
    done = subprocess.run([*wrap, *(shell or ()), os.path.join(DEVICE, command), *arguments],
                          env=variables, stdin=subprocess.DEVNULL, stdout=subprocess.PIPE,
                          stderr=subprocess.PIPE, check=False, timeout=300)
    return done.returncode, done.stdout, done.stderr


def start(command, *arguments):
    """Starts a command of the device and does not wait for its end."""
    return subprocess.Popen([os.path.join(DEVICE, command), *arguments], stderr=subprocess.DEVNULL,
                            env=environment())


# ---- what came of it


def calls(name=None):
    """The noted calls, each a list of arguments beginning with the tool's name. A call counts once
    it is noted whole."""
    noted = [call.split(b"\037")[:-1] for call in read(f"{LOG}/calls").split(b"\036\n")[:-1]]
    return [call for call in noted if name is None or call[0] == name.encode()]


def numbers(file):
    """The process numbers that the stubs noted in a file: the first word of each whole line."""
    return [int(line.split()[0]) for line in read(f"{LOG}/{file}").split(b"\n")[:-1]]


def supplicants():
    return numbers("supplicants")


def clients():
    return numbers("clients")


def command_line(pid):
    """The arguments of a process, each with a NUL at its end; none once it has ended. One that is
    about to run another program has none for a moment."""
    lines = []

    def shown():
        lines.append(read(f"/proc/{pid}/cmdline"))
        return lines[-1] or not os.path.exists(f"/proc/{pid}/exe")
    wait_for(shown, limit=5)
    return lines[-1]


def command_lines():
    """Those of all processes, by their numbers."""
    return {pid: command_line(pid) for pid in os.listdir("/proc") if pid.isdigit()}


def running(name):
    """The numbers of the processes that were started as NAME."""
    return [pid for pid, line in command_lines().items()
            if os.path.basename(line.split(b"\0")[0]) == name.encode()]


def alive(pid):
    stat = read(f"/proc/{pid}/stat")
    return bool(stat) and stat.rsplit(b")", 1)[1].split()[0] != b"Z"


def ip_calls():
    """What ip was told to do."""
    return [b" ".join(call[1:]) for call in calls("ip") if b"show" not in call]


# ---- the settings


GROUP = "wifigroup 0\nESSID home\nMODE Ad-Hoc\nKEY \nEncryption off\n"


def settings(text):
    write("/etc/wireless.conf", text)


def static(address="10.1.2.3", netmask="255.255.255.0", broadcast="10.1.2.255", gateway="10.1.2.1",
           interface="wlan0"):
    settings(f"iface {interface}\naddrtype static \naddress {address}\nnetmask {netmask}\n"
             f"broadcast {broadcast}\ngateway {gateway}\n{GROUP}")
