# SPDX-License-Identifier: Apache-2.0
"""What every tarball of the project holds, and the version that it is of."""

from __future__ import annotations

import re
from pathlib import Path

PROJECT = Path(__file__).resolve().parents[2]
VERSION = re.search(r"project\(orvane VERSION (\S+)", (PROJECT / "CMakeLists.txt").read_text())[1]

PROGRAMS = {"bin/orvane", "bin/orvane-unit"}
IN_TARBALL = PROGRAMS | {"share/doc/orvane/copyright"}
