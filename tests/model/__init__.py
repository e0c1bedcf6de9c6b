# SPDX-License-Identifier: Apache-2.0
"""The rules of orvane once more, read apart from its program. Depends on no driver."""
