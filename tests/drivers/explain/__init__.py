# SPDX-License-Identifier: Apache-2.0
"""orvane-unit explain, describe and new, compared with runs in random units."""
