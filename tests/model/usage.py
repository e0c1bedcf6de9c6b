# SPDX-License-Identifier: Apache-2.0
"""The usage record of the executable."""

from __future__ import annotations

SECTION = "QNX_usage"


# Rules: OPT-15
def usage_record() -> bytes:
    lines = (b"Usage: orvane <options>", b"", b"Options:", b"  -i -- Update iAP config files",
             b"  -a -- Update airplay config file", b"")
    return b"".join(line + b"\r\n" for line in lines)
