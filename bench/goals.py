"""What the program has to reach. A figure that misses its floor fails the bench; one that misses
only its goal is marked."""

from dataclasses import dataclass
from typing import Optional


@dataclass
class Goal:
    key: str
    what: str
    unit: str                # behind the figure: '' for a ratio, 'times', 'bytes', ...
    floor: Optional[float]   # None: nothing to fail by
    goal: float
    more_is_better: bool


def _at_least(key, what, unit, floor, goal):
    return Goal(key, what, unit, floor, goal, True)


def _at_most(key, what, unit, floor, goal):
    return Goal(key, what, unit, floor, goal, False)


GOALS = [
    _at_least('expand-libarchive-libraries',
              "Expansion against libarchive's `.Z` reader, libraries", 'times', 3, 5),
    _at_least('expand-libarchive-text',
              "Expansion against libarchive's `.Z` reader, text", 'times', 3, 5),
    _at_least('expand-zlib-libraries',
              'Expansion against zlib inflate with 64 KB buffers, libraries', 'times', 1.3, 2),
    _at_least('expand-zlib-text',
              'Expansion against zlib inflate with 64 KB buffers, text', 'times', 1.3, 2),
    _at_least('expand-wine-libraries',
              'Expansion under Wine against the plain decoder, libraries', 'times', 2, 3.7),
    _at_least('expand-wine-text',
              'Expansion under Wine against the plain decoder, text', 'times', 2, 3.7),
    _at_most('instructions', 'Instructions for one file against the plain decoder', '',
             0.55, 0.38),
    _at_most('expander-memory', 'Memory of one expander', 'bytes', 640_000, 600_000),
    _at_most('pack-best-libraries', '`pack --best` against plain greedy, libraries', '',
             0.94, 0.93),
    _at_most('pack-best-text', '`pack --best` against plain greedy, text', '', 0.925, 0.915),
    _at_most('pack-default', '`pack` against plain greedy, mean of both corpora', '',
             0.965, 0.955),
    _at_most('pack-random', '`pack` of bytes that can\'t be compressed, against the bytes', '',
             1.126, 1.1255),
    _at_least('pack-speed', '`pack`, speed of one core', 'MB/s', None, 15),
    _at_least('pack-best-speed', '`pack --best`, speed of one core', 'MB/s', None, 3),
    _at_most('install-native', 'Silent install natively against `bsdtar -x` of a `.tar.Z`', '',
             0.7, 0.4),
    _at_most('install-wine', 'Silent install under Wine against {peer}', '', 1.0, 0.75),
    _at_most('install-wine-small', 'Silent install of 3 small files under Wine against NSIS', '',
             1.0, 0.85),
    _at_most('wine-memory', 'Peak memory of the install under Wine over an empty program', 'MB',
             1.5, 1),
    _at_most('time-per-file', 'Time per file of 1000 small files against `cp`', 'times', 4, 2),
    _at_most('growth', 'Time per MB at {large} MB against 4 MB', 'times', 1.2, 1.05),
    _at_most('region', 'Executable region with all resources', 'bytes', 172_032, 155_000),
    _at_most('code', 'Executable region without resources', 'bytes', 81_000, 65_000),
]


@dataclass
class Figure:
    """What was measured for a goal: a number, or why there is none."""
    value: Optional[float] = None
    section: str = ''        # of the page: title of the table that it stands in
    why_not: str = ''
    words: Optional[dict] = None  # for the places of Goal.what


def verdict(goal, figure):
    if figure.value is None:
        return 'not measured'
    if _misses(goal, figure.value, goal.floor):
        return 'floor missed'
    return 'goal missed' if _misses(goal, figure.value, goal.goal) else 'reached'


def _misses(goal, value, limit):
    if limit is None:
        return False
    return value < limit if goal.more_is_better else value > limit
