#!/usr/bin/python3
"""moriv-image for Windows under Wine, beside the one for Linux: the same command lines have to give the same
exit status, output and files.

    run_on_windows.py NATIVE    NATIVE: the folder of the native build

Exit status 77: this host has no Wine, or MORIV_WINE=none leaves it out.
"""

import fcntl
import re
import shlex
import shutil
import signal
import subprocess
import sys
import time
from pathlib import Path

sys.dont_write_bytecode = True
ROOT = Path(__file__).resolve().parent.parent.parent
sys.path.insert(0, str(ROOT / 'tests' / 'player'))
from stripped_libraries import strip_libraries  # noqa: E402

WINE, PREFIX = ROOT / 'tools' / 'wine', ROOT / 'build' / 'wine' / 'scenarios-wine64'
STUB, SAMPLES = ROOT / 'build' / 'win32' / 'MorivSetup.exe', ROOT / 'build' / 'win32' / 'samples'
LIBRARIES = 48
TIME_LIMIT = 300  # seconds, for one command

PACKAGE = r"""
[package]
default_directory = 'C:\Café\Déjà'
[[file]]
source = "in/text/*"
destination = ['%INSTALL_DIR%\été', '%SYS_DIR%']
[[tree]]
source = "in/text"
destination = 'C:\Données'
[[file]]
source = "in/samples/zebdial.exe"
destination = '%INSTALL_DIR%'
name = "naïf €.exe"
"""
ALL_LIBRARIES = "[[file]]\nsource = \"*.dll\"\ndestination = '%INSTALL_DIR%'\n"

# Played in this order, in a folder of each tool; in/ is what both have.
COMMANDS = r"""
pack in/reference.toml --source-dir in/samples --stub in/Setup.exe -o reference.exe --verbose
pack in/libraries.toml --source-dir in/libraries --stub in/Setup.exe -o libraries.exe --quiet
pack in/package.toml --source-dir . --stub in/Setup.exe -o 'naïf 日本 Ж.exe' --depfile rule.d
pack in/package.toml --source-dir . --stub in/Setup.exe -o in/Setup.exe
pack in/package.toml --stub in/Setup.exe -o lost.exe
pack in/reference.toml --source-dir in/samples --stub in/samples -o lost.exe
list reference.exe
list 'naïf 日本 Ж.exe' --json
list nowhere/日本.exe
list in
list /S
verify libraries.exe reference.exe
verify 'naïf 日本 Ж.exe' --json --against in/package.toml --source-dir .
verify in/damaged.exe
extract libraries.exe -o libraries
extract 'naïf 日本 Ж.exe' -o 'Ordner Ж' --tree
extract 'naïf 日本 Ж.exe' -o 'Ordner Ж' --tree --force
extract 'naïf 日本 Ж.exe' '#1' 'NAÏF €.EXE' -o some
extract 'naïf 日本 Ж.exe' 'naïf €.exe' -o some
extract reference.exe Ж -o none
removal reference.exe -o removal.exe --language german
list removal.exe
removal reference.exe -o nowhere/removal.exe
diff reference.exe 'naïf 日本 Ж.exe'
diff reference.exe reference.exe --json
explain 4293967294
explain in/damaged.exe
lst
pack --help
--version
"""


def make_inputs(folder):
    folder.mkdir()
    shutil.copy(STUB, folder / 'Setup.exe')
    shutil.copytree(SAMPLES, folder / 'samples')
    shutil.copy(ROOT / 'samples' / 'reference.toml', folder)
    (folder / 'package.toml').write_text(PACKAGE, encoding='utf-8')
    (folder / 'libraries.toml').write_text(ALL_LIBRARIES, encoding='utf-8')
    (folder / 'text').mkdir()
    for name in ('Zoë.txt', 'été.txt', 'e.txt', '~.txt'):
        (folder / 'text' / name).write_text(f'{name}\r\nand more\n' * 100, encoding='utf-8', newline='')
    (folder / 'damaged.exe').write_bytes(bytes(range(256)) * 8)


def run(tool, folder, line):
    done = subprocess.run([*tool, *shlex.split(line)], cwd=folder, stdin=subprocess.DEVNULL,
                          capture_output=True, timeout=TIME_LIMIT)
    # Each host separates folders in its own way.
    out, err = (re.sub(r'\\+|/', '/', text.decode()) for text in (done.stdout, done.stderr))
    return done.returncode, out, err


def files_of(folder):
    return {str(path.relative_to(folder)): path.read_bytes() for path in folder.rglob('*')
            if path.is_file()}


def leaves_nothing_when_interrupted(tool, folder):
    """Ctrl-C, as Wine gets it: SIGINT."""
    before = set(folder.iterdir())
    line = 'pack in/libraries.toml --source-dir in/libraries --stub in/Setup.exe -o late.exe --best'
    packing = subprocess.Popen([*tool, *shlex.split(line)], cwd=folder, stdin=subprocess.DEVNULL)
    while packing.poll() is None and not list(folder.glob('.moriv-*')):
        time.sleep(0.05)
    packing.send_signal(signal.SIGINT)
    packing.wait(timeout=TIME_LIMIT)
    return set(folder.iterdir()) == before


def compare(tools, work):
    failures = 0
    for line in COMMANDS.strip().splitlines():
        linux, windows = (run(tool, work / name, line) for name, tool in tools.items())
        if linux != windows:
            print(f'moriv-image {line}\n  Linux:   {linux}\n  Windows: {windows}')
            failures += 1
    linux, windows = (files_of(work / name) for name in tools)
    for name in sorted(linux.keys() | windows.keys()):
        if linux.get(name) != windows.get(name):
            print(f'{name}: not the same file')
            failures += 1
    status, out, err = run(tools['windows'], work / 'windows', 'plan reference.exe')
    if (status, out, err.count('\n')) != (2, '', 1):
        print(f'plan: {status}, {out}, {err}')
        failures += 1
    if not leaves_nothing_when_interrupted(tools['windows'], work / 'windows'):
        print('an interrupted pack leaves a file')
        failures += 1
    print(f'{len(COMMANDS.strip().splitlines())} command lines, {len(linux)} files, {failures} differences')
    return failures


def main(native):
    answer = subprocess.run([WINE, 'can-run', 'wine64'], capture_output=True, text=True)
    if answer.returncode != 0:
        print(answer.stdout or answer.stderr)
        return 77
    PREFIX.parent.mkdir(parents=True, exist_ok=True)
    lock = open(f'{PREFIX}.in-use', 'w')  # the scenarios' own
    fcntl.flock(lock, fcntl.LOCK_EX)
    subprocess.run([WINE, 'prefix', PREFIX, 'wine64'], check=True)
    work = native / 'tests' / 'on-windows'
    shutil.rmtree(work, ignore_errors=True)
    work.mkdir(parents=True)
    libraries = native / 'tests' / 'libraries'
    if not strip_libraries(libraries, LIBRARIES):
        print('Wine has too few libraries')
        return 1
    tools = {'linux': [native / 'moriv-image'],
             'windows': [WINE, 'run', PREFIX, ROOT / 'build' / 'win64' / 'moriv-image.exe']}
    make_inputs(work / 'in')
    (work / 'in' / 'libraries').symlink_to(libraries)
    for name in tools:
        (work / name).mkdir()
        (work / name / 'in').symlink_to('../in')
    # While a program runs Wine's server stays, and what is started beside it starts at once. A server of a
    # command's own would keep the pipes of its output open.
    waiting = subprocess.Popen([WINE, 'run', PREFIX, 'cmd', '/c', 'echo up & set /p wait='],
                               stdin=subprocess.PIPE, stdout=subprocess.PIPE)
    waiting.stdout.readline()
    try:
        return 1 if compare(tools, work) else 0
    finally:
        waiting.communicate()
        subprocess.run([WINE, 'stop', PREFIX], check=True)


if __name__ == '__main__':
    sys.exit(main(Path(sys.argv[1]).resolve()))
