"""The words for what a good run leaves: the checks that they stand for, worked out from what stood on
the machine before the run and from the image that ran.

    installed [DIRECTORY] [in LANGUAGE][, listed][, older]
    removed [DIRECTORY][, listed]

are log, files and registry of an image whose files go below %INSTALL_DIR%. "listed" is the uninstall
entry, "older" the event of an update that has found a missing file. "registered" and "unregistered" are
the ends of the two: the last events, which follow the scenario's own, the removal program or the INF
file, which stands beside the scenario's own files, and the registry.
"""

import copy
import re
from collections import namedtuple

import registry_text

# The registry's word, the catalog's offset and the tag of its texts.
Language = namedtuple('Language', 'word offset tag')
LANGUAGES = {'English': Language('GB', 0, '_ENG_ '), 'French': Language('FR', 10000, ''),
             'German': Language('DE', 20000, '_GER_ '), 'Italian': Language('IT', 30000, '_ITA_ '),
             'Spanish': Language('ES', 40000, '_SPA_ ')}

DIRECTORY = r'C:\Program Files\Moriv'
REMOVAL_PROGRAM = r'C:\windows\MorivRmv.exe'
INF = r'C:\windows\Moriv.INF'
PRODUCT = r'SOFTWARE\Zeb\Moriv'
CURRENT_VERSION = r'SOFTWARE\Microsoft\Windows\CurrentVersion'
ENTRY = CURRENT_VERSION + r'\Uninstall\Moriv'
CLEAN_UP = (r'"MorivCommand"="C:\\windows\\system32\\rundll32.exe setupapi.dll,'
            r'InstallHinfSection Uninstall 132 C:\\windows\\Moriv.INF"')

# What was before a run, and what ran: files by path, the registry, the image's path, its files as pairs
# of name and destination, whether a user was there, whether texts are compared with their NUL.
Before = namedtuple('Before', 'files registry image packed dialog exact')
Checks = namedtuple('Checks', 'log files registry')

_WORDS = re.compile(r'(installed|registered|removed|unregistered)(?: (\w:.*?))?(?: in (\w+))?'
                    r'(, listed)?(, older)?')


def checks_of(words, before):
    """The bodies of the checks; an "(un)registered" gives the lines that come behind the scenario's."""
    match = _WORDS.fullmatch(words)
    if not match or (match[3] or 'French') not in LANGUAGES:
        raise ValueError(f'no such words: {words}')
    word, directory, language, listed, older = match.groups()
    directory = directory or DIRECTORY
    language = language or 'French'
    whole = word in ('installed', 'removed')
    targets = _targets(before.packed, directory) if whole else []
    if word in ('installed', 'registered'):
        events = _copies(before, targets, older) if whole else []
        files = _new_files(before, targets) if whole else []
        return Checks(events + _registration_events(before),
                      files + [_written(REMOVAL_PROGRAM, before) +
                               f' = removal program of {before.image} in {language}'],
                      _registration(before, directory, LANGUAGES[language], listed))
    events = _deletions(before, targets, directory) if whole else []
    files = _gone_files(before, targets, directory) if whole else []
    return Checks(events + _unregistration_events(before),
                  files + [_written(INF, before) + ' = the INF file'],
                  _unregistration(before, listed))


def number(events, first=1):
    """Lines of a log."""
    return [f'|{place}- {event}|' for place, event in enumerate(events, first)]


def _targets(packed, directory):
    """Name, directory and path of each target of each file."""
    targets = []
    for name, destination in packed:
        for place in destination.replace('%INSTALL_DIR%', directory).split(';'):
            if not place.startswith(directory):
                raise ValueError(f'{name} goes to {destination}: its log and files have to be written')
            targets.append((name, place, f'{place}\\{name}'))
    return targets


def _is_registered(before):
    key = before.registry.keys.get(PRODUCT.lower())
    return key is not None and 'installdir' in key.values


def _written(path, before):
    return f'{"~" if path in before.files else "+"} {path}'


def _copies(before, targets, older):
    registered = _is_registered(before)
    events = ['Found a registered version of Moriv '] if registered else []
    if older:
        events.append('Found an older version on the system, with at least one older or missing file ')
    if before.dialog:
        events.append('Updating the Moriv version on the system ' if registered else
                      'Installing Moriv version on the system ')
    return events + [f'File copied correctly :  {path}' for _, _, path in targets]


def _registration_events(before):
    return ['Moriv registered in the system registry ',
            f'Uninstall file is installed correctly :  {REMOVAL_PROGRAM}',
            *(['Installation of Moriv succeded '] if before.dialog else [])]


def _new_files(before, targets):
    lines = {}
    for name, place, path in targets:
        parts = place.split('\\')
        for end in range(2, len(parts) + 1):
            folder = '\\'.join(parts[:end]) + '\\'
            if folder not in before.files:
                lines[folder] = f'+ {folder}'
        lines[path] = f'{_written(path, before)} = original {name} of {before.image}'
    return list(lines.values())


def _registration(before, directory, language, listed):
    lines = [f'[{PRODUCT}]', f'"InstallDir"={registry_text.quote(directory)} unterminated',
             f'"Language"="{language.word}" unterminated', rf'[{PRODUCT}\Services]']
    if listed:
        lines += [f'[{ENTRY}]', f'"DisplayName"="{language.tag}ZEB Machine virtuelle Moriv"',
                  f'"UninstallString"={registry_text.quote(REMOVAL_PROGRAM)}']
    return _registry_changes(before, lines)


def _deletions(before, targets, directory):
    events = ['Found a registered version of Moriv '] if _is_registered(before) else []
    events.append('Unistalling Moriv from the system ')
    for _, place, path in targets:
        events.append(f'Deleteting file :  {path}')
        if place != directory:
            events.append(f'Removing Directory :  {place}')
    return [*events, f'Removing Directory :  {directory}']


def _unregistration_events(before):
    return ['Moriv registration removed from the registry ',
            *(['Uninstallation of Moriv succeded '] if before.dialog else [])]


def _gone_files(before, targets, directory):
    left = dict(before.files)
    for _, _, path in targets:
        left.pop(path, None)
    for folder in [*(place + '\\' for _, place, _ in targets if place != directory), directory + '\\']:
        if not any(path.startswith(folder) and path != folder for path in left):
            left.pop(folder, None)
    return [f'- {path}' for path in before.files if path not in left]


def _unregistration(before, listed):
    entry = [f'[-{ENTRY}]'] if listed else []
    return _registry_changes(before, [f'[-{PRODUCT}]', *entry, rf'[{CURRENT_VERSION}\RunOnce]',
                                      CLEAN_UP])


def _registry_changes(before, lines):
    after = copy.deepcopy(before.registry).apply(lines)
    return registry_text.changes(before.registry, after, before.exact)
