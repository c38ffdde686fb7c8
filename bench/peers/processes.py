# SPDX-FileCopyrightText: The mediidx developers
# SPDX-License-Identifier: MIT
"""What programs cost, with everything that they start: seconds, processor time and memory."""

import ctypes
import dataclasses
import os
import pathlib
import resource
import subprocess
import threading
import time

PROC = pathlib.Path("/proc")
TICKS = os.sysconf("SC_CLK_TCK")
PR_SET_CHILD_SUBREAPER = 36


@dataclasses.dataclass
class Cost:
    seconds: float
    cpu: float  # Of every process involved.
    others: float  # Processor seconds that other programs took meanwhile.


@dataclasses.dataclass
class Memory:
    """Peaks of the sum of proportional set sizes, in bytes."""

    everything: int = 0
    without_server: int = 0  # Without the PostgreSQL processes.


def become_subreaper():
    """A server whose starter has ended is ours then: seen below, and counted when it ends."""
    if ctypes.CDLL(None, use_errno=True).prctl(PR_SET_CHILD_SUBREAPER, 1, 0, 0, 0) != 0:
        raise OSError(ctypes.get_errno(), "prctl")


def stat_fields(pid):
    """The fields of /proc/PID/stat behind the name; None when the process is gone."""
    try:
        return (PROC / str(pid) / "stat").read_text(errors="replace").rpartition(")")[2].split()
    except (FileNotFoundError, ProcessLookupError):
        return None


def children(pid):
    """Empty for one that is gone."""
    found = []
    try:
        for task in (PROC / str(pid) / "task").iterdir():
            found += map(int, (task / "children").read_text().split())
    except (FileNotFoundError, ProcessLookupError):
        pass
    return found


def descendants(root):
    """The processes below `root`, and it."""
    found = [root]
    for pid in found:
        found += children(pid)
    return found


def cpu_of_tree(root):
    """Seconds of the living processes, and of those that they have waited for."""
    ticks = 0
    for pid in descendants(root):
        fields = stat_fields(pid)
        if fields:
            ticks += sum(int(field) for field in fields[11:15])
    return ticks / TICKS


def busy_seconds():
    """Of all processors, since the machine started; time that a host took away included."""
    user, nice, system, _, _, irq, softirq, steal = map(
        int, (PROC / "stat").read_text().split("\n", 1)[0].split()[1:9])
    return (user + nice + system + irq + softirq + steal) / TICKS


class Watch:
    """From here to cost(): what a piece of work costs; `cpu` tells the seconds of its processes."""

    def __init__(self, cpu):
        self.cpu = cpu
        self.busy_before = busy_seconds()
        self.own_before = time.process_time()
        self.cpu_before = cpu()
        self.begin = time.perf_counter()

    def cost(self):
        seconds = time.perf_counter() - self.begin
        cpu = self.cpu() - self.cpu_before
        own = time.process_time() - self.own_before
        return Cost(seconds, cpu, busy_seconds() - self.busy_before - cpu - own)


def cpu_of_ended():
    usage = resource.getrusage(resource.RUSAGE_CHILDREN)
    return usage.ru_utime + usage.ru_stime


def run(words, **options):
    """Runs a program to its end, and waits for what it left behind. Its output, and its cost."""
    watch = Watch(cpu_of_ended)
    done = subprocess.run([str(word) for word in words], check=False, text=True,
                          stdout=subprocess.PIPE, stderr=subprocess.PIPE,
                          **({"stdin": subprocess.DEVNULL} | options))
    wait_for_orphans()
    cost = watch.cost()
    if done.returncode != 0:
        raise RuntimeError(f"{' '.join(map(str, words))}: {done.stderr or done.stdout}")
    return done.stdout, cost


def wait_for_orphans():
    """Nothing else may have been started that still runs."""
    try:
        while True:
            os.waitpid(-1, 0)
    except ChildProcessError:
        pass


def memory_of(pid):
    """Bytes that it has to itself, and its part of those that it shares."""
    for line in (PROC / str(pid) / "smaps_rollup").read_text().splitlines():
        if line.startswith("Pss:"):
            return int(line.split()[1]) * 1024
    return 0


class MemoryWatch(threading.Thread):
    """Samples everything that this process has started, from __enter__ to __exit__."""

    INTERVAL = 0.02

    def __init__(self):
        super().__init__(daemon=True)
        self.peak = Memory()
        self.failure = None
        self.done = threading.Event()

    def run(self):
        try:
            while not self.done.wait(self.INTERVAL):
                self.sample()
            self.sample()
        except OSError as error:
            self.failure = error

    def sample(self):
        everything = without_server = 0
        for pid in descendants(os.getpid())[1:]:
            try:
                name = (PROC / str(pid) / "comm").read_text().strip()
                size = memory_of(pid)
            except (FileNotFoundError, ProcessLookupError):
                continue  # It has ended.
            everything += size
            without_server += 0 if name == "postgres" else size
        self.peak.everything = max(self.peak.everything, everything)
        self.peak.without_server = max(self.peak.without_server, without_server)

    def __enter__(self):
        self.start()
        return self

    def __exit__(self, *_):
        self.done.set()
        self.join()
        if self.failure:
            raise self.failure
