# SPDX-License-Identifier: Apache-2.0
"""A second reading of orvane's rules, independent of its program. Depends on no driver."""
