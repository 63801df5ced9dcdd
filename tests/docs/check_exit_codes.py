#!/usr/bin/python3
"""Holds every exit code that the documents give to scripts and fleet tools against core/status.h."""

import re
import sys
from pathlib import Path

ROOT = Path(__file__).resolve().parent.parent.parent
STATUS = re.compile(r'inline constexpr StatusCode (Status\w+) = (-?\d+);')
TABLE_ROW = re.compile(r'\| (-?\d+) \| (\d+) \| (0x[0-9A-F]{8}) \| `(Status\w+)` \| [^|]+ \| ([^|]+) \|')
ANY_CODE = re.compile(r'(?<![\w.])-?100\d{3,4}(?!\w)')

# How each recipe says which codes are a success: all that it says must be found by this.
SUCCESS = {
    'cmd.exe': r'%ERRORLEVEL%==(-?\d+) exit /b 0',
    'PowerShell': r'\$success = @\(([^)]*)\)',
    'winget': r'InstallerSuccessCodes:\n((?:\s*- -?\d+\n)+)',
    'Chocolatey': r'-ValidExitCodes @\(([^)]*)\)',
    'Ansible': r'expected_return_code: \[([^\]]*)\]',
    'Intune': r'\| (-?\d+) \| Success',
    'Configuration Manager': r'\| (-?\d+) \| Success',
}
# What a recipe takes for a failure, where it has a list of those: any code that a silent run gives.
NAMES_PARTIAL_CODES = ('cmd.exe', 'PowerShell', 'Intune', 'Configuration Manager')


def read(path):
    return (ROOT / path).read_text(encoding='utf-8')


def check_table(statuses):
    """Troubles of the table of all codes, and the codes that a silent run gives by it."""
    troubles, given, seen = [], set(), set()
    for signed, unsigned, hexadecimal, name, silent in TABLE_ROW.findall(read('docs/exit-codes.md')):
        code = int(signed)
        seen.add(name)
        if statuses.get(name) != code:
            troubles.append(f'exit-codes.md: {name} is {statuses.get(name)}, not {code}')
        if int(unsigned) != code % 2**32 or int(hexadecimal, 16) != code % 2**32:
            troubles.append(f'exit-codes.md: {code} is not {unsigned}, or not {hexadecimal}')
        if not silent.startswith('Never'):
            given.add(code)
    troubles += [f'exit-codes.md lacks {name}' for name in sorted(statuses.keys() - seen)]
    return troubles, given


def sections(text):
    """The text under each heading of the second level."""
    parts = re.split(r'^## (.*)\n', text, flags=re.MULTILINE)
    return dict(zip(parts[1::2], parts[2::2]))


def check_recipe(name, text, given):
    troubles = []
    successes = re.findall(SUCCESS[name], text)
    codes = {int(code) for success in successes for code in re.findall(r'-?\d+', success)}
    if codes != {1}:
        troubles.append(f'{name}: success is {sorted(codes)}, not 1')
    named = {int(code) for code in ANY_CODE.findall(text)}
    troubles += [f'{name}: no silent run gives {code}' for code in sorted(named - given)]
    partial = {code for code in given if code > 100000}
    if name in NAMES_PARTIAL_CODES and not partial <= named:
        troubles.append(f'{name}: {sorted(partial - named)} is not named')
    return troubles


def main():
    statuses = {name: int(code) for name, code in STATUS.findall(read('src/core/status.h'))}
    troubles, given = check_table(statuses)
    recipes = sections(read('docs/deployment.md'))
    if recipes.keys() != SUCCESS.keys():
        troubles.append(f'deployment.md: recipes for {sorted(recipes)}, checked {sorted(SUCCESS)}')
    for name in recipes.keys() & SUCCESS.keys():
        troubles += check_recipe(name, recipes[name], given)
    print('\n'.join(troubles) or f'{len(recipes)} recipes, {len(statuses)} codes')
    return 1 if troubles else 0


if __name__ == '__main__':
    sys.exit(main())
