# SPDX-License-Identifier: MIT
"""What tests of several kinds share: the formats that the program reads."""
