#!/usr/bin/python3
"""Runs the contract of the system, seam_contract, in one world: on a fresh stand-in machine, or in the
Wine prefix that the scenarios have. Prints what it prints. Exit status 0 when every case holds, every
function of the seam has one and can be named in a machine's faults; 1 otherwise; 77 when the host can't
have the world or MORIV_WINE=none leaves it out."""

import argparse
import fcntl
import os
import re
import shutil
import subprocess
import sys
from pathlib import Path

HERE = Path(__file__).resolve().parent
ROOT = HERE.parent.parent
WINE = ROOT / 'tools' / 'wine'
LEFT_OUT = 77  # exit status that CTest reports as "Skipped"
TIME_LIMIT = 240  # seconds


def main():
    parser = argparse.ArgumentParser(description=__doc__)
    parser.add_argument('world', choices=['stand-in', 'wine64', 'wine32'])
    parser.add_argument('--native', type=Path, default=ROOT / 'build' / 'native')
    options = parser.parse_args()
    if faults := faults_of_the_lists():
        print(faults)
        return 1
    if options.world == 'stand-in':
        return run_native(options.native)
    return run_under_wine(options.world.removeprefix('wine'))


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


def run_native(build):
    machine = build / 'contract-machine'
    shutil.rmtree(machine, ignore_errors=True)
    program = place(build / 'tests' / 'seam_contract', machine)
    return judge([program], {'MORIV_MACHINE': machine, 'MORIV_USER': HERE / 'contract.user'})


def run_under_wine(bits):
    answer = subprocess.run([WINE, 'can-run', bits], capture_output=True, text=True)
    if answer.returncode != 0:
        print(f'wine{bits}: left out: {(answer.stdout or answer.stderr).strip()}')
        return LEFT_OUT if os.environ.get('MORIV_WINE') == 'none' or bits == '32' else 1
    prefix = ROOT / 'build' / 'wine' / f'scenarios{bits}'
    prefix.parent.mkdir(parents=True, exist_ok=True)
    with open(f'{prefix}.in-use', 'w') as lock:
        fcntl.flock(lock, fcntl.LOCK_EX)
        subprocess.run([WINE, 'prefix', prefix, bits], check=True)
        program = place(ROOT / 'build' / f'win{bits}' / 'tests' / 'seam_contract.exe', prefix)
        try:
            # Programs of the stand-in machine begin in C:\ too.
            return judge(['xvfb-run', '-a', '-s', '-screen 0 1024x768x24', WINE, 'run', prefix, 'cmd',
                          '/c', r'cd /d C:\ & C:\contract\seam_contract.exe'])
        finally:
            subprocess.run([WINE, 'stop', prefix], check=True)
            shutil.rmtree(program.parent)


def place(program, drives):
    """Puts the program into a fresh C:\\contract; gives its host path."""
    folder = drives / 'drive_c' / 'contract'
    shutil.rmtree(folder, ignore_errors=True)
    folder.mkdir(parents=True)
    return shutil.copy(program, folder / 'seam_contract.exe')


def judge(command, environment={}):
    """The exit status alone is not believed: the closing line has to be there too."""
    try:
        done = subprocess.run(command, env=os.environ | environment, stdout=subprocess.PIPE,
                              timeout=TIME_LIMIT)
        status, output = done.returncode, done.stdout
    except subprocess.TimeoutExpired as expired:
        status, output = f'none after {TIME_LIMIT} seconds', expired.stdout or b''
    shown = output.decode('utf-8', 'replace').replace('\r', '')
    print(shown, f'exit status: {status}', sep='', flush=True)
    return 0 if status == 0 and re.search(r'^[1-9]\d* held, 0 failed$', shown, re.M) else 1


if __name__ == '__main__':
    sys.exit(main())
