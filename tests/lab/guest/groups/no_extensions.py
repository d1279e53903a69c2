# SPDX-License-Identifier: MIT
"""A kernel without wireless extensions. None of Debian's is built so: a preloaded library answers
every program of the machine as such a kernel does."""

import errno

import air
import newer_interface


def prepare():
    with open("/etc/ld.so.preload", "w", encoding="ascii") as file:
        file.write("/lab/no-extensions.so\n")
    air.radios(4)
    newer_interface.start()


def the_kernel_knows_no_older_interface():
    # Programs that were started before the library was there do not count: ask a new one.
    air.run("python3", "-c", "import sys; sys.path.insert(0, '/lab'); import newer_interface; "
            f"newer_interface.refused({errno.ENOTTY})")


SCENARIOS = [the_kernel_knows_no_older_interface, *newer_interface.SCENARIOS]
