#!/usr/bin/python3
"""Checks the runner itself: a scenario that says something wrong has to fail.

Takes scenarios that hold, changes one thing at a time in what they say, and plays the result on a
stand-in machine.
"""

import sys

sys.dont_write_bytecode = True  # before the modules of this folder
from run_scenarios import HERE, in_world, read_options, run_one
from scenario_text import ScenarioError, parse

# Scenario, what stands there, and what is said instead.
FALSEHOODS = [
    ('fresh_silent_install', 'exit 1', 'exit 100004'),
    ('fresh_silent_install', '|2- File', '|3- File'),
    ('fresh_silent_install', 'registry |', 'registry|'),
    ('fresh_silent_install', '  + C:\\Program Files\\Moriv\\\n', ''),
    ('fresh_silent_install', 'zebnet.dll = original zebnet.dll\n', 'zebnet.dl = ""\n'),
    ('fresh_silent_install', '+ C:\\windows\\MorivRmv', '~ C:\\windows\\MorivRmv'),
    ('fresh_silent_install', 'original zebddb.exe', 'original zebdial.exe'),
    ('fresh_silent_install', 'in French', 'in German'),
    ('fresh_silent_install', '"Language"="FR"', '"Language"="DE"'),
    ('fresh_silent_install', '  + [SOFTWARE\\Zeb\\Moriv\\Services]\n', ''),
    ('fresh_silent_install', '"DisplayName"="ZEB', '"displayname"="ZEB'),
    ('install_over_an_install', '  - "Language"="FR"\n', ''),
    ('removal_by_the_removal_program', '|RemoveFiles = 10|', '|RemoveFiles=10|'),
    ('removal_by_the_removal_program', '|RemoveFiles = 10|', '|RemoveFiles = 10|\n  ||'),
    ('removal_by_the_removal_program', '  - [SOFTWARE\\Zeb\\Moriv]\n', ''),
    ('restart_after_a_removal', '  - C:\\windows\\Moriv.INF\n', ''),
    ('report_file_is_appended_to', '  heading\n  |1- File', '  |1- File'),
    ('run_without_events_leaves_the_log', 'exit -1000005', 'exit -1000005\nlog'),
    ('services_block_a_removal', '[-SOFTWARE\\Zeb\\Moriv\\Services\\x]', ''),
    ('log_heading_to_the_letter', 'Saturday', 'saturday'),
    ('help_box', '  |   "/h ou /?"   Aide|\n', ''),
    ('power_lost_in_an_install', 'exit none', 'exit 1'),
    ('power_lost_in_an_install', 'first 1024', 'first 1023'),
]

# Texts that are no scenario.
MALFORMED = [
    'exit 1\n',
    'given files\n  C:\\a = "x"\n',
    'given machine\nrun C:\\Setup.exe\nexit 1\n',
    'only stand-in:\nrun C:\\Setup.exe\nexit 1\n',
    'run C:\\Setup.exe\nexit 1\nonly stand-in: too late\n',
    'run C:\\Setup.exe\nexit 1\nlog\n  no bars\n',
    'run C:\\Setup.exe\nexit 1\nfile\n',
]


def check(world, tools, images):
    faults = [f'taken for a scenario: {text!r}' for text in MALFORMED if is_scenario(text)]
    for number, (name, truth, falsehood) in enumerate(FALSEHOODS):
        text = (HERE / f'{name}.scenario').read_text(encoding='utf-8')
        if truth not in text:
            faults.append(f'{name} does not say: {truth!r}')
            continue
        changed = parse(f'{number}-{name}', text.replace(truth, falsehood, 1), name)
        if not run_one(world, changed, tools, images).startswith('FAILED '):
            faults.append(f'{name} holds with {falsehood!r} for {truth!r}')
    found = f'{len(FALSEHOODS)} falsehoods and {len(MALFORMED)} bad texts found'
    return len(faults), '\n'.join(faults) or found


def is_scenario(text):
    try:
        parse('text', text, 'text')
    except ScenarioError:
        return False
    return True


if __name__ == '__main__':
    sys.exit(in_world(read_options(), check))
