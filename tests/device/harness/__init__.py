# SPDX-License-Identifier: MIT
"""The real program on a simulated device, driven as a person would drive it; see ../README.md."""

from probe import wait_until

from .device import CATALOGUES, TOP, Device, shared_library

__all__ = ["CATALOGUES", "Device", "TOP", "shared_library", "wait_until"]
