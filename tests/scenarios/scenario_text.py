"""Reads scenario files (README.md has the format)."""

import re
from dataclasses import dataclass, field

# What a section may be. A world's line comes first; "given" sections and "damage" prepare the
# machine; actions start something; checks say what the action before them has to have done.
WORLDS = ('only stand-in', 'only Wine')
PREPARATIONS = ('given machine', 'given files', 'given registry', 'given image', 'given run',
                'given user', 'damage')
ACTIONS = ('run', 'restart')
CHECKS = ('exit', 'shown', 'log', 'text', 'files', 'registry')
VERBATIM = ('shown', 'log', 'text')

_KEYWORD = re.compile(f'({"|".join(WORLDS + PREPARATIONS + ACTIONS + CHECKS)})(?:: |:?$| )(.*)')


class ScenarioError(Exception):
    """A scenario that is wrong in itself, in one line with file and line number."""


@dataclass
class Section:
    keyword: str
    argument: str            # the rest of its first line
    place: str               # FILE:LINE, for messages
    body: list = field(default_factory=list)
    checks: list = field(default_factory=list)   # of an action


@dataclass
class Scenario:
    name: str
    title: str               # first comment line
    only: str                # '' or the one world, 'stand-in' or 'Wine'
    reason: str              # why only there
    sections: list


def parse(name, text, file_name):
    """Raises ScenarioError, which names the line."""
    sections, title = [], ''
    for number, line in enumerate(text.splitlines(), 1):
        place = f'{file_name}:{number}'
        if line.startswith('#'):
            title = title or line[1:].strip()
        elif line.startswith('  ') and sections:
            if not line.startswith('  #'):
                section.body.append(_body_line(section, line[2:]))
        elif line.strip():
            match = _KEYWORD.match(line)
            if not match:
                raise ScenarioError(f'{place}: no such section: {line}')
            section = Section(match[1], match[2].strip(), place)
            if section.keyword not in CHECKS:
                sections.append(section)
            elif sections and sections[-1].keyword in ACTIONS:
                sections[-1].checks.append(section)
            else:
                raise ScenarioError(f'{place}: a check stands behind what it checks')
    return _scenario(name, title, sections, file_name)


def _body_line(section, line):
    """In a text, '|TEXT|' is TEXT, so that blanks at its end are seen; 'heading' is a log's heading."""
    if section.keyword in VERBATIM and line != 'heading' and not re.fullmatch(r'\|.*\|', line):
        raise ScenarioError(f'{section.place}: a line of text stands between bars: {line}')
    return line


def _scenario(name, title, sections, file_name):
    only = reason = ''
    if sections and sections[0].keyword in WORLDS:
        only, reason = sections[0].keyword[len('only '):], sections[0].argument
        sections = sections[1:]
        if not reason:
            raise ScenarioError(f'{file_name}: only one world, but no reason')
    for section in sections:
        if section.keyword in WORLDS:
            raise ScenarioError(f'{section.place}: the world stands in the first section')
        if section.keyword == 'given machine' and only != 'stand-in':
            raise ScenarioError(f'{section.place}: only the stand-in has settings')
    if not any(section.keyword in ACTIONS for section in sections):
        raise ScenarioError(f'{file_name}: nothing is run')
    return Scenario(name, title, only, reason, sections)
