"""The dialog's pages by name, as pages.txt has them, in each language.

A text between < and > is the catalog's: behind the language's tag but in French. Behind a bar in it
stands the English set's own text, behind a second one that of the three other sets. "selected #" is the
language's place in the list.
"""

import re
from pathlib import Path

from good_runs import LANGUAGES

_CONTROL = re.compile(r' *[|-] ?(dialog|\d+)\b')
_TEXT = re.compile(r'<([^<>|]*)(?:\|([^<>|]*))?(?:\|([^<>|]*))?>')


def page(words, changes=()):
    """The lines of a page: NAME [in LANGUAGE]. Each change stands in place of the line of the same
    control; "- ID" takes one away."""
    name, _, language = words.partition(' in ')
    language = language or 'French'
    if name not in PAGES or language not in LANGUAGES:
        raise ValueError(f'no such page: {words}')
    return _changed([_in_language(line, language) for line in PAGES[name]], changes)


def without_words(lines):
    """Shown lines, with those of a page in place of its name and its changes, which are indented."""
    whole, changes = [], []
    for line in reversed(lines):
        if line.startswith('  '):
            changes.insert(0, line[2:])
        elif line.startswith('page '):
            whole[:0], changes = page(line.removeprefix('page '), changes), []
        elif changes:
            raise ValueError(f'no page is changed: {line}')
        else:
            whole.insert(0, line)
    return whole


def with_words(lines):
    """Shown lines, with what "show" has printed said in the shortest way."""
    said, block = [], []
    for line in [*lines, '']:
        if block and re.match(r'\|\d+ (Static|Edit|Button|ComboBox) ', line) and len(block) < 16:
            block.append(line)
            continue
        said += _shortest(block) if len(block) > 1 else block
        block = [line] if line.startswith('|dialog ') else []
        said += [line] if line and not block else []
    return said


def _shortest(lines):
    ways = [[f'page {words}', *changes] for name in PAGES for language in LANGUAGES
            for words in [name if language == 'French' else f'{name} in {language}']
            if (changes := _changes(page(words), lines)) is not None]
    return min([*ways, lines], key=len)


def _id(line):
    return _CONTROL.match(line)[1]


def _changed(lines, changes):
    lines = list(lines)
    for change in changes:
        places = [place for place, line in enumerate(lines) if _id(line) == _id(change)]
        if len(places) != 1:
            raise ValueError(f'{len(places)} lines of the page for this one: {change}')
        lines[places[0]:places[0] + 1] = [] if change.startswith('-') else [change]
    return lines


def _changes(known, lines):
    """What has to be changed of a page to get these lines; None when it can't be said so."""
    ids = [_id(line) for line in lines]
    kept = [line for line in known if _id(line) in ids]
    if [_id(line) for line in kept] != ids:
        return None
    return [*(f'  - {_id(line)}' for line in known if line not in kept),
            *(f'  {new}' for old, new in zip(kept, lines) if old != new)]


def _in_language(line, language):
    def text(match):
        french, english, others = match.groups()
        if language == 'English' and english is not None:
            return english
        return LANGUAGES[language].tag + (french if language == 'French' else others or french)

    place = str(LANGUAGES[language].offset // 10000)
    return _TEXT.sub(text, line).replace('selected #', f'selected {place}')


def _read():
    text = (Path(__file__).parent / 'pages.txt').read_text(encoding='utf-8')
    pages = {}
    for block in re.findall(r'^page (.*)\n((?:  .*\n)+)', text, re.M):
        (name, _, base), lines = block[0].partition(': '), [line[2:] for line in block[1].splitlines()]
        pages[name] = _changed(pages[base], lines) if base else lines
    return pages


PAGES = _read()
