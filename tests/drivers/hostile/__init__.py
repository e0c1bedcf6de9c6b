# SPDX-License-Identifier: Apache-2.0
"""Whole units that nobody would make by accident, and every command of orvane-unit on them."""
