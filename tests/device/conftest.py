"""Fixtures of the device tests. A failed test leaves a screenshot and the logs in
build-device/failed/TEST."""

import os
import re
import sys

import pytest

sys.path.insert(0, os.path.dirname(os.path.abspath(__file__)))

pytest.register_assert_rewrite("harness")

from harness import Device  # noqa: E402
from harness.device import TOP  # noqa: E402

OPEN = []


@pytest.hookimpl(hookwrapper=True)
def pytest_runtest_makereport(item, call):
    outcome = yield
    report = outcome.get_result()
    if report.failed:
        folder = f"{TOP}/build-device/failed/" + re.sub(r"[^\w.-]+", "_", item.nodeid)
        for number, device in enumerate(OPEN):
            device.keep(folder + (f".{number}" if number else ""))
            report.sections.append(("device", f"screenshot and logs in {folder}"))


def devices():
    """Makes devices until it is closed; fails then when a program complained (GTK+ warnings,
    sanitizer reports) without its test expecting it."""
    made = []

    def make(*arguments, **settings):
        one = Device(*arguments, **settings)
        made.append(one)
        OPEN.append(one)
        return one

    yield make
    try:
        for one in made:
            one.check_quiet()
    finally:
        for one in made:
            OPEN.remove(one)
            one.close()


@pytest.fixture
def device():
    """Makes devices: device("street", rate=50, ...); they end with the test."""
    yield from devices()


@pytest.fixture(scope="module")
def shared_device():
    """The same, for all tests of a module."""
    yield from devices()
