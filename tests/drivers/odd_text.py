# SPDX-License-Identifier: Apache-2.0
"""Random version texts, description files and command lines, ordinary and odd."""

from __future__ import annotations

import random

from drivers import buffers

LONG_LINE = buffers.ONE_READ + 1

NUMBERS = (
    b"0", b"1", b"7", b"9", b"10", b"15", b"16", b"99", b"127", b"128", b"255", b"256",
    b"257", b"300", b"511", b"65535", b"007", b"0000000000000012", b"+5", b"-1", b"-255",
    b"-256", b"-257", b"--3", b"+-3", b"- 4", b"2147483647", b"2147483648", b"-2147483648",
    b"-2147483649", b"4294967296", b"99999999999999999999", b"-99999999999999999999",
    b"0x1f", b"1e3", b"12a", b"a12", b"", b" ", b" 3", b"\t4", b"\v5", b"\f6", b"\r7", b"8 ",
    b"\x009", b"9\x00", b"1,000", b"\xb2", b"rc1", b"1=2", b"=3", b"4=",
)
SEPARATORS = (b".", b".", b".", b".", b".", b".", b"_", b"..", b". ", b"._", b"-")

WORD_ARGUMENTS = ("word", "a", "i", "-", "", "--", " -a")
OPTION_LETTERS = "aaaaiiiixyzAI019?:;+-=W \xe9"


def version_text(rng: random.Random) -> bytes:
    kind = rng.random()
    if kind < 0.4:
        text = b".".join(b"%d" % rng.randrange(300) for _ in range(3))
    elif kind < 0.5:
        return rng.choice((b"N/A", b"n/a", b"N/A ", b"N/A_1.2.3", b"_N/A", b"_", b".", b"a_b_c"))
    else:
        text = b"".join(rng.choice(NUMBERS) + rng.choice(SEPARATORS)
                        for _ in range(rng.randrange(1, 5)))
        if rng.random() < 0.7:
            text += rng.choice(NUMBERS)
    if rng.random() < 0.3:
        text = rng.choice((b"ABC_", b"V_", b"_", b"a.b_", b"MB-1_")) + text
    if rng.random() < 0.2:
        text += rng.choice((b"_rc", b"_45", b"_", b"-b1", b" x"))
    return text


def _blanks(rng: random.Random) -> bytes:
    return rng.choice((b"", b"", b"", b" ", b"  ", b"\t", b" \t "))


def _odd_line(rng: random.Random) -> bytes:
    return rng.choice((
        b"", b"=", b"==", b"=value", b"Type", b"Type=", b"Type= ", b"Version Number=",
        b"Version Number=   ", b"Version Number", b"Version=9.9.9", b"type=Application",
        b"Type=application", b"Type=Service", b"Type =MainApplication2", b" Type=Applicatio",
        b"\tType=Application", b"Type\t=Application", b"Type=Application\r", b"# comment",
        b"\x00Type=Application", b"Type=Appli\x00cation", b"Type=\x00Application",
        b"Type=a=Application", b"Version  Number=8.8.8", b"version number=7.7.7",
        b"\xff\xfe=\x80", b"Key=" + b"v" * LONG_LINE, b"k" * LONG_LINE,
    ))


def description(rng: random.Random, ordinary: bool) -> bytes:
    """The content of a version description file."""
    kind = rng.choice((b"Application", b"Application", b"MainApplication", b"Applications v2",
                       b"a=Application"))
    lines = [
        _blanks(rng) + b"Type" + _blanks(rng) + b"=" + _blanks(rng) + kind + _blanks(rng)
        if not ordinary else b"Type=" + kind,
        (b"Version Number=" if ordinary else b" Version Number =" + _blanks(rng))
        + version_text(rng) + (b"" if ordinary else _blanks(rng)),
    ]
    if not ordinary:
        if rng.random() < 0.3:
            lines.append(b"Version Number=" + version_text(rng))
        if rng.random() < 0.3:
            del lines[rng.randrange(len(lines))]
        for _ in range(rng.randrange(5)):
            lines.insert(rng.randrange(len(lines) + 1), _odd_line(rng))
        rng.shuffle(lines)
    end = rng.choice((b"\n", b"\n", b"\r\n")) if not ordinary else b"\n"
    text = end.join(lines)
    return text if rng.random() < 0.2 else text + end


def entry_name(rng: random.Random) -> str:
    stem = rng.choice(("app", "map", "nav", "base", "", "x" * 120, "a b", "\xfc"))
    stem += rng.choice(("", str(rng.randrange(100))))
    marker = rng.choice((".inf", ".inf", ".inf", ".inf", ".info", ".inf.old", ".INF", ".in",
                         ".in.f"))
    return stem + marker


def arguments(rng: random.Random, ordinary: bool) -> list[str]:
    if ordinary or rng.random() < 0.5:
        return list(rng.choice((("-a",), ("-i",), ("-a", "-i"), ("-i", "-a"), ("-ai",), ("-ia",),
                                ("-aa",), ("-ai", "-i"), ("-a", "--"), ("-xai",), ("-ai", "word"))))
    given = []
    for _ in range(rng.choice((0, 1, 2, 2, 3, 4))):
        if rng.random() < 0.25:
            given.append(rng.choice(WORD_ARGUMENTS))
        else:
            given.append("-" + "".join(rng.choice(OPTION_LETTERS)
                                       for _ in range(rng.randrange(1, 4))))
    return given
