"""The real program on a simulated device, driven as a person would drive it; see ../README.md."""

from .device import Device
from .wait import wait_until

__all__ = ["Device", "wait_until"]
