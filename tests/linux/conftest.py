# SPDX-License-Identifier: MIT
"""Where the tests of the device commands run: every worker in namespaces of its own (mounts,
network, processes), so that the commands keep their real paths and the machine stays as it is."""

import os
import sys

import pytest

sys.path.insert(0, os.path.dirname(os.path.abspath(__file__)))
pytest.register_assert_rewrite("machine")

import machine  # noqa: E402


ALONE = "WIRELESS_LAN_TEST_ALONE"  # in the environment of a worker that has its own namespaces


@pytest.hookimpl(tryfirst=True)
def pytest_cmdline_main(config):
    if hasattr(config, "workerinput") or config.option.collectonly:
        return
    user = "" if os.geteuid() == 0 else "-r"
    place = (f"unshare {user} -mnpf --mount-proc --kill-child --propagation unchanged "
             f"{machine.TOP}/device/sim/own-mounts env {ALONE}=yes {sys.executable}")
    workers = config.option.numprocesses
    workers = max(1, workers) if isinstance(workers, int) else 1
    config.option.tx = [f"popen//python={place}"] * workers
    config.option.numprocesses = None
    config.option.dist = "load"


@pytest.fixture(scope="session", autouse=True)
def scratch_machine():
    if ALONE not in os.environ:
        pytest.exit("these tests would change this machine; start them with: pytest tests/linux", 2)
    machine.set_up()
    yield
    machine.tear_down()


@pytest.fixture(autouse=True)
def fresh_machine():
    """Every test begins with no process, no interface and no file of the one before."""
    machine.clean()
