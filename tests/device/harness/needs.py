# SPDX-License-Identifier: MIT
"""What the device tests need of the machine, looked for before the first of them."""

import os
import shutil
import subprocess


def missing(top):
    """What is missing here, in words; empty when nothing is."""
    tools = [tool for tool in ("Xvfb", "openbox", "setpriv", "nsenter", "cc", "pkg-config")
             if not shutil.which(tool)]
    if tools:
        return (f"{', '.join(tools)}: missing; tools/set-up && "
                "tools/set-up tools/packages-tests")
    try:
        own = os.readlink("/proc/self") == str(os.getpid())
    except OSError:
        own = False
    if not own:
        return "/proc is missing, or that of other processes: mount -t proc proc /proc"
    if not os.path.exists(f"/proc/self/task/{os.getpid()}/children"):
        return "the kernel tells no process its children (CONFIG_PROC_CHILDREN)"
    # A whole device, begun and ended: what that needs, it names itself.
    done = subprocess.run([f"{top}/device/simulate", "connected", "true"], text=True, check=False,
                          stdin=subprocess.DEVNULL, stdout=subprocess.PIPE,
                          stderr=subprocess.STDOUT)
    return done.stdout or f"device/simulate ends with {done.returncode}" if done.returncode else ""
