# SPDX-License-Identifier: Apache-2.0
"""Small changes of the product, and what notices them."""
