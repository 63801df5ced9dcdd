#!/usr/bin/python3
"""Plants libraries beside the setup program and sees that a whole life of the product loads none.

They bear the names that setup programs are known to load from their own folder. A second program, which
loads by bare name, has to load them all: else nothing would be shown.
"""

import os
import sys

sys.dont_write_bytecode = True  # before the modules of this folder
from packed_image import PackedImage
from run_scenarios import in_world, read_options
from worlds import require

FOLDER = 'C:\\Planted\\'
SETUP = FOLDER + 'Setup.exe'
LOADER = FOLDER + 'careless_loader.exe'

# Not comctl32 and comdlg32: Windows has its own ways to find those, while Wine's shell32 loads the
# first one from the program's folder whatever the program says.
NAMES = """
    apphelp bcrypt cfgmgr32 clbcatq comres coremessaging cryptbase cryptsp cscapi
    devobj dnsapi dwmapi edputil gdiplus iertutil imageres iphlpapi linkinfo mpr msftedit
    msi msimg32 msls31 netapi32 netutils ntmarta ntshrui oleacc powrprof profapi propsys riched20
    riched32 rsaenh samcli secur32 setupapi sfc sfc_os shdocvw shfolder slc srvcli sspicli
    textinputframework textshaping urlmon userenv usp10 uxtheme version winhttp wininet winmm
    winspool wintrust wkscli wldp wtsapi32""".split()

IMAGE = ['zebdial.exe = sample zebdial.exe -> %INSTALL_DIR%',
         'zebnet.dll = sample zebnet.dll -> %INSTALL_DIR%']

# What is run: the options, the user's script of a dialog run, the exit code, and what Wine loads from
# the program's folder itself: its folder picker does so whatever the program has asked for. The first
# run loads by bare name, as a shell extension in the process might. The removal program is written
# only when the version functions are the system's: 100002 would tell of a planted version.dll.
RUNS = [
    ('/i', ['load riched20.dll', 'load ntmarta', 'press 907', 'close'], 1, ()),
    ('/s /r', None, 1, ()),
    ('/h', [], 0, ()),
    ('/u /s /r', None, 1, ()),
    ('/i', ['pick none', 'press 904', 'press 907', 'close'], 1, ('uxtheme',)),
]


def plant(world, tools, images):
    library = world.stub.parent / 'tests' / 'planted_library.dll'
    loader = world.stub.parent / 'tests' / 'careless_loader.exe'
    require(library, loader)
    machine = world.machine('planted')
    files = {FOLDER + name + '.dll': library.read_bytes() for name in NAMES}
    files |= {SETUP: PackedImage(IMAGE, tools).make(images), LOADER: loader.read_bytes()}
    for path, content in files.items():
        machine.files.write(path, content)
    troubles = control(machine) + setup_runs(machine)
    machine.discard()
    return len(troubles), '\n'.join(troubles) or f'{len(NAMES)} planted libraries, none loaded'


def take_marks(machine):
    """Names of the planted libraries that were loaded; their marks are gone then."""
    marks = list(machine.files.host(FOLDER).glob('*.loaded'))
    for mark in marks:
        mark.unlink()
    return {mark.name.removesuffix('.dll.loaded') for mark in marks}


def control(machine):
    machine.run(LOADER, ' '.join(f'{name}.dll' for name in NAMES))
    return [f'{name}: not even the careless program loads it'
            for name in sorted(set(NAMES) - take_marks(machine))]


def setup_runs(machine):
    troubles = []
    for arguments, script, expected, excused in RUNS:
        if script is not None:
            machine.user(script)
        outcome = machine.run(SETUP, arguments)
        if outcome.exit_code != expected:
            troubles.append(f'Setup.exe {arguments}: exit code {outcome.exit_code} {outcome.trouble} '
                            + ' '.join(outcome.shown))
        troubles += [f'Setup.exe {arguments} loads {name}.dll from its own folder'
                     for name in sorted(take_marks(machine) - set(excused))]
    return troubles


if __name__ == '__main__':
    os.environ['MORIV_WINE_NATIVE'] = ','.join(NAMES)
    sys.exit(in_world(read_options(), plant))
