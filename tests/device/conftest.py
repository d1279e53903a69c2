# SPDX-License-Identifier: MIT
"""Fixtures of the device tests. A failed test leaves a screenshot and the logs in
build-device/failed/TEST."""

import re

import pytest

from harness import TOP, Device, needs
from settings_page import close_dialogs

OPEN = []


def pytest_configure(config):
    """One line instead of a failure of every test where the machine cannot have a device."""
    if hasattr(config, "workerinput") or config.option.collectonly:
        return
    what = needs.missing(TOP)
    if what:
        pytest.exit(f"no simulated device here: {what.strip()}", returncode=1)


@pytest.hookimpl(hookwrapper=True)
def pytest_runtest_makereport(item, call):
    outcome = yield
    report = outcome.get_result()
    if report.failed:
        directory = f"{TOP}/build-device/failed/" + re.sub(r"[^\w.-]+", "_", item.nodeid)
        for number, device in enumerate(OPEN):
            device.keep(directory + (f".{number}" if number else ""))
            report.sections.append(("device", f"screenshot and logs in {directory}"))


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


@pytest.fixture
def german(monkeypatch):
    """The environment of a program that speaks German, and of its device. Named whole: where the
    locale is C, or C.UTF-8 in later releases of the C library, nothing is translated."""
    settings = {"LC_ALL": "de_DE.UTF-8", "LANGUAGE": "de"}
    for name, value in settings.items():
        monkeypatch.setenv(name, value)
    return settings


@pytest.fixture(scope="module")
def shared_device():
    """The same, for all tests of a module."""
    yield from devices()


@pytest.fixture(scope="module")
def program(shared_device):
    """One run of the program for all tests of a module, with the networks of the street listed; no
    address comes by itself."""
    device = shared_device("street")
    device.command("lnk-ifup", hook=":")
    app = device.start()
    app.wait_listed()
    return app


@pytest.fixture
def app(program):
    """The same; what a test leaves open is closed after it, and what it began comes to its end."""
    yield program
    close_dialogs(program)
    program.device.wait_commands_ended()
