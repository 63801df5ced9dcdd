"""The words for what a good run leaves, as the README of the scenarios tells them: the checks that they
stand for, worked out from what stood on the machine before the run and from the image that ran.
"""

import copy
import re
from collections import namedtuple
from pathlib import PureWindowsPath

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
PRODUCT = r'SOFTWARE\Zeb\Moriv'
CURRENT_VERSION = r'SOFTWARE\Microsoft\Windows\CurrentVersion'
ENTRY = CURRENT_VERSION + r'\Uninstall\Moriv'
CLEAN_UP = (r'"MorivCommand"="C:\\windows\\system32\\rundll32.exe setupapi.dll,'
            r'InstallHinfSection Uninstall 132 C:\\windows\\Moriv.INF"')

# What was before a run, and what ran: files by path, the registry, the files of the image as pairs of
# name and destination, whether a user was there.
Before = namedtuple('Before', 'files registry packed dialog')

_WORDS = re.compile(r'(installed|registered|removed|unregistered)(?: (\w:[^,]*?))?(?: in (\w+))?'
                    r'((?:, (?:listed|older|not removable|not registered))*)')


def checks_of(words, before):
    """Events, lines of files, lines of the registry; those of an end come behind the scenario's."""
    match = _WORDS.fullmatch(words)
    if not match or (match[3] or 'French') not in LANGUAGES:
        raise ValueError(f'no such words: {words}')
    run = _GoodRun(before, match[2] or DIRECTORY)
    if match[1] == 'installed':
        run.copy_files('older' in match[4])
    elif match[1] == 'removed':
        run.delete_files()
    if match[1] in ('installed', 'registered'):
        run.register(match[3] or 'French', match[4])
    else:
        run.unregister(match[4])
    return run.checks()


class _GoodRun:
    def __init__(self, before, directory):
        self.before, self.directory = before, directory
        self.events = []
        self.files = dict(before.files)  # a stamp by path, words for the content of what is written
        self.registry = copy.deepcopy(before.registry)

    def checks(self):
        files = [f'{sign} {path}' + (f' = {self.files[path]}' if self.files.get(path) else '')
                 for path, sign in file_tree.changes(self.before.files, self.files).items()]
        return self.events, files, registry_text.changes(self.before.registry, self.registry)

    def copy_files(self, told_older):
        found = self._find_product()
        if told_older:
            self.events.append(
                'Found an older version on the system, with at least one older or missing file ')
        if self.before.dialog:
            kind = 'Updating the' if found else 'Installing'
            self.events.append(f'{kind} Moriv version on the system ')
        for name, place in self._targets():
            for folder in list(PureWindowsPath(place, name).parents)[:-1]:
                self.files.setdefault(f'{folder}\\')
            self.files[f'{place}\\{name}'] = f'original {name}'
            self.events.append(f'File copied correctly :  {place}\\{name}')

    def register(self, language, variants):
        if 'not registered' in variants:
            self.events.append("Couldn't register Moriv in the system registry . (Warning)")
        else:
            self.events.append('Moriv registered in the system registry ')
            if PRODUCT.lower() not in self.registry.keys:
                self.registry.make(rf'{PRODUCT}\Services')
            self.registry.apply([
                f'[{PRODUCT}]', f'"InstallDir"={registry_text.quote(self.directory)} unterminated',
                f'"Language"="{LANGUAGES[language].word}" unterminated'])
        if 'not removable' in variants:
            self.events.append(f'Error installing Uninstall file {REMOVAL_PROGRAM}. (Warning)')
        else:
            self.events.append(f'Uninstall file is installed correctly :  {REMOVAL_PROGRAM}')
            self.files[REMOVAL_PROGRAM] = f'removal program in {language}'
        if 'listed' in variants:
            self.registry.apply([
                f'[{ENTRY}]', f'"DisplayName"="{LANGUAGES[language].tag}ZEB Machine virtuelle Moriv"',
                f'"UninstallString"={registry_text.quote(REMOVAL_PROGRAM)}'])
        if self.before.dialog:
            self.events.append('Installation of Moriv succeded ')

    def delete_files(self):
        """What is there is tried; what is read-only stays, and a directory with it."""
        found = self._find_product()
        self.events.append('Unistalling Moriv from the system ')
        for name, place in self._targets():
            path = f'{place}\\{name}'
            if path in self.files:
                self.events.append(f'Deleteting file :  {path}')
                if file_tree.is_writable(self.files[path]):
                    del self.files[path]
                if place != self.directory:
                    self._remove_directory(place)
        if found:
            self._remove_directory(self.directory)

    def unregister(self, variants):
        self.events.append('Moriv registration removed from the registry ')
        self.files[r'C:\windows\Moriv.INF'] = 'the INF file'
        entry = [f'[-{ENTRY}]'] if 'listed' in variants else []
        self.registry.apply([f'[-{PRODUCT}]', *entry, rf'[{CURRENT_VERSION}\RunOnce]', CLEAN_UP])
        if self.before.dialog:
            self.events.append('Uninstallation of Moriv succeded ')

    def _find_product(self):
        """Whether there was one, which is an event. A dialog may change its directory later."""
        key = self.before.registry.keys.get(PRODUCT.lower())
        _, kind, data = key.values.get('installdir', ('', 0, b'')) if key else ('', 0, b'')
        if kind == registry_text.REG_SZ and len(data) <= 511:
            self.events.append('Found a registered version of Moriv ')
        elif not self.before.dialog and (f'{self.directory}\\' in self.files or not self.directory[2:]):
            self.events.append('Found no registered version but the directory of Moriv ')
        return bool(self.events)

    def _targets(self):
        """Name and directory of each target of each file; a browser that is not there is none."""
        for name, destination in self.before.packed:
            browser = BROWSERS.get(destination)
            if browser and not any(browser in key for key in self.registry.keys):
                continue
            for place in destination.replace('%INSTALL_DIR%', self.directory).split(';'):
                if not place.startswith(self.directory):
                    raise ValueError(f'{name} goes to {destination}: say log and files in full')
                yield name, place

    def _remove_directory(self, folder):
        self.events.append(f'Removing Directory :  {folder}')
        if not any(path.startswith(f'{folder}\\') and path != f'{folder}\\' for path in self.files):
            self.files.pop(f'{folder}\\', None)
