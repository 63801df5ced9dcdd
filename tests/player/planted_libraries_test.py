"""Libraries planted beside the setup program: a whole life of the product loads none.

They bear the names that setup programs are known to load from their own folder. A second program, which
loads by bare name, has to load them all: else nothing would be shown.
"""

import os

from package_image import PackedImage

FOLDER = 'C:\\Planted\\'
SETUP = FOLDER + 'Setup.exe'
LOADER = FOLDER + 'careless_loader.exe'

# Not comctl32 and comdlg32: Windows has its own ways to find those, while Wine's shell32 loads the
# first one from the program's folder whatever the program says.
NAMES = """
    apphelp bcrypt cfgmgr32 clbcatq comres coremessaging cryptbase cryptsp cscapi devobj dnsapi dwmapi
    edputil gdiplus iertutil imageres iphlpapi linkinfo mpr msftedit msi msimg32 msls31 netapi32
    netutils ntmarta ntshrui oleacc powrprof profapi propsys riched20 riched32 rsaenh samcli secur32
    setupapi sfc sfc_os shdocvw shfolder slc srvcli sspicli textinputframework textshaping urlmon
    userenv usp10 uxtheme version winhttp wininet winmm winspool wintrust wkscli wldp wtsapi32""".split()

# What is run: the program, its options, the user's script of a dialog run, the exit code, and what is
# loaded from the program's folder; Wine's folder picker loads one there whatever the program has asked
# for. The first dialog loads by bare name, as a shell extension might. The removal program is written
# only when the version functions are the system's: 100002 would tell of a planted version.dll.
RUNS = [
    (LOADER, ' '.join(f'{name}.dll' for name in NAMES), None, 0, set(NAMES)),
    (SETUP, '/i', ['load riched20.dll', 'load ntmarta', 'press 907', 'close'], 1, set()),
    (SETUP, '/s /r', None, 1, set()),
    (SETUP, '/h', [], 0, set()),
    (SETUP, '/u /s /r', None, 1, set()),
    (SETUP, '/i', ['pick none', 'press 904', 'press 907', 'close'], 1, {'uxtheme'}),
]

# For the Wine that is started when all tests are collected (tools/wine): else it takes its own.
os.environ['MORIV_WINE_NATIVE'] = ','.join(NAMES)


def test_planted_libraries(player, machine):
    programs = player.world.stub.parent / 'tests'
    for name in NAMES:
        machine.files.write(f'{FOLDER}{name}.dll', (programs / 'planted_library.dll').read_bytes())
    machine.files.write(LOADER, (programs / 'careless_loader.exe').read_bytes())
    machine.files.write(SETUP, PackedImage(player.tools).bytes)
    for program, arguments, machine.user, code, expected in RUNS:
        outcome = machine.run(program, arguments)
        loaded = list(machine.files.host(FOLDER).glob('*.loaded'))  # a mark of each
        for mark in loaded:
            mark.unlink()
        names = {mark.name.removesuffix('.dll.loaded') for mark in loaded}
        assert (arguments, outcome.exit_code, names) == (arguments, code, expected)
