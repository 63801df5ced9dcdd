#!/usr/bin/python3
"""Plays scenarios in one world: pytest with the plugin of tests/player/. README.md tells how.

    run_scenarios.py [--world stand-in|wine64|wow64] [--fail-fast] [--accept] [NAME...]

A NAME is a scenario's, a folder's, one of the programs of tests/player/, or "all" for scenarios and
programs; without any, the scenarios. --help lists pytest's options too.
"""

import sys
from pathlib import Path

import pytest

sys.dont_write_bytecode = True  # before the modules of the player
HERE = Path(__file__).resolve().parent
sys.path.insert(0, str(HERE.parent / 'player'))
OPTIONS = ['-p', 'player_plugin', '-p', 'no:cacheprovider', '--rootdir', str(HERE.parent),
           '-o', 'python_files=*_test.py', '-q', '--tb=short', '-rfEs']

if __name__ == '__main__':
    sys.exit(pytest.main([*OPTIONS, *sys.argv[1:]]))
