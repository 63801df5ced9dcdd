#!/usr/bin/env python3
"""Checks that every transition of the dialog names a scenario that goes through it."""

import re
import sys
from pathlib import Path

TRANSITION = re.compile('[^;]+; [^;]+(; [^;]+)? -> [^;]+')
HERE = Path(__file__).resolve().parent


def main():
    lines = (HERE / 'transitions.txt').read_text(encoding='utf-8').splitlines()
    rows = [line for line in lines if line and not line.startswith('#')]
    troubles = []
    for row in rows:
        transition, _, names = row.partition(': ')
        if rows.count(row) > 1 or not TRANSITION.fullmatch(transition):
            troubles.append(f'{transition}: stands twice, or not as FROM; EVENT; CONDITION -> TO')
        if not names.split():
            troubles.append(f'{transition}: no scenario')
        troubles += [f'{transition}: there is no scenario {name}' for name in names.split()
                     if not (HERE / f'{name}.scenario').exists()]
    if not rows:
        troubles.append('nothing to check')
    print('\n'.join(troubles) or f'{len(rows)} transitions, each with its scenario')
    return 1 if troubles else 0


if __name__ == '__main__':
    sys.exit(main())
