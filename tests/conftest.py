# SPDX-License-Identifier: MIT
"""For all tests in Python: a failed assertion of a shared module tells its values too."""

import pytest

pytest.register_assert_rewrite("harness", "probe", "support")
