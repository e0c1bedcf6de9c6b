# SPDX-License-Identifier: Apache-2.0
"""A simulated unit with its own shells and utilities, and processes that have it as their root."""

from __future__ import annotations

import ctypes
import os
import re
import resource
import shutil
import signal
import stat
import subprocess
import tempfile
from collections.abc import Callable
from dataclasses import dataclass, field
from pathlib import Path

SCRIPT = Path(__file__).resolve().parents[2] / "field/orvane-field"
ORVANE = Path(os.environ.get("ORVANE", "orvane"))
ORVANE_UNIT = os.environ.get("ORVANE_UNIT", "orvane-unit")

SHELLS = {"dash": ("/bin/dash",), "busybox": ("/bin/busybox", "sh"), "mksh": ("/bin/mksh",)}
LOOK_UTILITIES = ("mv", "rm")
CAPTURE_UTILITIES = ("dd", "mkdir", "rm")
UTILITIES = ("dd", "ls", "mkdir", "mount", "mv", "rm", "uname")

OUTPUTS = ("airplay.conf", "telephony_FFFF.txt", "speechrec_FFFF.txt", "iap2_device.cfg",
           "iap2.cfg", "iap1.cfg")
IMAGE = "fs/tmpfs/VS_DIAG_SERVICE_CONFIG_SHARED_MEM"
DISK = "dev/hd0"
VERSIONS = "fs/rwdata/.Version"
AREA = 1 << 20

NOBODY = 65534
CLONE_NEWNS, CLONE_NEWUSER = 0x00020000, 0x10000000
MS_REC, MS_PRIVATE = 0x4000, 0x40000
TIME_LIMIT = 60  # seconds; only a script that hangs reaches it

_libc = ctypes.CDLL(None, use_errno=True)


def is_root() -> bool:
    return os.geteuid() == 0


def _called(result: int) -> None:
    if result != 0:
        raise OSError(ctypes.get_errno(), os.strerror(ctypes.get_errno()))


def _mount(kind: bytes | None, target: bytes, flags: int, data: bytes | None) -> None:
    _called(_libc.mount(kind, target, kind, ctypes.c_ulong(flags), data))


def _become_root_of_a_namespace() -> None:
    """Lets this process change its root, through its own user namespace."""
    if is_root():
        return
    user, group = os.geteuid(), os.getegid()
    _called(_libc.unshare(CLONE_NEWUSER))
    Path("/proc/self/setgroups").write_text("deny")
    Path("/proc/self/uid_map").write_text(f"0 {user} 1")
    Path("/proc/self/gid_map").write_text(f"0 {group} 1")


def libraries(program: str) -> set[str]:
    listing = subprocess.run(["ldd", program], capture_output=True, text=True, check=False).stdout
    return set(re.findall(r"(/\S+) \(0x", listing))


def snapshot(folder: Path) -> dict[str, tuple[object, ...]]:
    """Everything that a careless script could change below the folder, by path."""
    entries: dict[str, tuple[object, ...]] = {}
    for path in [folder, *folder.rglob("*")]:
        status = path.lstat()
        kind = stat.S_IFMT(status.st_mode)
        content: object = None
        if kind == stat.S_IFREG:
            content = path.read_bytes() if status.st_size < AREA else status.st_size
        elif kind == stat.S_IFLNK:
            content = os.readlink(path)
        # A folder's time changes even if an entry is added and removed again.
        stamp = None if kind == stat.S_IFDIR else status.st_mtime_ns
        entries[str(path.relative_to(folder))] = (
            kind, stat.S_IMODE(status.st_mode), status.st_uid, status.st_ino, stamp, content)
    return entries


@dataclass
class Done:
    status: int  # negative when a signal ended it
    out: str
    err: str

    def lines(self, word: str) -> list[str]:
        return [line.split(None, 1)[1] for line in self.out.splitlines() if line.startswith(word + " ")]

    def line(self, question: str) -> str:
        """The whole line that answers the question."""
        found = [line for line in self.out.splitlines() if question in line]
        assert len(found) == 1, (question, self.out, self.err)
        return found[0]


@dataclass
class Circumstances:
    shell: str = "dash"
    path: str = "/bin"
    is_ordinary: bool = False  # an ordinary user; only where the tests run as root
    largest_file: int | None = None  # bytes
    room: tuple[str, int] | None = None  # a file system of this many bytes at a folder
    mask: int = 0o022
    output: int = subprocess.PIPE
    environment: dict[str, str] = field(default_factory=dict)


class Car:
    """One folder for a whole test class: installing the shells takes longer than a test."""

    def __init__(self) -> None:
        self._holder = tempfile.TemporaryDirectory(prefix="orvane-field-")
        base = Path(self._holder.name)
        self.root = base / "unit"
        self._pristine = base / "pristine"
        subprocess.run([ORVANE_UNIT, "new", self._pristine], check=True)
        self._install()
        self.reset()

    def close(self) -> None:
        self._holder.cleanup()

    def _install(self) -> None:
        bin_folder = self.root / "bin"
        bin_folder.mkdir(parents=True)
        for name in ("busybox", "dash", "mksh"):
            program = shutil.which(name)
            assert program, f"{name} is missing"
            shutil.copy(program, bin_folder / name)
            for library in libraries(program):
                target = self.root / library.lstrip("/")
                target.parent.mkdir(parents=True, exist_ok=True)
                shutil.copy(library, target)
        for name in UTILITIES:
            (bin_folder / name).symlink_to("busybox")
        (bin_folder / "sh").symlink_to("dash")
        shutil.copy(ORVANE, bin_folder / "orvane")
        shutil.copy(SCRIPT, bin_folder / "orvane-field")
        self.root.chmod(0o755)

    def reset(self) -> None:
        """A whole unit, as orvane-unit makes it, with nothing in /tmp."""
        for path in self.root.iterdir():
            if path.name in ("bin", "lib", "lib64", "usr"):
                continue
            if path.is_dir() and not path.is_symlink():
                shutil.rmtree(path)
            else:
                path.unlink()
        for path in self._pristine.iterdir():
            if path.is_dir():
                shutil.copytree(path, self.root / path.name, symlinks=True)
        (self.root / "tmp").chmod(0o1777)
        # A file, since an ordinary user can't make a device.
        (self.root / "dev/null").touch()
        (self.root / "dev/null").chmod(0o666)
        (self.root / "home").mkdir()
        (self.root / "home").chmod(0o777)

    def replace_unit(self, made: Path) -> None:
        """Replaces the unit's own folders by those of another unit."""
        for name in ("fs", "dev", "tmp"):
            shutil.rmtree(self.root / name)
            if (made / name).is_dir():
                shutil.copytree(made / name, self.root / name, symlinks=True)
        (self.root / "dev").mkdir(exist_ok=True)
        (self.root / "dev/null").touch()

    def __truediv__(self, path: str) -> Path:
        return self.root / path

    def program(self, path: str, text: str) -> None:
        target = self.root / path
        target.parent.mkdir(parents=True, exist_ok=True)
        target.write_text("#!/bin/dash\n" + text)
        target.chmod(0o755)

    def wrap(self, text: str, *names: str) -> str:
        """Puts programs before the real ones; NAME in the text stands for each name. Returns the search
        path."""
        for name in names:
            self.program(f"wrap/{name}", text.replace("NAME", name))
        return "/wrap:/bin"

    def without(self, utility: str) -> str:
        """A search path that lacks one utility."""
        folder = self.root / f"home/without-{utility}"
        folder.mkdir()
        for name in (*UTILITIES, "orvane"):
            if name != utility:
                (folder / name).symlink_to(f"/bin/{name}")
        return f"/home/without-{utility}"

    def _enter(self, given: Circumstances) -> Callable[[], None]:
        def enter() -> None:
            (self.root / "pid").write_text(f"{os.getpid()}\n")
            _become_root_of_a_namespace()
            if given.room is not None:
                _called(_libc.unshare(CLONE_NEWNS))
                _mount(None, b"/", MS_REC | MS_PRIVATE, None)
                folder, size = given.room
                _mount(b"tmpfs", os.fsencode(self.root / folder), 0, f"size={size}".encode())
            os.chroot(self.root)
            os.chdir("/home")
            os.umask(given.mask)
            if given.is_ordinary:
                os.setgroups([])
                os.setgid(NOBODY)
                os.setuid(NOBODY)
            # A shell cannot trap a signal that is ignored from the start, as in a background job.
            for number in (signal.SIGHUP, signal.SIGINT, signal.SIGQUIT, signal.SIGPIPE):
                signal.signal(number, signal.SIG_DFL)
            if given.largest_file is not None:
                # Python ignores the limit's signal, and so do the programs that it starts.
                resource.setrlimit(resource.RLIMIT_FSIZE, (given.largest_file,) * 2)
        return enter

    def run(self, *words: str, **given: object) -> Done:
        """Runs the script. Raises subprocess.SubprocessError if the root can't be entered so."""
        circumstances = Circumstances(**given)  # type: ignore[arg-type]
        environment = {"PATH": circumstances.path, **circumstances.environment}
        done = subprocess.run([*SHELLS[circumstances.shell], "/bin/orvane-field", *words],
                              stdin=subprocess.DEVNULL, stdout=circumstances.output,
                              stderr=subprocess.PIPE, env=environment,
                              preexec_fn=self._enter(circumstances), restore_signals=False,
                              timeout=TIME_LIMIT, check=False)
        return Done(done.returncode, (done.stdout or b"").decode(errors="replace"),
                    done.stderr.decode(errors="replace"))


# Counts the calls of all utilities that it wraps. At one of them it sends a signal to the script, like kill,
# or to the utility as well, like a terminal.
SIGNALLER = """
count=0
[ ! -f /home/count ] || read -r count </home/count
count=$((count + 1))
echo $count >/home/count
if [ $count = "$AT" ]; then
    read -r pid </pid
    kill -s "$SIGNAL" $pid
    [ "$REACHES" = script ] || kill -s "$SIGNAL" $$
fi
exec /bin/NAME "$@"
"""
