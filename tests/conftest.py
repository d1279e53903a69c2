# SPDX-License-Identifier: MIT
"""For all tests in Python."""

import pytest

# A failed assertion of a shared module shows its values too.
pytest.register_assert_rewrite("harness", "probe", "support")


def pytest_addoption(parser):
    parser.addoption("--write-goldens", action="store_true",
                     help="write the expected records, to be read before they are committed")
