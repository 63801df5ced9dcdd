#!/usr/bin/python3
"""Has moriv-image explain the log of every silent run of the scenarios, and holds the exit codes that
it names against the run's own."""

import subprocess
import sys
from pathlib import Path

sys.dont_write_bytecode = True  # before the modules of this folder
from scenario_text import parse

HERE = Path(__file__).resolve().parent
HEADING = '\r\n\r\nInstalling Moriv : Tuesday, 03 February 2026 at : 04h 05m 06s \r\n\r\n'


def silent_runs(scenario):
    """The exit code and the log's lines of each run that has both and no user."""
    has_user = False
    for section in scenario.sections:
        checks = {check.keyword: check for check in section.checks}
        if 'log' in checks and not has_user and section.keyword == 'run':
            lines = [line[1:-1] for line in checks['log'].body if line.startswith('|')]
            yield checks['exit'].argument, lines
        has_user = section.keyword == 'given user' or (has_user and section.keyword != 'run')


def explained_codes(tool, log):
    done = subprocess.run([tool, 'explain', log], capture_output=True, text=True, check=True)
    return [line.split()[2] for line in done.stdout.splitlines() if line.startswith('exit code')]


def main():
    tool, log = (Path(argument) for argument in sys.argv[1:])
    troubles, seen = [], set()
    for file in sorted(HERE.glob('*.scenario')):
        scenario = parse(file.stem, file.read_text(encoding='utf-8'), file.name)
        for code, lines in silent_runs(scenario):
            text = HEADING + '\r\n'.join(lines) + '\r\n'
            log.write_bytes(text.encode('cp1252'))
            codes = explained_codes(tool, log)
            seen.add(code)
            if code not in codes:
                troubles.append(f'{file.name}: exit code {code}, explained as {" ".join(codes)}')
    log.unlink()
    if len(seen) < 10:
        troubles.append(f'only {len(seen)} different exit codes seen')
    print('\n'.join(troubles) or f'logs of {len(seen)} different exit codes are explained')
    return 1 if troubles else 0


if __name__ == '__main__':
    sys.exit(main())
