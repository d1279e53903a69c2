# SPDX-License-Identifier: MIT
"""Multi-link cards, for which the kernel refuses its wireless extensions."""

import errno

import air
import newer_interface

KERNEL = "6.12"


def prepare():
    air.radios(4, multi_link=True)
    newer_interface.start()


def the_kernel_refuses_its_older_interface():
    newer_interface.refused(errno.EOPNOTSUPP)


SCENARIOS = [the_kernel_refuses_its_older_interface, *newer_interface.SCENARIOS]
