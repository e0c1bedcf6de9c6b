# SPDX-License-Identifier: Apache-2.0
"""Each system call fails once."""
