#!/usr/bin/python3
"""Holds the exit codes in the recipes of docs/deployment.md against the table of docs/exit-codes.md."""

import re
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
# These name each code of a run that left something secondary out.
NAMES_PARTIAL_CODES = ('cmd.exe', 'PowerShell', 'Intune', 'Configuration Manager')

given = {int(code) for code in GIVEN.findall((DOCS / 'exit-codes.md').read_text('utf-8'))}
parts = re.split(r'^## (.*)\n', (DOCS / 'deployment.md').read_text('utf-8'), flags=re.MULTILINE)
recipes = dict(zip(parts[1::2], parts[2::2]))
assert recipes.keys() == SUCCESS.keys(), recipes.keys()
for name, text in recipes.items():
    successes = re.findall(r'-?\d+', ' '.join(re.findall(SUCCESS[name], text)))
    assert set(successes) == {'1'}, f'{name}: success is {successes}'
    named = {int(code) for code in ANY_CODE.findall(text)}
    assert named <= given, f'{name}: no silent run gives {named - given}'
    partial = {code for code in given if code > 100000} if name in NAMES_PARTIAL_CODES else set()
    assert partial <= named, f'{name}: {partial - named} is not named'
print(f'{len(recipes)} recipes, {len(given)} codes of silent runs')
