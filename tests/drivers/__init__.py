# SPDX-License-Identifier: Apache-2.0
"""The programs that run orvane and compare it with the model, and what they share."""
