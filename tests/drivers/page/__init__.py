# SPDX-License-Identifier: Apache-2.0
"""orvane-unit's page, read back and compared with its other reports and with runs."""
