# SPDX-License-Identifier: MIT
"""Waiting for a condition, with a limit."""

import os
import time

# Ends a failure; nothing measures speed with it. A slow machine may have a longer one.
LIMIT = float(os.environ.get("WAIT_LIMIT", "60"))
# Between two looks, at most: where looking takes more than waiting it may be longer.
PAUSE = float(os.environ.get("WAIT_PAUSE", "0.03"))


def wait_until(condition, what="", limit=LIMIT):
    """Calls `condition` until it gives something true, and returns that.

    After `limit` seconds it fails with `what` (a text, or a function that gives one).
    """
    end = time.monotonic() + limit
    pause = 0.002
    while True:
        begun = time.monotonic()
        result = condition()
        if result:
            return result
        now = time.monotonic()
        if now > end:
            detail = what() if callable(what) else what
            raise AssertionError(f"waited {limit} s in vain: {detail or condition}")
        # A condition that takes long on a slow machine leaves that machine time for its work.
        time.sleep(max(pause, min(now - begun, 0.2)))
        pause = min(pause * 1.5, PAUSE)
