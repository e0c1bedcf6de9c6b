# SPDX-License-Identifier: Apache-2.0
"""A car for the tests of one class, restored for each of them."""

from __future__ import annotations

import unittest

from car import Car


class CarTest(unittest.TestCase):
    car: Car

    @classmethod
    def setUpClass(cls) -> None:
        cls.car = Car()
        cls.addClassCleanup(cls.car.close)

    def setUp(self) -> None:
        self.car.reset()
