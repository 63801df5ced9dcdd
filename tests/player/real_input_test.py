"""One large scenario of real programs: installed byte for byte, then removed to the last file.

The input is what every host with Wine has: Wine's own libraries, without their debug information.
The largest ones, one of a family (msvcp70, msvcp71 and so on are nearly the same file).
"""

import re
import subprocess
from pathlib import Path

from scenario_text import ScenarioError, parse

SOURCE = Path('/usr/lib/x86_64-linux-gnu/wine/x86_64-windows')
STRIP = 'x86_64-w64-mingw32-strip'
FILES = 48
BYTES = 40_000_000  # at least

INSTALL_DIR = r'C:\Program Files\Moriv'
LIBRARY = INSTALL_DIR + r'\library'


def missing():
    """Why this host has no input; '' when it has."""
    return '' if SOURCE.is_dir() else f'{SOURCE} is not there; libwine is not installed'


def scenario(folder):
    """Makes the input in the folder, unless it is there, and gives the scenario for it."""
    names = sorted(file.name for file in folder.glob('*.dll'))
    if len(names) != FILES:
        names = _strip_libraries(folder)
    total = sum((folder / name).stat().st_size for name in names)
    if len(names) != FILES or total < BYTES:
        raise ScenarioError(f'{SOURCE} has too few libraries for a real input')
    print(f'real input: {len(names)} files, {total} bytes')
    return parse('real-input', '\n'.join(_text(names)), 'real input')


def _strip_libraries(folder):
    folder.mkdir(parents=True, exist_ok=True)
    families = {}
    for file in sorted(SOURCE.glob('*.dll'), key=lambda file: (-file.stat().st_size, file.name)):
        families.setdefault(re.match('[a-z]*', file.name)[0], file)
    chosen = sorted(families.values(), key=lambda file: -file.stat().st_size)[:FILES]
    for file in chosen:
        subprocess.run([STRIP, '-o', folder / file.name, file], check=True)
    return sorted(file.name for file in chosen)


def _targets(index):
    """A destination and the directories that it stands for: most files go into the installation
    directory, some below it, some to both."""
    if index % 7 == 0:
        return r'%INSTALL_DIR%;%INSTALL_DIR%\library', [INSTALL_DIR, LIBRARY]
    if index % 4 == 0:
        return r'%INSTALL_DIR%\library', [LIBRARY]
    return '%INSTALL_DIR%', [INSTALL_DIR]


def _text(names):
    """The scenario, line by line, as it would stand in a file."""
    image = ['given image C:\\Setup.exe']
    copied, deleted, new, gone = [], [], [], []
    for index, name in enumerate(names):
        destination, directories = _targets(index)
        image.append(f'  {name} = real {name} -> {destination}')
        for directory in directories:
            copied.append(f'File copied correctly :  {directory}\\{name}')
            deleted.append(f'Deleteting file :  {directory}\\{name}')
            if directory != INSTALL_DIR:
                deleted.append(f'Removing Directory :  {directory}')
            new.append(f'  + {directory}\\{name} = original {name}')
            gone.append(f'  - {directory}\\{name}')
    installed = [*copied, 'Moriv registered in the system registry ',
                 r'Uninstall file is installed correctly :  C:\windows\MorivRmv.exe']
    removed = ['Found a registered version of Moriv ', 'Unistalling Moriv from the system ',
               *deleted, f'Removing Directory :  {INSTALL_DIR}',
               'Moriv registration removed from the registry ']
    product = [r'  + [SOFTWARE\Zeb]', r'  + [SOFTWARE\Zeb\Moriv]',
               r'  + "InstallDir"="C:\\Program Files\\Moriv"', '  + "Language"="FR"',
               r'  + [SOFTWARE\Zeb\Moriv\Services]']
    command = [r'    [SOFTWARE\Microsoft\Windows\CurrentVersion\RunOnce]',
               r'  + "MorivCommand"="C:\\windows\\system32\\rundll32.exe'
               r' setupapi.dll,InstallHinfSection Uninstall 132 C:\\windows\\Moriv.INF"']
    return [
        *image,
        r'run C:\Setup.exe /s', 'exit 1', 'log', *_numbered(installed),
        'files', f'  + {INSTALL_DIR}\\', f'  + {LIBRARY}\\', *new,
        r'  + C:\windows\MorivRmv.exe = removal program of C:\Setup.exe in French',
        'registry', *product,
        r'run C:\windows\MorivRmv.exe /s', 'exit 1', 'log', *_numbered(removed),
        'files', f'  - {INSTALL_DIR}\\', f'  - {LIBRARY}\\', *gone,
        r'  + C:\windows\Moriv.INF = the INF file',
        'registry', *command,
        r'  - [SOFTWARE\Zeb\Moriv]', r'  - [SOFTWARE\Zeb\Moriv\Services]',
        'restart',
        'files', r'  - C:\windows\MorivRmv.exe', r'  - C:\windows\MorivLog.txt',
        r'  - C:\windows\Moriv.INF',
        'registry', command[0], command[1].replace('  + ', '  - '),
    ]


def _numbered(events):
    return [f'  |{number}- {event}|' for number, event in enumerate(events, 1)]
