"""Libraries planted beside the setup program: a whole life of the product loads none.

They bear the names that setup programs are known to load from their own folder. A second program, which
loads by bare name, has to load them all: else nothing would be shown.
"""

import os

import pytest

from package_image import PackedImage
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

# What is run: the options, the user's script of a dialog run, the exit code, and what Wine loads from
# the program's folder itself: its folder picker does so whatever the program has asked for. The first
# run loads by bare name, as a shell extension in the process might. The removal program is written
# only when the version functions are the system's: 100002 would tell of a planted version.dll.
RUNS = [
    ('/i', ['load riched20.dll', 'load ntmarta', 'press 907', 'close'], 1, set()),
    ('/s /r', None, 1, set()),
    ('/h', [], 0, set()),
    ('/u /s /r', None, 1, set()),
    ('/i', ['pick none', 'press 904', 'press 907', 'close'], 1, {'uxtheme'}),
]

# For the Wine that is started when all tests are collected (tools/wine): else it takes its own.
os.environ['MORIV_WINE_NATIVE'] = ','.join(NAMES)


def take_marks(machine):
    """Names of the planted libraries that were loaded; their marks are gone then."""
    marks = list(machine.files.host(FOLDER).glob('*.loaded'))
    for mark in marks:
        mark.unlink()
    return {mark.name.removesuffix('.dll.loaded') for mark in marks}


def test_planted_libraries(player):
    if player.world.name == 'stand-in':
        pytest.skip('only Wine: the stand-in loads no libraries')
    tests = player.world.stub.parent / 'tests'
    library, loader = tests / 'planted_library.dll', tests / 'careless_loader.exe'
    require(library, loader)
    machine = player.world.machine('planted')
    for name in NAMES:
        machine.files.write(f'{FOLDER}{name}.dll', library.read_bytes())
    machine.files.write(LOADER, loader.read_bytes())
    machine.files.write(SETUP, PackedImage(player.tools).bytes)
    machine.run(LOADER, ' '.join(f'{name}.dll' for name in NAMES))
    loaded = [('careless', None, take_marks(machine))]
    for arguments, script, _, _ in RUNS:
        machine.user = script
        outcome = machine.run(SETUP, arguments)
        loaded.append((arguments, outcome.exit_code, take_marks(machine)))
    machine.discard()
    assert loaded[0][2] == set(NAMES)
    for (arguments, code, marks), (_, _, expected, excused) in zip(loaded[1:], RUNS):
        assert (arguments, code, marks - excused) == (arguments, expected, set())
