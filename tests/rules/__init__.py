# SPDX-License-Identifier: Apache-2.0
"""Which tests prove which rule."""
