# SPDX-License-Identifier: Apache-2.0
"""Reading a trace."""

from __future__ import annotations

import unittest

from drivers.faults.calls import Call, own_calls
from drivers.faults.faults import order_differences
from model.configuration import IMAGE

TRACE = """\
execve("./enter", ["./enter"..., "unit"], 0x7fff /* 37 vars */) = 0
openat(AT_FDCWD, "/tmp/elsewhere/orvane", O_RDONLY) = 3
read(3, "\\177ELF"..., 8191)            = 8191
close(3)                                = 0
execveat(3, "", ["orvane", "-a"], 0x7ffe /* 37 vars */, AT_EMPTY_PATH) = 0
openat(AT_FDCWD, "/fs/image", O_RDONLY) = 3
lseek(3, 0, SEEK_END)                   = 179
mmap(NULL, 179, PROT_READ, MAP_PRIVATE, 3, 0) = 0x7f98
munmap(0x7f98, 179)                     = 0
close(3)                                = 0
openat(AT_FDCWD, "/tmp/out", O_WRONLY|O_CREAT|O_TRUNC, 0666) = 3
write(3, "# Default name"..., 120)      = 120
openat(AT_FDCWD, "/fs/none", O_RDONLY)  = -1 ENOENT (No such file or directory)
writev(3, [{iov_base="", iov_len=20}, {iov_base="xxxx"..., iov_len=8191}], 2) = 8211
write(2, "orvane: invalid"..., 30)      = 30
close(3)                                = 0
openat(AT_FDCWD, "/tmp/out", O_WRONLY|O_CREAT|O_TRUNC, 0666) = 3
write(3, "stock"..., 5)                 = 5
getdents64(4, 0x3094d760 /* 3 entries */, 32768) = 88
+++ exited with 0 +++
"""


class Trace(unittest.TestCase):
    def test_own_calls(self) -> None:
        found = [(call.name, call.number, call.operation, call.path, call.occurrence)
                 for call in own_calls(TRACE.splitlines())]
        self.assertEqual(found, [
            ("openat", 2, "open", "/fs/image", 1), ("lseek", 1, "seek", "/fs/image", 1),
            ("mmap", 1, "map", "/fs/image", 1), ("munmap", 1, "unmap", "/fs/image", 1),
            ("close", 2, "close", "/fs/image", 1), ("openat", 3, "open", "/tmp/out", 1),
            ("write", 1, "write", "/tmp/out", 1), ("openat", 4, "open", "/fs/none", 1),
            ("writev", 1, "write", "/tmp/out", 1), ("close", 3, "close", "/tmp/out", 1),
            ("openat", 5, "open", "/tmp/out", 2), ("write", 3, "write", "/tmp/out", 2)])

    def test_turns_of_a_path(self) -> None:
        found = [(call.name, call.path, call.turn)
                 for call in own_calls(TRACE.splitlines()) if call.path == "/tmp/out"]
        self.assertEqual(found, [
            ("openat", "/tmp/out", 1), ("write", "/tmp/out", 1), ("writev", "/tmp/out", 1),
            ("close", "/tmp/out", 1), ("openat", "/tmp/out", 2), ("write", "/tmp/out", 2)])

    def test_bytes_covered(self) -> None:
        found = [(call.offset, call.moved, call.pieces)
                 for call in own_calls(TRACE.splitlines()) if call.operation == "write"]
        self.assertEqual(found, [(0, 120, ()), (120, 8211, (20, 8191)), (0, 5, ())])


class Order(unittest.TestCase):
    OPEN = Call("openat", 1, "open", IMAGE, 1, 1)
    SEEK = Call("lseek", 1, "seek", IMAGE, 1, 1)
    FOLDER = Call("openat", 2, "open", "/fs/rwdata/.Version/", 1, 1)
    CLOSE = Call("close", 1, "close", IMAGE, 1, 1)
    STREAM_SEEK = Call("lseek", 2, "seek", "/tmp/out", 1, 1)

    WANT = (("open", IMAGE), ("seek", IMAGE), ("open", "/fs/rwdata/.Version"))

    def test_same_order_has_no_difference(self) -> None:
        calls = [self.OPEN, self.SEEK, self.CLOSE, self.FOLDER, self.STREAM_SEEK]
        self.assertEqual(order_differences(self.WANT, calls), [])

    def test_another_order_or_number_is_a_difference(self) -> None:
        for calls in ([self.SEEK, self.OPEN, self.FOLDER], [self.OPEN, self.SEEK],
                      [self.OPEN, self.OPEN, self.SEEK, self.FOLDER]):
            self.assertNotEqual(order_differences(self.WANT, calls), [])
