# SPDX-License-Identifier: Apache-2.0
"""Small changes of the product, and whether anything notices them."""
