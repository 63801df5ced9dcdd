"""Reads scenario files (tests/scenarios/README.md has the format)."""

import re
from dataclasses import dataclass, field

# What a section may be. A world's line comes first; "given" sections and "damage" prepare the
# machine; actions start something; checks say what the action before them has to have done.
WORLDS = ('only stand-in', 'only Wine')
PREPARATIONS = ('given machine', 'given files', 'given registry', 'given image', 'given run',
                'given user', 'damage')
ACTIONS = ('run', 'restart')
# A word stands for several checks (good_runs.py).
WORDS = ('installed', 'registered', 'removed', 'unregistered')
CHECKS = ('exit', 'shown', 'log', 'text', 'files', 'registry', *WORDS)
VERBATIM = ('shown', 'log', 'text')
DEFAULT_IMAGE = r'C:\Setup.exe'
LOG = r'C:\windows\MorivLog.txt'

_KEYWORD = re.compile(f'({"|".join(WORLDS + PREPARATIONS + ACTIONS + CHECKS)})(?:: |:?$| |(?=,))(.*)')


class ScenarioError(Exception):
    """A scenario that is wrong in itself, in one line with file and line number."""


@dataclass
class Section:
    keyword: str
    argument: str            # the rest of its first line
    place: str               # FILE:LINE, for messages
    body: list = field(default_factory=list)
    checks: list = field(default_factory=list)   # of an action

    @property
    def subject(self):
        """What a check is of."""
        if self.keyword == 'text':
            return 'log' if self.argument == LOG else f'text {self.argument}'
        return self.keyword


@dataclass
class Scenario:
    name: str
    title: str               # first comment line
    only: str                # '' or the one world, 'stand-in' or 'Wine'
    reason: str              # why only there
    sections: list


def parse(name, text, file_name):
    """The scenario of a file, or one for each row of its table. Raises ScenarioError, which names
    the line."""
    lines = [(f'{file_name}:{number}', line) for number, line in enumerate(text.splitlines(), 1)
             if line.strip() and not line.lstrip().startswith('#')]
    title = next((line[1:].strip() for line in text.splitlines() if line.startswith('#')), '')
    rows, lines = _take_table(lines)
    if rows is None:
        return [_scenario(name, title, lines, file_name)]
    scenarios = {}
    for row in rows:
        row_name = f'{name}[{re.sub("[^A-Za-z0-9]+", "-", next(iter(row.values()))).strip("-")}]'
        if row_name in scenarios:
            raise ScenarioError(f'{file_name}: two rows {row_name}')
        filled = [(place, _fill(line, row, place)) for place, line in lines]
        scenarios[row_name] = _scenario(row_name, title, filled, file_name)
    return list(scenarios.values())


def _take_table(lines):
    """The rows of the table, each a dictionary by the names of its heading, and the other lines."""
    begin = next((index for index, (_, line) in enumerate(lines) if line == 'each'), None)
    if begin is None:
        return None, lines
    end = begin + 1
    while end < len(lines) and lines[end][1].startswith('  '):
        end += 1
    table = [(place, [cell.strip() for cell in re.split(r'\s\|(?=\s)', line + ' ')])
             for place, line in lines[begin + 1:end]]
    for place, cells in table:
        if len(cells) != len(table[0][1]):
            raise ScenarioError(f'{place}: {len(cells)} cells in a table of {len(table[0][1])}')
    return [dict(zip(table[0][1], cells)) for _, cells in table[1:]], lines[:begin] + lines[end:]


def _fill(line, row, place):
    """The line with the row's cells in place of their {names}."""
    try:
        return re.sub(r'\{([\w ]+)\}', lambda name: row[name[1]], line)
    except KeyError as error:
        raise ScenarioError(f'{place}: no such name in the table: {error}') from error


def _scenario(name, title, lines, file_name):
    sections = []
    for place, line in lines:
        if not line.strip():
            continue  # an empty cell was all that it had
        if line.startswith('  ') and sections:
            _add_line((sections[-1].checks or sections)[-1], line[2:], place)
        else:
            _add_section(sections, line, place)
    if not any(section.keyword in ACTIONS for section in sections):
        raise ScenarioError(f'{file_name}: nothing is run')
    world = sections.pop(0) if sections[0].keyword in WORLDS else Section('', '', '')
    only = world.keyword.removeprefix('only ')
    if only and not world.argument:
        raise ScenarioError(f'{file_name}: only one world, but no reason')
    for section in sections:
        if section.keyword in WORLDS:
            raise ScenarioError(f'{section.place}: the world stands in the first section')
        if section.keyword == 'given machine' and only != 'stand-in':
            raise ScenarioError(f'{section.place}: only the stand-in has settings')
    return Scenario(name, title, only, world.argument, sections)


def _add_section(sections, line, place):
    match = _KEYWORD.match(line)
    if not match:
        raise ScenarioError(f'{place}: no such section: {line}')
    section = Section(match[1], match[2].strip(), place)
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
