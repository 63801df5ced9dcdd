"""The dialog's pages by name, as pages.txt has them, in each language.

A text between < and > is the catalog's: behind the language's tag but in French. Behind a bar in it
stands the English set's own text, behind a second one that of the three other sets. "selected #" is the
language's place in the list.
"""

import re
from pathlib import Path

from good_runs import LANGUAGES

# "- ID" takes the line of a control away; a line stands in place of that of the same control, or of the
# one in front of an arrow.
_CHANGE = re.compile(r'(?:(?:- )?(\d+)(?: -> )?)?(\|(dialog|\d+) .*\|)?')


def without_words(lines):
    """Shown lines, with those of a page in place of its name and its changes, which are indented."""
    whole, start = [], 0
    for line in lines:
        if line.startswith('  '):
            whole[start:] = _changed(whole[start:], line[2:])
        else:
            start = len(whole) if line.startswith('page ') else len(whole) + 1
            whole += page(line) if line.startswith('page ') else [line]
    return whole


def with_words(text):
    """Shown lines, with the name in place of a page."""
    for words in [f'page {name}{place}' for name in PAGES
                  for place in ('', *(f' in {language}' for language in LANGUAGES))]:
        text = text.replace('\n'.join(page(words)), words)
    return text


def page(words):
    """The lines of "page NAME [in LANGUAGE]"."""
    name, _, language = words.removeprefix('page ').partition(' in ')
    language = language or 'French'
    if name not in PAGES or language not in LANGUAGES:
        raise ValueError(f'no such {words}')
    place = LANGUAGES[language].offset // 10000
    lines = [line.replace('selected #', f'selected {place}') for line in PAGES[name]]
    return [re.sub('<(.*?)>', lambda text: _in_language(text[1], language), line) for line in lines]


def _in_language(text, language):
    french, *other = text.split('|')
    if language == 'English' and other:
        return other[0]
    return LANGUAGES[language].tag + (other[1] if other[1:] and language != 'French' else french)


def _changed(lines, change):
    named, new, own = _CHANGE.fullmatch(change).groups()
    places = [place for place, line in enumerate(lines) if line.startswith(f'|{named or own} ')]
    if len(places) != 1:
        raise ValueError(f'{len(places)} lines of the page for this one: {change}')
    return [*lines[:places[0]], *([new] if new else []), *lines[places[0] + 1:]]


def _read():
    text = Path(__file__).with_name('pages.txt').read_text(encoding='utf-8')
    pages = {}
    for name, base, body in re.findall(r'^page (.*?)(?:: (.*))?\n((?:  .*\n)+)', text, re.M):
        lines = [line[2:] for line in body.splitlines()]
        pages[name] = pages[base] if base else lines
        for change in lines if base else ():
            pages[name] = _changed(pages[name], change)
    return pages


PAGES = _read()
