"""Reads scenario files (tests/scenarios/README.md has the format)."""

import re
from collections import namedtuple

import pytest

# What a section may be: "given" sections and "damage" prepare the machine; actions start something;
# checks say what the action before them has to have done.
PREPARATIONS = ('given machine', 'given files', 'given registry', 'given image', 'given run',
                'given user', 'damage')
ACTIONS = ('run', 'restart')
# A word stands for several checks (good_runs.py).
WORDS = ('installed', 'registered', 'removed', 'unregistered')
CHECKS = ('exit', 'shown', 'log', 'text', 'files', 'registry', *WORDS)
VERBATIM = ('shown', 'log', 'text')
DEFAULT_IMAGE = r'C:\Setup.exe'
LOG = r'C:\windows\MorivLog.txt'

_KEYWORD = re.compile(f'({"|".join(PREPARATIONS + ACTIONS + CHECKS)})(?:$| |(?=,))(.*)')
_ONLY = re.compile('only (stand-in|Wine|wow64): (.+)')


class ScenarioError(pytest.Collector.CollectError):
    """A scenario that is wrong in itself, in one line with file and line number."""


class Section(namedtuple('Section', 'keyword argument place body checks')):
    """The argument is the rest of its first line, the place FILE:LINE; an action has checks."""

    @property
    def subject(self):
        """What a check is of."""
        if self.keyword == 'text':
            return 'log' if self.argument == LOG else f'text {self.argument}'
        return self.keyword


# title: its first comment line; only: its one kind of world, or ''; reason: why only there.
Scenario = namedtuple('Scenario', 'name title only reason sections')


def parse(name, text, file_name):
    """The scenario of a file, or one for each row of its table. Raises ScenarioError, which names
    the line."""
    lines = [(f'{file_name}:{number}', line) for number, line in enumerate(text.splitlines(), 1)
             if line.strip() and not line.lstrip().startswith('#')]
    title = next((line[1:].strip() for line in text.splitlines() if line.startswith('#')), '')
    rows, lines = _take_table(lines)
    scenarios = {}
    for row in rows:
        label = re.sub('[^A-Za-z0-9]+', '-', next(iter(row.values()), '')).strip('-')
        row_name = f'{name}[{label}]' if row else name
        if row_name in scenarios:
            raise ScenarioError(f'{file_name}: two rows {row_name}')
        scenarios[row_name] = _scenario(row_name, title, _fill(lines, row), file_name)
    return list(scenarios.values())


def _take_table(lines):
    """The rows of the table, each a dictionary by the names of its heading, and the other lines. Without
    a table one row without cells."""
    texts = [line for _, line in lines]
    if 'each' not in texts:
        return [{}], lines
    begin = end = texts.index('each') + 1
    while end < len(lines) and texts[end].startswith('  '):
        end += 1
    heading, *table = [[cell.strip() for cell in re.split(r'\s\|(?=\s)', line + ' ')]
                       for line in texts[begin:end]]
    for (place, _), cells in zip(lines[begin + 1:], table):
        if len(cells) != len(heading):
            raise ScenarioError(f'{place}: {len(cells)} cells in a table of {len(heading)}')
    return [dict(zip(heading, cells)) for cells in table], lines[:begin - 1] + lines[end:]


def _fill(lines, row):
    """The lines with the row's cells in place of their {names}; one of an empty cell alone is gone."""
    filled = []
    for place, line in lines:
        try:
            line = re.sub(r'\{([\w ]+)\}', lambda name: row[name[1]], line) if row else line
        except KeyError as error:
            raise ScenarioError(f'{place}: no such name in the table: {error}') from error
        filled += [(place, line)] if line.strip() else []
    return filled


def _scenario(name, title, lines, file_name):
    only = _ONLY.fullmatch(lines[0][1])
    sections = []
    for place, line in lines[1:] if only else lines:
        if line.startswith('  ') and sections:
            _add_line((sections[-1].checks or sections)[-1], line[2:], place)
        else:
            _add_section(sections, line, place)
    if not any(section.keyword in ACTIONS for section in sections):
        raise ScenarioError(f'{file_name}: nothing is run')
    return Scenario(name, title, *(only.groups() if only else ('', '')), sections)


def _add_section(sections, line, place):
    match = _KEYWORD.match(line)
    if not match:
        raise ScenarioError(f'{place}: no such section: {line}')
    section = Section(match[1], match[2].strip(), place, [], [])
    if section.keyword not in CHECKS:
        sections.append(section)
    elif not sections or sections[-1].keyword not in ACTIONS:
        raise ScenarioError(f'{place}: a check stands behind what it checks')
    elif section.subject in [check.subject for check in sections[-1].checks]:
        raise ScenarioError(f'{place}: two checks of the same thing')
    else:
        sections[-1].checks.append(section)


def _add_line(section, line, place):
    """A line of a text stands between bars, so that blanks at its end are seen, unless it is a word."""
    if section.keyword in VERBATIM and not re.fullmatch(
            r' *\|.*\||heading|fatal .+|page .+|  - \d+', line):
        raise ScenarioError(f'{place}: a line of text stands between bars: {line}')
    section.body.append(line)
