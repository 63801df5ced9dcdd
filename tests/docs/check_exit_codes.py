#!/usr/bin/python3
"""Holds the exit codes in the recipes of docs/deployment.md against the table of docs/exit-codes.md."""

import re
import sys
from pathlib import Path

DOCS = Path(__file__).resolve().parent.parent.parent / 'docs'
# What a silent run gives, by the last column.
GIVEN = re.compile(r'^\| (-?\d+) \|(?!.*\| Never[^|]*\|$).*\|$', re.MULTILINE)
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


def check_recipe(name, text, given):
    successes = re.findall(SUCCESS[name], text)
    codes = {int(code) for success in successes for code in re.findall(r'-?\d+', success)}
    if codes != {1}:
        yield f'success is {sorted(codes)}, not 1'
    named = {int(code) for code in ANY_CODE.findall(text)}
    if named - given:
        yield f'no silent run gives {sorted(named - given)}'
    partial = {code for code in given if code > 100000}
    if name in NAMES_PARTIAL_CODES and not partial <= named:
        yield f'{sorted(partial - named)} is not named'


def main():
    given = {int(code) for code in GIVEN.findall((DOCS / 'exit-codes.md').read_text('utf-8'))}
    parts = re.split(r'^## (.*)\n', (DOCS / 'deployment.md').read_text('utf-8'), flags=re.MULTILINE)
    recipes = dict(zip(parts[1::2], parts[2::2]))
    troubles = [f'{name}: {trouble}' for name in recipes.keys() & SUCCESS.keys()
                for trouble in check_recipe(name, recipes[name], given)]
    if recipes.keys() != SUCCESS.keys():
        troubles.append(f'deployment.md: recipes for {sorted(recipes)}, checked {sorted(SUCCESS)}')
    print('\n'.join(troubles) or f'{len(recipes)} recipes, {len(given)} codes of silent runs')
    return 1 if troubles else 0


if __name__ == '__main__':
    sys.exit(main())
