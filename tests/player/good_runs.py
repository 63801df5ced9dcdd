"""The words for what a good run leaves: the checks that they stand for, worked out from what stood on
the machine before the run and from the image that ran.

    installed [DIRECTORY] [in LANGUAGE][, VARIANT]...
    removed [DIRECTORY][, listed]

are log, files and registry of an image whose files go to %INSTALL_DIR% or below, or to a browser that
is not there. Variants: "listed", with the uninstall entry; "older", the event of an update that has found
an older or missing file; "not removable", without a removal program; "not registered", without a registry.
"registered" and "unregistered" are the ends of the two: the last events, which follow the scenario's own,
the removal program or the INF file, which stands beside the scenario's own files, and the registry.
"""

import copy
import re
from collections import namedtuple

import file_tree
import registry_text

# The registry's word, the catalog's offset and the tag of its texts.
Language = namedtuple('Language', 'word offset tag')
LANGUAGES = {'English': Language('GB', 0, '_ENG_ '), 'French': Language('FR', 10000, ''),
             'German': Language('DE', 20000, '_GER_ '), 'Italian': Language('IT', 30000, '_ITA_ '),
             'Spanish': Language('ES', 40000, '_SPA_ ')}

# What a registry key of the browser behind a macro has in its path.
BROWSERS = {'%PLUGIN_NS_DIR%': 'netscape', '%PLUGIN_IE_DIR%': 'iexplore', '%PLUGIN_OPERA_DIR%': 'opera'}

DIRECTORY = r'C:\Program Files\Moriv'
REMOVAL_PROGRAM = r'C:\windows\MorivRmv.exe'
INF = r'C:\windows\Moriv.INF'
PRODUCT = r'SOFTWARE\Zeb\Moriv'
OLDER = 'Found an older version on the system, with at least one older or missing file '
CURRENT_VERSION = r'SOFTWARE\Microsoft\Windows\CurrentVersion'
ENTRY = CURRENT_VERSION + r'\Uninstall\Moriv'
CLEAN_UP = (r'"MorivCommand"="C:\\windows\\system32\\rundll32.exe setupapi.dll,'
            r'InstallHinfSection Uninstall 132 C:\\windows\\Moriv.INF"')

# What was before a run, and what ran: files by path, the registry, the image's path, its files as pairs
# of name and destination, whether a user was there, whether texts are compared with their NUL.
Before = namedtuple('Before', 'files registry image packed dialog exact')
Checks = namedtuple('Checks', 'log files registry')

_WORDS = re.compile(r'(installed|registered|removed|unregistered)(?: (\w:[^,]*?))?(?: in (\w+))?'
                    r'((?:, [a-z ]+)*)')
VARIANTS = ('listed', 'older', 'not removable', 'not registered')


def checks_of(words, before):
    """The bodies of the checks; an "(un)registered" gives the lines that come behind the scenario's."""
    match = _WORDS.fullmatch(words)
    variants = match[4].split(', ')[1:] if match else []
    if not match or (match[3] or 'French') not in LANGUAGES or not set(variants) <= set(VARIANTS):
        raise ValueError(f'no such words: {words}')
    word, directory, language = match[1], match[2] or DIRECTORY, match[3] or 'French'
    targets = _targets(before, directory) if word in ('installed', 'removed') else []
    if word == 'installed':
        head = _copies(before, targets, directory, 'older' in variants), _new_files(before, targets)
    elif word == 'removed':
        head = _deletions(before, targets, directory)
    else:
        head = [], []
    if word in ('installed', 'registered'):
        tail = _registration(before, directory, language, variants)
    else:
        tail = _unregistration(before, variants)
    return Checks(head[0] + tail.log, head[1] + tail.files, tail.registry)


def _targets(before, directory):
    """Name, directory and path of each target of each file; a browser that is not there is none."""
    targets = []
    for name, destination in before.packed:
        browser = BROWSERS.get(destination)
        if browser and not any(browser in key for key in before.registry.keys):
            continue
        for place in destination.replace('%INSTALL_DIR%', directory).split(';'):
            if not place.startswith(directory):
                raise ValueError(f'{name} goes to {destination}: its log and files have to be written')
            targets.append((name, place, f'{place}\\{name}'))
    return targets


def _found(before, directory):
    """The event of a product that was there. A dialog may change its directory later."""
    key = before.registry.keys.get(PRODUCT.lower())
    value = key.values.get('installdir') if key else None
    if value and value.type == registry_text.REG_SZ and len(value.data) <= 511:
        return ['Found a registered version of Moriv ']
    if not before.dialog and (directory + '\\' in before.files or directory.endswith(':')):
        return ['Found no registered version but the directory of Moriv ']
    return []


def _written(path, before):
    return f'{"~" if path in before.files else "+"} {path}'


def _copies(before, targets, directory, older):
    events = _found(before, directory)
    kind = 'Updating the' if events else 'Installing'
    events += [OLDER] if older else []
    events += [f'{kind} Moriv version on the system '] if before.dialog else []
    return events + [f'File copied correctly :  {path}' for _, _, path in targets]


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


def _registration(before, directory, language, variants):
    events, files, lines = [], [], []
    if 'not registered' in variants:
        events.append("Couldn't register Moriv in the system registry . (Warning)")
    else:
        events.append('Moriv registered in the system registry ')
        lines += [f'[{PRODUCT}]', f'"InstallDir"={registry_text.quote(directory)} unterminated',
                  f'"Language"="{LANGUAGES[language].word}" unterminated']
        if PRODUCT.lower() not in before.registry.keys:
            lines.append(rf'[{PRODUCT}\Services]')
    if 'not removable' in variants:
        events.append(f'Error installing Uninstall file {REMOVAL_PROGRAM}. (Warning)')
    else:
        events.append(f'Uninstall file is installed correctly :  {REMOVAL_PROGRAM}')
        files.append(f'{_written(REMOVAL_PROGRAM, before)} = '
                     f'removal program of {before.image} in {language}')
    if 'listed' in variants:
        lines += [f'[{ENTRY}]', f'"DisplayName"="{LANGUAGES[language].tag}ZEB Machine virtuelle Moriv"',
                  f'"UninstallString"={registry_text.quote(REMOVAL_PROGRAM)}']
    events += ['Installation of Moriv succeded '] if before.dialog else []
    return Checks(events, files, _registry_changes(before, lines))


def _deletions(before, targets, directory):
    """Events and files: what is there is tried, what is read-only stays, and a directory with it."""
    found = _found(before, directory)
    events, left = [*found, 'Unistalling Moriv from the system '], dict(before.files)

    def remove(folder):
        events.append(f'Removing Directory :  {folder}')
        if not any(path.startswith(folder + '\\') and path != folder + '\\' for path in left):
            left.pop(folder + '\\', None)

    for _, place, path in targets:
        if path in left:
            events.append(f'Deleteting file :  {path}')
            if file_tree.is_writable(left[path]):
                del left[path]
            if place != directory:
                remove(place)
    if found:
        remove(directory)
    return events, [f'- {path}' for path in before.files if path not in left]


def _unregistration(before, variants):
    events = ['Moriv registration removed from the registry ',
              *(['Uninstallation of Moriv succeded '] if before.dialog else [])]
    entry = [f'[-{ENTRY}]'] if 'listed' in variants else []
    return Checks(events, [_written(INF, before) + ' = the INF file'],
                  _registry_changes(before, [f'[-{PRODUCT}]', *entry, rf'[{CURRENT_VERSION}\RunOnce]',
                                             CLEAN_UP]))


def _registry_changes(before, lines):
    after = copy.deepcopy(before.registry).apply(lines)
    return registry_text.changes(before.registry, after, before.exact)
