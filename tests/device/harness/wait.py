"""Waiting for a condition, with a limit."""

import time

LIMIT = 20.0


def wait_until(condition, what="", limit=LIMIT):
    """Calls `condition` until it gives something true, and returns that.

    After `limit` seconds it fails with `what` (a text, or a function that gives one).
    """
    end = time.monotonic() + limit
    pause = 0.002
    while True:
        result = condition()
        if result:
            return result
        if time.monotonic() > end:
            detail = what() if callable(what) else what
            raise AssertionError(f"waited {limit} s in vain: {detail or condition}")
        time.sleep(pause)
        pause = min(pause * 1.5, 0.03)
