# SPDX-License-Identifier: MIT
"""The simulated device itself: what the other tests rely on."""

import os
import shutil
import subprocess
import tempfile

from harness import TOP

SIMULATE = f"{TOP}/device/simulate"


def run(*command, **more):
    return subprocess.run(command, stdout=subprocess.PIPE, stderr=subprocess.STDOUT, check=False,
                          stdin=subprocess.DEVNULL, text=True, **more)


def test_the_machine_stays_as_it_was():
    script = ("touch /etc/wireless.conf /tmp/key_tmp /sbin/made-here; mkdir -p /share/locale/xx;"
              "/sbin/ifconfig wlan0 up; ip -o link show wlan0; echo 1 > /proc/kv/iwifi;"
              "cat /proc/kv/iwifi /proc/self/comm; exit 7")
    done = run(SIMULATE, "street", "sh", "-c", script)
    assert done.returncode == 7
    assert ",UP" in done.stdout and done.stdout.endswith("1\ncat\n")
    for path in ("/etc/wireless.conf", "/tmp/key_tmp", "/sbin/made-here", "/share/locale/xx",
                 "/sys/class/net/wlan0"):
        assert not os.path.exists(path)


def test_an_ordinary_user_can_run_it():
    # Where nobody, too, can read it, wherever the checkout is.
    with tempfile.TemporaryDirectory(dir="/tmp") as directory:
        os.chmod(directory, 0o755)
        shutil.copytree(f"{TOP}/device", f"{directory}/device")
        os.mkdir(f"{directory}/tmp")
        os.chmod(f"{directory}/tmp", 0o777)
        nobody = ["setpriv", "--reuid=65534", "--regid=65534", "--clear-groups"]
        done = run(*(nobody if os.getuid() == 0 else []), "env", f"HOME={directory}",
                   f"TMPDIR={directory}/tmp", f"{directory}/device/simulate", "connected",
                   "sh", "-c",
                   "id -u; touch /etc/mine; ip -4 -o address show wlan0; /sbin/iwset a; echo done",
                   cwd="/")
    assert done.stdout.startswith("0\n") and "192.168.7.23/24" in done.stdout, done.stdout
    assert done.stdout.endswith("done\n") and not os.path.exists("/etc/mine")


MOUNTED = """
mkdir "$1/proc"
mount --bind /proc/sys "$1/proc"
mount -o remount,bind,ro "$1/proc"
exec "$2" none sh -c "ls $1/proc; echo done"
"""


def test_a_file_system_that_takes_nothing_may_be_mounted_anywhere():
    with tempfile.TemporaryDirectory(dir="/var/tmp") as directory:
        done = run("unshare", *([] if os.getuid() == 0 else ["-r"]), "-m", "sh", "-euc", MOUNTED,
                   "sh", directory, SIMULATE)
    assert done.stdout.endswith("done\n") and "kernel" in done.stdout, done.stdout


CHROOT = """
cd "$1"
for part in /*; do
    if [ -L "$part" ]; then
        cp -P "$part" .
    elif [ -d "$part" ]; then
        mkdir ".$part"
        mount --rbind "$part" ".$part"
    fi
done
PATH=$PATH:/usr/sbin exec chroot . "$2" connected sh -c "ip -4 -o address show wlan0; echo done"
"""


def test_it_runs_in_a_root_that_is_no_mount_point():
    with tempfile.TemporaryDirectory(dir="/var/tmp") as folder:
        user = [] if os.getuid() == 0 else ["--map-root-user"]
        done = run("unshare", *user, "--mount", "sh", "-euc", CHROOT, "sh", folder, SIMULATE)
    assert "192.168.7.23/24" in done.stdout and done.stdout.endswith("done\n"), done.stdout


def test_what_is_missing_is_named():
    with tempfile.TemporaryDirectory(dir="/tmp") as folder:
        for tool in ("dirname", "sh"):
            os.symlink(shutil.which(tool), f"{folder}/{tool}")
        done = run("unshare", *([] if os.getuid() == 0 else ["--map-root-user"]), "--mount", "sh",
                   "-euc", "mount -t tmpfs none /usr/sbin; PATH=$1 exec $2 street true", "sh",
                   folder, SIMULATE)
    assert done.returncode == 1
    assert done.stdout == "simulate: cc is missing; tools/set-up installs what is needed\n"


def test_a_device_begins_without_files_of_the_machine(device):
    d = device("street")
    with tempfile.NamedTemporaryFile(dir="/tmp") as late:
        assert d.sh("find /tmp -maxdepth 1 ! -type d; cat /proc/kv/iwifi") == "", late.name
    assert d.file("/etc/wireless.conf") is None and d.file("/etc/build_in_wifi") is None


def test_a_language_that_the_machine_has_not(device, german):
    app = device("connected").start(environment=german)
    app.wait_title("Auswahl des Funknetzes")
    assert app.quit() == 0


def test_scenarios_are_named_when_one_is_missing():
    done = run(SIMULATE, "nowhere", "true")
    assert done.returncode == 1 and "street" in done.stdout


def test_arguments_arrive_byte_for_byte(device):
    d = device("street")
    d.sh(r"""/sbin/iwset '' ' a  b ' "$(printf '\377\n\t\001')" 'Käse' '"\' || true""")
    command, = d.commands("iwset")
    assert command.argv == ["/sbin/iwset", "", " a  b ", "\udcff\n\t\x01", "Käse", '"\\']
    assert command.status == 0


def test_a_line_of_the_log_counts_once_it_is_whole(device):
    d = device("street")
    d.sh("/sbin/iwset one")
    with open(f"{d.state}/log", "ab") as log:
        log.write(b'{"event": "start", "pid": 1, "pp')
    assert [command.argv for command in d.commands()] == [["/sbin/iwset", "one"]]


REQUESTS = """
import fcntl, socket, struct
def ask(request, name):
    try:
        answer = fcntl.ioctl(socket.socket(socket.AF_INET, socket.SOCK_DGRAM), request,
                             struct.pack("16s24x", name))
        return answer[16:40].hex()
    except OSError as error:
        return error.strerror
for name in (b"wlan0", b"lo", b"nobody0"):
    for request in (0x8B15, 0x8915, 0x8927):
        print(ask(request, name))
"""


def test_only_the_access_point_is_answered(device):
    d = device("connected")
    d.write("/tmp/ask.py", REQUESTS)
    mac = d.sh("ip -o link show wlan0 | sed 's/.*ether \\([0-9a-f:]*\\).*/\\1/'").strip()
    answers = d.sh("/device/run /usr/bin/python3 /tmp/ask.py").splitlines()
    assert answers[0] == "0100" + "020000000002" + "00" * 16
    assert answers[1].startswith("02000000" + "c0a80717")
    assert answers[2].startswith("0100" + mac.replace(":", ""))
    assert answers[4].startswith("02000000" + "7f000001")
    assert answers[6:] == ["No such device"] * 3

    # Two requests more find nobody; then it is there for one.
    d.associate("02:00:00:00:00:AB", after=2, count=1)
    d.write("/tmp/ask.py", REQUESTS.replace('(b"wlan0", b"lo", b"nobody0")', '[b"wlan0"] * 4')
            .replace("(0x8B15, 0x8915, 0x8927)", "[0x8B15]"))
    macs = [answer[4:16] for answer in
            d.sh("/device/run /usr/bin/python3 /tmp/ask.py").splitlines()]
    assert macs == ["0" * 12] * 2 + ["0200000000ab"] + ["0" * 12]
