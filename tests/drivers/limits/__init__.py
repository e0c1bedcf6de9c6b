# SPDX-License-Identifier: Apache-2.0
"""Less and less memory, fewer and fewer descriptors."""
