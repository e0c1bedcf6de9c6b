# SPDX-License-Identifier: Apache-2.0
"""What the project ships, and its version."""

from __future__ import annotations

import re
from pathlib import Path

PROJECT = Path(__file__).resolve().parents[2]
VERSION = re.search(r"project\(orvane VERSION (\S+)", (PROJECT / "CMakeLists.txt").read_text())[1]

PROGRAMS = {"bin/orvane", "bin/orvane-unit"}
BILL = "share/doc/orvane/orvane.spdx.json"
EVERYWHERE = PROGRAMS | {"share/doc/orvane/copyright", BILL}
IN_TARBALL = EVERYWHERE | {"bin/orvane-field"}
