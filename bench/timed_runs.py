"""Programs run in turn on one CPU, and what each run took."""

import os
import shlex
import shutil
import statistics
import subprocess
import time
from contextlib import contextmanager
from dataclasses import dataclass, field, replace
from pathlib import Path
from tempfile import NamedTemporaryFile
from typing import Optional


class BenchError(Exception):
    pass


@dataclass
class Run:
    """A command, and what it must find and leave."""
    command: list
    makes: Optional[Path] = None   # a folder, taken away before each run
    folder: Optional[Path] = None  # a folder, made anew before each run
    environment: dict = field(default_factory=dict)
    success: int = 0              # exit status
    tells_seconds: bool = False   # what it prints is the time that counts

    def text(self):
        settings = [f'{name}={shlex.quote(str(value))}' for name, value in self.environment.items()]
        return ' '.join([*settings, text_of(self.command)])


@dataclass
class Sample:
    seconds: float
    cpu: float  # seconds, user and system


@contextmanager
def pinned():
    """All that is started meanwhile shares the last CPU, servers too."""
    cpus = os.sched_getaffinity(0)
    os.sched_setaffinity(0, {max(cpus)})
    try:
        yield
    finally:
        os.sched_setaffinity(0, cpus)


def discard_output(run):
    for stale in (run.makes, run.folder):
        if stale:
            shutil.rmtree(stale, ignore_errors=True)


def run_once(run):
    discard_output(run)
    if run.folder:
        run.folder.mkdir(parents=True)
    start = time.perf_counter()
    process = subprocess.Popen([str(word) for word in run.command], stdin=subprocess.DEVNULL,
                               stdout=subprocess.PIPE if run.tells_seconds else subprocess.DEVNULL,
                               stderr=subprocess.DEVNULL,
                               env=os.environ | {k: str(v) for k, v in run.environment.items()})
    told = process.stdout.read() if run.tells_seconds else b''
    _, status, usage = os.wait4(process.pid, 0)
    seconds = time.perf_counter() - start
    process.returncode = os.waitstatus_to_exitcode(status)
    if process.returncode != run.success:
        raise BenchError(f'exit status {process.returncode}: {run.text()}')
    return Sample(float(told) if run.tells_seconds else seconds,
                  usage.ru_utime + usage.ru_stime)


def run_in_turn(runs, rounds):
    """Samples of each run, by its name, after a round that warms the caches."""
    samples = {name: [] for name in runs}
    for number in range(rounds + 1):
        for name, run in runs.items():
            sample = run_once(run)
            if number > 0:
                samples[name].append(sample)
    return samples


def time_in_turn(runs, rounds):
    """Seconds of each round, by name."""
    return {name: [sample.seconds for sample in group]
            for name, group in run_in_turn(runs, rounds).items()}


def medians(groups):
    return {name: statistics.median(group) for name, group in groups.items()}


def ratios(over, under):
    """Round by round: what slows the host slows both."""
    return [one / other for one, other in zip(over, under)]


def median_ratio(over, under):
    return statistics.median(ratios(over, under))


def run_with_peak(run):
    """The sample and the peak memory in bytes. That is asked of time(1): a child of this program
    would be charged with its memory too."""
    with NamedTemporaryFile('r') as answer:
        sample = run_once(replace(run, command=['/usr/bin/time', '-q', '-f', '%M', '-o',
                                                answer.name, *run.command]))
        return sample, int(answer.read()) * 1024


def text_of(command):
    return shlex.join(str(word) for word in command)


def output_of(command, error_output=False):
    done = subprocess.run([str(word) for word in command], capture_output=True, text=True)
    if done.returncode != 0:
        raise BenchError(f'exit status {done.returncode}: {text_of(command)}\n{done.stderr}')
    return done.stderr if error_output else done.stdout
