"""What the program has to reach. A figure that misses its floor fails the bench; one that misses
only its goal is marked, and one whose rounds lie on both sides of the goal too."""

import statistics
from dataclasses import dataclass
from typing import Optional

from timed_runs import median_ratio, ratios


@dataclass
class Goal:
    key: str
    what: str
    unit: str                # behind the figure: '' for a ratio, 'times', 'bytes', ...
    floor: Optional[float]   # None: nothing to fail by
    goal: Optional[float]    # None: of what it is held against the program has no part
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
    _at_most('pack-best-text', '`pack --best` against plain greedy, text', '', 0.935, 0.93),
    _at_most('pack-default', '`pack` against plain greedy, mean of both corpora', '',
             0.965, 0.955),
    _at_most('pack-random', '`pack` of bytes that can\'t be compressed, against the bytes', '',
             1.126, 1.1255),
    _at_least('pack-speed', '`pack`, speed of one core', 'MB/s', None, 15),
    _at_least('pack-best-speed', '`pack --best`, speed of one core', 'MB/s', None, 3),
    _at_most('install-native', 'Silent install natively against `bsdtar -x` of a `.tar.Z`', '',
             0.7, None),
    _at_most('install-wine', 'Silent install under Wine against {peer}', '', 1.0, 0.75),
    _at_most('install-wine-small', 'Silent install of 3 small files under Wine against NSIS', '',
             1.0, 0.85),
    _at_most('install-wine-many', 'Silent install of 1000 small files under Wine against NSIS', '',
             1.1, 1),
    _at_most('removal-wine-many', 'Silent removal of 1000 small files under Wine against NSIS', '',
             1.1, 1),
    _at_most('check-wine-many', 'Dialog under Wine that checks 1000 files, against their install',
             '', 1.3, 1),
    _at_most('dialog-start', 'Start of the dialog under Wine against an empty dialog', 'times',
             1.2, 1.1),
    _at_most('removal-start', 'Start of the removal program under Wine against an empty program',
             'times', 1.2, 1.05),
    _at_most('wine-memory', 'Peak memory of the install under Wine over an empty program', 'MB',
             1.5, 1),
    _at_most('time-per-file', 'Time per file of 1000 small files against `cp`', 'times', 4, None),
    _at_most('growth', 'Time per MB at {large} MB against 4 MB', 'times', 1.2, 1.05),
    _at_most('verify-memory', 'Peak memory of `verify` for {large} MB over that for 1 MB', 'MB',
             4, 1),
    _at_most('region', 'Executable region with all resources', 'bytes', 172_032, 155_000),
    _at_most('code', 'Executable region without resources', 'bytes', 81_000, 65_000),
]


@dataclass
class Figure:
    """What was measured for a goal: a number, or why there is none."""
    value: Optional[float] = None
    section: str = ''        # of the page: title of the table that it stands in
    why_not: str = ''
    words: Optional[dict] = None     # for the places of Goal.what
    spread: Optional[tuple] = None   # of a timed one: the bounds of the middle half of the rounds
    corpora: tuple = ()              # that it was measured with


def ratio_figure(over, under, section, **more):
    """Of the rounds of two programs."""
    return Figure(median_ratio(over, under), section, spread=middle_half(ratios(over, under)),
                  **more)


def middle_half(values):
    """The lower and the upper quartile; None of so few that there is no middle."""
    if len(values) < 3:
        return None
    lower, _, upper = statistics.quantiles(values, n=4, method='inclusive')
    return lower, upper


def verdict(goal, figure):
    if figure.value is None:
        return 'not measured'
    words = _verdict(goal, figure)
    strange = [corpus.name for corpus in figure.corpora if not corpus.is_known()]
    return f'{words}, with other {" and ".join(strange)}' if strange else words


def _verdict(goal, figure):
    if _misses(goal, figure.value, goal.floor):
        return 'floor missed'
    if goal.goal is None:
        return 'floor kept'
    if figure.spread and figure.spread[0] <= goal.goal <= figure.spread[1]:
        return 'within noise of the goal'
    return 'goal missed' if _misses(goal, figure.value, goal.goal) else 'reached'


def _misses(goal, value, limit):
    if limit is None:
        return False
    return value < limit if goal.more_is_better else value > limit
