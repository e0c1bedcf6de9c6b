# SPDX-License-Identifier: Apache-2.0
"""What happens between two system calls of a run, or beside it."""
