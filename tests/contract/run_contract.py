#!/usr/bin/python3
"""Runs the contract of the system, seam_contract, in one world: on a fresh stand-in machine, or in the
Wine prefix that the scenarios have. Prints what it prints. Exit status 0 when every case holds, every
function of the seam has one and can be named in a machine's faults; 1 otherwise; 77 when the host can't
have the world or MORIV_WINE=none leaves it out."""

import argparse
import os
import re
import sys
from pathlib import Path

HERE = Path(__file__).resolve().parent
sys.dont_write_bytecode = True
sys.path.insert(0, str(HERE.parent / 'player'))
os.environ.setdefault('MORIV_TIME_LIMIT', '240')  # before the world reads it

from worlds import BUILD, ROOT, WORLDS, WorldError, make_world  # noqa: E402

FOLDER = 'C:\\contract\\'
SHOWN = 'C:\\contract-shown.txt'


def main():
    parser = argparse.ArgumentParser(description=__doc__)
    parser.add_argument('world', choices=WORLDS)
    parser.add_argument('--native', type=Path, default=BUILD / 'native')
    options = parser.parse_args()
    if faults := faults_of_the_lists():
        print(faults)
        return 1
    world = make_world(options.world, options.native, options.native / 'contract-machines')
    try:
        world.open()
        outcome = run(world)
    except WorldError as error:
        print(f'{world.name}: {error}')
        return error.status
    finally:
        world.close()
    print(*outcome.shown, f'exit code: {outcome.exit_code} {outcome.trouble}', sep='\n')
    # The exit code alone is not believed.
    held = [line for line in outcome.shown if re.fullmatch(r'[1-9]\d* held, 0 failed', line)]
    return 0 if outcome.exit_code == 0 and not outcome.trouble and held else 1


def faults_of_the_lists():
    """Functions of the seam that have no case, or can't be named where a machine is told of faults."""
    def code(file):
        return re.sub(r'//.*', '', file.read_text())
    seam = set(re.findall(r'(\w+)\(', code(ROOT / 'src/platform/win32.h').split('extern "C" {')[1]))
    seam -= {'WinMain'}  # which the system calls
    cases = '\n'.join(map(code, HERE.glob('*_contract.cpp')))
    # Called, looked up by name, or called through a list of addresses.
    called = set(re.findall(r'\w+(?=\()|(?<=")\w+(?=")|(?<=&)\w+(?=[,}])', cases))
    named = set(re.findall(r'"(\w+)",', code(ROOT / 'machine/seam_functions.h')))
    told = {'no case calls': seam - called, 'machine/seam_functions.h is wrong about': seam ^ named}
    return '\n'.join(f'{what} {", ".join(sorted(names))}' for what, names in told.items() if names)


def run(world):
    """In a fresh C:\\contract. Under Wine only cmd.exe can keep what a program prints."""
    machine = world.machine('contract')
    program = world.stub.with_name('tests') / f'seam_contract{world.stub.suffix}'
    machine.files.write(FOLDER + 'seam_contract.exe', program.read_bytes())
    if world.name == 'stand-in':
        machine.user = (HERE / 'contract.user').read_text(encoding='utf-8').splitlines()
        outcome = machine.run(FOLDER + 'seam_contract.exe', '')
    else:
        outcome = machine.run(r'C:\windows\system32\cmd.exe',
                              f'/c {FOLDER}seam_contract.exe >{SHOWN}')
        shown = machine.files.read(SHOWN).decode('utf-8', 'replace').splitlines()
        outcome = outcome._replace(shown=shown)
    machine.discard()
    return outcome


if __name__ == '__main__':
    sys.exit(main())
