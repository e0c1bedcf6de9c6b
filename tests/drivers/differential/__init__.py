# SPDX-License-Identifier: Apache-2.0
"""Random units, compared with the model."""
