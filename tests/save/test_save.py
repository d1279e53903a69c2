# SPDX-License-Identifier: MIT
"""Saves under bad luck: a kill or an error at every system call, full disks, foreign owners,
mounts.

Runs tests/save-program of the build directory WIRELESS_LAN_BUILD. What needs mounts runs in a mount
namespace of its own."""

import collections
import os
import pathlib
import re
import shutil
import signal
import stat
import subprocess

import pytest

TOP = pathlib.Path(__file__).parents[2]
BUILD = os.environ.get("WIRELESS_LAN_BUILD", TOP / "build")
SAVE = pathlib.Path(BUILD).resolve() / "tests/save-program"
# A leak cannot be looked for under strace.
ENVIRONMENT = {**os.environ, "ASAN_OPTIONS": os.environ.get("ASAN_OPTIONS", "") + ":detect_leaks=0"}
KINDS = ["basic", "preferred"]
ROOT = os.geteuid() == 0
UNSHARE = ["unshare", "-m" if ROOT else "-rm", "--propagation", "unchanged",
           str(TOP / "device/sim/own-mounts")]
as_root = pytest.mark.skipif(not ROOT, reason="needs root")


def run(*command):
    """Runs a command; the finished process with its output as text."""
    return subprocess.run([str(word) for word in command], env=ENVIRONMENT, capture_output=True,
                          text=True, errors="replace", check=False)


def save(kind, path, version, before=()):
    """Runs a save; (exit status, standard error)."""
    done = run(*before, SAVE, kind, path, version)
    return done.returncode, done.stderr


@pytest.fixture
def texts(tmp_path):
    """What each kind and version of file holds."""
    found = {}
    for kind in KINDS:
        for version in ["old", "new", "short"]:
            path = tmp_path / "reference"
            assert save(kind, path, version)[0] == 0
            found[kind, version] = path.read_bytes()
            path.unlink()
    assert len(set(found.values())) == 6
    return found


def calls_of_a_save(kind, path, version, trace):
    """(name, how many of that name so far) of each system call after the marker."""
    status, _ = save(kind, path, version, ["strace", "-qq", "-o", str(trace)])
    assert status == 0
    seen, calls, begun = collections.Counter(), [], False
    for line in trace.read_text(errors="replace").splitlines():
        name = re.match(r"\w+", line)
        if not name:
            continue
        seen[name[0]] += 1
        begun = begun or name[0] == "getppid"
        if begun:
            calls.append((name[0], seen[name[0]]))
    assert ("rename", 1) in calls and ("fsync", 1) in calls
    return calls


def inject(what):
    return ["strace", "-qq", "-o", "/dev/null", "-e", "inject=" + what]


def prepare(directory, scene, kind, texts):
    """The directory of a save, the path to save to and the file that it names."""
    shutil.rmtree(directory, ignore_errors=True)
    directory.mkdir()
    target = directory / "conf"
    path = target
    if scene == "link":
        path = directory / "link"
        path.symlink_to("conf")
    if scene != "new file":
        target.write_bytes(texts[kind, "old"])
        target.chmod(0o640)
    return path, target


SCENES = ["over a file", "new file", "link", "shorter"]


@pytest.mark.parametrize("scene", SCENES)
@pytest.mark.parametrize("kind", KINDS)
def test_killed_at_every_system_call(kind, scene, tmp_path, texts, capsys):
    directory = tmp_path / "etc"
    version = "short" if scene == "shorter" else "new"
    before = None if scene == "new file" else texts[kind, "old"]
    path, target = prepare(directory, scene, kind, texts)
    calls = calls_of_a_save(kind, path, version, tmp_path / "trace")
    outcome = collections.Counter()
    for name, number in calls:
        path, target = prepare(directory, scene, kind, texts)
        status, _ = save(kind, path, version, inject(f"{name}:signal=KILL:when={number}"))
        killed = status in (-signal.SIGKILL, 128 + signal.SIGKILL)
        # exit_group itself; and a sanitizer maps memory once more or less from run to run, so that
        # the last call of a kind may not come.
        assert killed or status == 0, (name, number)
        found = target.read_bytes() if target.exists() else None
        assert found == texts[kind, version] or killed and found == before, (name, number)
        outcome["old" if found == before else "new"] += 1
        outcome["survived"] += not killed
        if found is not None:
            mode = stat.S_IMODE(target.stat().st_mode)
            assert mode == (0o600 if before is None else 0o640), (name, number)
        left = [p for p in directory.iterdir() if p not in (path, target)]
        assert len(left) <= 1, (name, number, left)
    with capsys.disabled():
        print(f"\n{kind}, {scene}: killed at {len(calls)} system calls, file whole each time "
              f"(old {outcome['old']}, new {outcome['new']})", end=" ")
    assert outcome["old"] > 5 and outcome["new"] > 0
    assert outcome["survived"] <= 1 + len(calls) // 50


FAULTS = {
    "openat": ["EACCES", "ENOSPC", "EMFILE", "EROFS"],
    "fchown": ["EPERM", "EIO"],
    "fchmod": ["EPERM", "EIO"],
    "write": ["ENOSPC", "EIO", "EDQUOT", "EINTR"],
    "fsync": ["EIO", "ENOSPC"],
    "rename": ["EBUSY", "EACCES", "EXDEV", "ENOSPC", "EIO"],
    "close": ["EIO"],
    "newfstatat": ["EACCES"],
    "lstat": ["EACCES"],
}


@pytest.mark.parametrize("kind", KINDS)
def test_an_error_at_every_system_call(kind, tmp_path, texts, capsys):
    """Whatever fails: saved means new, not saved means old and a cause; nothing else is left."""
    directory = tmp_path / "etc"
    path, target = prepare(directory, "over a file", kind, texts)
    calls = calls_of_a_save(kind, path, "new", tmp_path / "trace")
    saved, refused = 0, 0
    for name, number in calls:
        for error in FAULTS.get(name, []):
            path, target = prepare(directory, "over a file", kind, texts)
            status, said = save(kind, path, "new", inject(f"{name}:error={error}:when={number}"))
            found = target.read_bytes()
            if status == 0:
                saved += 1
                assert found == texts[kind, "new"], (name, number, error)
            else:
                refused += 1
                assert status == 1 and found == texts[kind, "old"], (name, number, error)
                assert f"{path}: " in said, (name, number, error)
            assert list(directory.iterdir()) == [target], (name, number, error)
            assert stat.S_IMODE(target.stat().st_mode) == 0o640
    with capsys.disabled():
        print(f"\n{kind}: {saved + refused} errors put in, {saved} saved all the same, "
              f"{refused} refused with the old file kept", end=" ")
    assert saved > 3 and refused > 5


@pytest.mark.parametrize("kind", KINDS)
def test_an_error_while_writing_in_place(kind, tmp_path, texts):
    """With a rename that is impossible, a write that fails puts the old content back."""
    directory = tmp_path / "etc"
    for version in ["new", "short"]:
        for fault in ["write:error=EIO:when=2", "fallocate:error=ENOSPC",
                      "ftruncate:error=EIO:when=1", "fsync:error=EIO:when=2"]:
            path, target = prepare(directory, "over a file", kind, texts)
            before = [*inject("rename:error=EBUSY"), "-e", "inject=" + fault]
            status, _ = save(kind, path, version, before)
            assert status == 1, fault
            assert target.read_bytes() == texts[kind, "old"], fault
            assert list(directory.iterdir()) == [target]


def in_namespace(script, *arguments):
    """Runs a shell script with the directory of tests as $1 in a mount namespace; its output."""
    done = run(*UNSHARE, "sh", "-euc", script, "sh", *arguments)
    assert done.returncode == 0, done.stdout + done.stderr
    return done.stdout + done.stderr


@pytest.mark.parametrize("kind", KINDS)
def test_a_full_disk_keeps_the_old_file(kind, tmp_path, texts):
    directory = tmp_path / "small"
    directory.mkdir()
    (tmp_path / "old").write_bytes(texts[kind, "old"])
    said = in_namespace(
        """
        mount -t tmpfs -o size=128k tmpfs "$1"
        cp "$2" "$1/conf"; chmod 640 "$1/conf"
        dd if=/dev/zero of="$1/filler" bs=4k 2>/dev/null || true
        if "$4" "$3" "$1/conf" new; then echo saved; else echo "status $?"; fi
        cmp "$1/conf" "$2" && echo unchanged
        echo "$(ls "$1" | wc -l) entries, mode $(stat -c %a "$1/conf")"
        rm "$1/filler"
        "$4" "$3" "$1/conf" new && echo saved with room
        """,
        directory, tmp_path / "old", kind, SAVE,
    )
    assert f"WIRELESS-LAN-DEBUG: {directory}/conf: No space left on device\n" in said
    # The file could be opened, so nobody says that it could not.
    assert "cannot be open" not in said
    assert "status 1\nunchanged\n2 entries, mode 640\nsaved with room\n" in said.replace(
        "WIRELESS-LAN-DEBUG: isstatic\n", ""
    )


def test_a_full_disk_under_a_mount_point_keeps_the_old_content(tmp_path, texts):
    directory = tmp_path / "small"
    directory.mkdir()
    (tmp_path / "mounted").write_bytes(b"")
    (tmp_path / "old").write_bytes(texts["preferred", "short"])
    said = in_namespace(
        """
        mount -t tmpfs -o size=128k tmpfs "$1"
        cp "$2" "$1/conf"
        mount --bind "$1/conf" "$4"
        dd if=/dev/zero of="$1/filler" bs=4k 2>/dev/null || true
        if "$3" preferred "$4" new; then echo saved; else echo "status $?"; fi
        cmp "$4" "$2" && echo unchanged
        """,
        directory, tmp_path / "old", SAVE, tmp_path / "mounted",
    )
    assert "No space left on device" in said and "status 1\nunchanged\n" in said


@pytest.mark.parametrize("kind", KINDS)
def test_a_mount_point_is_written_in_place(kind, tmp_path, texts):
    (tmp_path / "conf").write_bytes(b"below")
    (tmp_path / "mounted").write_bytes(texts[kind, "old"])
    said = in_namespace(
        """
        mount --bind "$1/mounted" "$1/conf"
        "$3" "$2" "$1/conf" short && echo saved
        """,
        tmp_path, kind, SAVE,
    )
    assert "saved\n" in said
    assert (tmp_path / "mounted").read_bytes() == texts[kind, "short"]
    assert (tmp_path / "conf").read_bytes() == b"below"
    assert sorted(p.name for p in tmp_path.iterdir()) == ["conf", "mounted"]


@pytest.mark.parametrize("kind", KINDS)
def test_a_read_only_file_system_keeps_the_old_file(kind, tmp_path, texts):
    directory = tmp_path / "etc"
    prepare(directory, "over a file", kind, texts)
    said = in_namespace(
        """
        mount --bind "$1" "$1"; mount -o remount,bind,ro "$1"
        "$3" "$2" "$1/conf" new || echo "status $?"
        """,
        directory, kind, SAVE,
    )
    assert f"{directory}/conf: Read-only file system\n" in said and "status 1\n" in said
    assert (directory / "conf").read_bytes() == texts[kind, "old"]


@pytest.mark.parametrize("kind", KINDS)
def test_a_read_only_directory_with_a_writable_file_on_it(kind, tmp_path, texts):
    directory = tmp_path / "etc"
    prepare(directory, "over a file", kind, texts)
    (tmp_path / "writable").write_bytes(texts[kind, "old"])
    said = in_namespace(
        """
        mount --bind "$1" "$1"; mount -o remount,bind,ro "$1"
        mount --bind "$4" "$1/conf"
        "$3" "$2" "$1/conf" new && echo saved
        """,
        directory, kind, SAVE, tmp_path / "writable",
    )
    assert "saved\n" in said
    assert (tmp_path / "writable").read_bytes() == texts[kind, "new"]


def as_user(uid):
    return ["setpriv", f"--reuid={uid}", f"--regid={uid}", "--clear-groups", "--"]


@pytest.fixture
def public_directory(tmp_path):
    """A directory that every user can reach, which pytest's are not."""
    path = pathlib.Path("/tmp") / f"wireless-lan-save-{os.getpid()}"
    path.mkdir()
    program = path / "save"
    shutil.copy(SAVE, program)
    path.chmod(0o755)
    yield path
    shutil.rmtree(path)


@as_root
@pytest.mark.parametrize("kind", KINDS)
def test_mode_and_owner_are_kept(kind, tmp_path, texts):
    for mode in [0o600, 0o644, 0o664, 0o400]:
        path, target = prepare(tmp_path / "etc", "link", kind, texts)
        os.chown(target, 1234, 4321)
        target.chmod(mode)
        assert save(kind, path, "new")[0] == 0
        status = target.stat()
        assert (status.st_uid, status.st_gid) == (1234, 4321)
        assert stat.S_IMODE(status.st_mode) == mode
        assert target.read_bytes() == texts[kind, "new"] and path.is_symlink()


@as_root
@pytest.mark.parametrize("kind", KINDS)
def test_a_directory_of_another_user(kind, public_directory, texts):
    """The file is ours, the directory is not: written in place."""
    directory = public_directory / "etc"
    directory.mkdir(mode=0o755)
    target = directory / "conf"
    target.write_bytes(texts[kind, "old"])
    os.chown(target, 1234, 1234)
    done = run(*as_user(1234), public_directory / "save", kind, target, "short")
    assert done.returncode == 0
    assert target.read_bytes() == texts[kind, "short"]
    assert target.stat().st_uid == 1234


@as_root
@pytest.mark.parametrize("kind", KINDS)
def test_a_file_of_another_user(kind, public_directory, texts):
    """The file keeps its owner where we may write it, else all, though the directory is ours."""
    directory = public_directory / "etc"
    directory.mkdir()
    directory.chmod(0o777)
    target = directory / "conf"
    for mode, saved in [(0o666, True), (0o644, False)]:
        target.write_bytes(texts[kind, "old"])
        target.chmod(mode)
        done = run(*as_user(1234), public_directory / "save", kind, target, "new")
        assert (done.returncode == 0) == saved
        assert target.read_bytes() == texts[kind, "new" if saved else "old"]
        assert saved or f"{target}: Permission denied\n" in done.stderr
        assert target.stat().st_uid == 0 and list(directory.iterdir()) == [target]


@pytest.mark.parametrize("kind", KINDS)
def test_what_is_no_file_is_left_alone(kind, tmp_path):
    (tmp_path / "directory").mkdir()
    (tmp_path / "circle").symlink_to("circle")
    (tmp_path / "null").symlink_to("/dev/null")
    for name, cause in [("directory", "Is a directory"), ("null", "Operation not supported"),
                        ("circle", "Too many levels of symbolic links"),
                        ("missing/conf", "No such file or directory")]:
        status, said = save(kind, tmp_path / name, "new")
        assert status == 1 and f"{tmp_path / name}: {cause}\n" in said
    assert pathlib.Path("/dev/null").is_char_device()
    assert len(list(tmp_path.iterdir())) == 3
