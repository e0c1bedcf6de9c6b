# SPDX-License-Identifier: Apache-2.0
"""The library's functions, compared with the model."""
