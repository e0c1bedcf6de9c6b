# SPDX-License-Identifier: Apache-2.0
"""The two tuning files, and the audio profile that asks for them."""

from __future__ import annotations

import struct

from model import configuration, records
from model.streams import OutputStream
from model.system import System

GENERATED_PROFILE = 0xFFFF
BLOCK_SIZE = 188
TELEPHONY = "/tmp/telephony_FFFF.txt"
SPEECHREC = "/tmp/speechrec_FFFF.txt"

SWITCH_WORDS = {1: b"qwaOff", 2: b"qwaOn", 3: b"qwaIdle"}
MODE_WORDS = {1: b"qwaSingleChannel", 2: b"qwaMultiChannel", 3: b"qwaCombined"}

# One line each: the key without its "qwa", how it is stored, and where. Stored as
# "s" or "m" followed by the lowest bit of a two-bit switch or mode code, as "b"
# for a byte and "h" for a signed 16-bit value (capitals: it is a switch code), or
# as a list of n signed 16-bit values, "n*".
LAYOUT = """
AECSwitch s0 0
AGCSwitch s2 0
DiagSwitch s4 0
HFESwitch s6 0
MixFiltSwitch s0 1
MixSwitch s2 1
NRSwitch s4 1
RECSwitch s0 2
RecvAGCSwitch s2 2
RecvBWESwitch s4 2
RecvDLCSwitch s6 2
RecvDTFSwitch s0 3
RecvENSSwitch s2 3
RecvEQSwitch s4 3
SendDynEQSwitch s0 4
SendEQSwitch s2 4
WNDBMode m6 4
WNDBSwitch B 5
AECFiltLen h 6
LFRSwitch H 8
HFEExtent b 10
NCParams 5* 13
NRAtten h 23
RECSuppress b 25
RecvAGCAmpTgts 2* 26
RecvAGCGainVals 3* 30
RecvAGCMaxRates 2* 36
RecvGain h 40
RecvLimitThresh h 42
RecvParamEQNodes 15* 44
RefDelay h 76
RefMaxDelay h 78
SendAGCMaxRates 2* 84
SendAGCAmpTgts 2* 88
SendAGCGainVals 3* 92
SendDynEQMinMaxSNR 2* 98
SendGain h 102
SendLimitThresh h 104
SendParamEQ2Nodes 15* 106
SendParamEQNodes 15* 136
WNDBSuppress b 166
DNSEnable h 167
IVOSwitch H 169
MEQEnable 4* 171
"""


# Rules: TUN-12 to TUN-20
def _value(block: bytes, stored: str, offset: int) -> bytes:
    if stored[0] in "sm":
        code = block[offset] >> int(stored[1:]) & 3
        return (SWITCH_WORDS if stored[0] == "s" else MODE_WORDS).get(code, b"")
    if stored == "B":
        return SWITCH_WORDS.get(block[offset], b"")
    if stored == "b":
        return b"%d" % block[offset]
    if stored.endswith("*"):
        elements = struct.unpack_from(f"<{stored[:-1]}h", block, offset)
        return b"".join(b"%d " % element for element in elements)
    (number,) = struct.unpack_from("<h", block, offset)
    return SWITCH_WORDS.get(number, b"") if stored == "H" else b"%d" % number


# Rules: TUN-08 to TUN-11, TUN-21, FLD-01 to FLD-44
def tuning_text(block: bytes, block_id: int) -> bytes:
    lines = [b"; Genereated config from DPS (blockId %d)\n" % block_id]
    for row in LAYOUT.split("\n"):
        if row:
            key, stored, offset = row.split(" ")
            value = _value(block, stored, int(offset))
            lines.append(b"qwa%b %b\n" % (key.encode("ascii"), value))
    return b"".join(lines)


# Rules: GEN-01, GEN-02
def file_of_block(blocks: bytes, block_id: int, older: bytes) -> bytes:
    """What a file is after the library was asked to write this block to it."""
    if not 0 <= block_id < len(blocks) // BLOCK_SIZE:
        return older
    return tuning_text(blocks[block_id * BLOCK_SIZE:(block_id + 1) * BLOCK_SIZE], block_id)


# Rules: TUN-02, TUN-03, TUN-04, TUN-05, TUN-07
def generate_tuning_file(system: System, block_id: int, path: str) -> str:
    """The disk is read even if the file can't be opened afterwards."""
    blocks = records.tuning_blocks(system)
    output = OutputStream(system, path)
    if output.failed:
        return "no file"
    start = block_id * BLOCK_SIZE
    content = blocks if blocks is not None else bytes(records.DPS_AREA_SIZE)
    output.write(tuning_text(content[start:start + BLOCK_SIZE], block_id))
    output.close()
    return "generated" if blocks is not None else "fallback"


# Rules: PRO-01 to PRO-07, PRO-09
def audio_profile(system: System, ways: dict[str, str]) -> int | None:
    """None if unknown. The files are complete before the profile is known."""
    profile = configuration.parameter(system, configuration.AUDIO_PROFILE)
    if profile == GENERATED_PROFILE:
        ways[TELEPHONY] = generate_tuning_file(system, 3, TELEPHONY)
        ways[SPEECHREC] = generate_tuning_file(system, 2, SPEECHREC)
    return profile
