#!/usr/bin/python3
"""Plays the scenarios of this folder in one world and tells which hold (README.md)."""

import argparse
import os
import shutil
import sys
from concurrent.futures import ThreadPoolExecutor
from pathlib import Path

sys.dont_write_bytecode = True  # before the modules of this folder
import real_input
from scenario_play import ScenarioFailure, play
from scenario_text import ScenarioError, parse
from worlds import StandIn, Wine, WorldError, require

HERE = Path(__file__).resolve().parent
ROOT = HERE.parent.parent
LEFT_OUT = 77  # exit status that CTest reports as "Skipped"


class Tools:
    """What a scenario's images are made with."""

    def __init__(self, stub, image_tool, samples, real_files):
        self.stub, self.image_tool = stub, image_tool
        self.folders = {'sample': samples, 'real': real_files}

    def content(self, kind, name):
        """A file of the sample programs or of the real input; None for no such kind."""
        return (self.folders[kind] / name).read_bytes() if kind in self.folders else None


def main():
    options = read_options()

    def tell(line):
        """Prints the closing line, and keeps it for tools/test, which tells all worlds' at its end."""
        print(line, flush=True)
        kind = 'real-input' if options.real_input else 'scenarios'
        options.work.mkdir(parents=True, exist_ok=True)
        (options.work / f'{kind}.{options.world}.count').write_text(f'{kind}: {line}\n')

    def play_all(world, tools, images):
        return run_all(world, choose_scenarios(options, tools), tools, images, options.fail_fast)

    return in_world(options, play_all, tell)


def in_world(options, check, tell=print):
    """An exit status. check(world, tools, images) gives the number of failures and the closing line, which
    is told behind the world's name; images is a folder for the sources of images."""
    world = make_world(options)
    if reason := world.missing() or (options.real_input and real_input.missing()):
        tell(f'{world.name}: left out: {reason}')
        # Only what the host can't do and what was asked for is left out without a failure.
        asked_for = os.environ.get('MORIV_WINE') == 'none' or options.world == 'wine32'
        return LEFT_OUT if asked_for else 1
    tools = Tools(world.stub, options.native / 'moriv-image', options.win32 / 'samples',
                  options.work / 'real-input')
    images = options.work / f'{world.name}-images'
    try:
        require(tools.image_tool)
        world.open()
        shutil.rmtree(images, ignore_errors=True)
        failures, line = check(world, tools, images)
    except (ScenarioError, WorldError) as error:
        print(error, file=sys.stderr)
        return 2
    finally:
        world.close()
    tell(f'{world.name}: {line}')
    return 1 if failures else 0


def make_world(options):
    if options.world == 'stand-in':
        return StandIn(options.native, options.work / 'stand-in')
    bits = int(options.world[len('wine'):])
    return Wine(bits, getattr(options, f'win{bits}'), ROOT / 'tools' / 'wine',
                options.wine / f'scenarios{bits}')


def read_options():
    parser = argparse.ArgumentParser(description=__doc__)
    parser.add_argument('names', nargs='*', metavar='NAME', help='scenarios to play; without, all')
    parser.add_argument('--world', choices=['stand-in', 'wine64', 'wine32'], default='stand-in')
    parser.add_argument('--fail-fast', action='store_true', help='end at the first failure')
    parser.add_argument('--real-input', action='store_true',
                        help='play one large scenario of real programs instead of the files')
    for build in ('native', 'win32', 'win64'):
        parser.add_argument(f'--{build}', type=Path, default=ROOT / 'build' / build,
                            help=f'folder of the {build} build')
    parser.add_argument('--work', type=Path, default=ROOT / 'build' / 'scenarios',
                        help='folder for machines and images')
    parser.add_argument('--wine', type=Path, default=ROOT / 'build' / 'wine',
                        help='folder for Wine prefixes')
    return parser.parse_args()


def choose_scenarios(options, tools):
    if options.real_input:
        return [real_input.scenario(tools.folders['real'])]
    files = sorted(HERE.glob('*.scenario'))
    if options.names:
        known = {file.stem: file for file in files}
        if unknown := [name for name in options.names if name not in known]:
            raise ScenarioError(f'no scenario {unknown[0]}')
        files = [known[name] for name in options.names]
    return [parse(file.stem, file.read_text(encoding='utf-8'), file.name) for file in files]


def run_all(world, scenarios, tools, images, fail_fast):
    """Prints one line a scenario; gives the number of failures and the counts."""
    mine = [s for s in scenarios if not s.only or world.name.lower().startswith(s.only.lower())]
    failures = 0
    with ThreadPoolExecutor(world.at_once) as pool:
        for report in pool.map(lambda s: run_one(world, s, tools, images), mine):
            print(report, flush=True)
            failures += not report.startswith('ok ')
            if failures and fail_fast:
                pool.shutdown(cancel_futures=True)
                break
    for scenario in scenarios:
        if scenario not in mine:
            print(f'skipped {scenario.name}: only {scenario.only}: {scenario.reason}')
    skipped = len(scenarios) - len(mine)
    return failures, f'{len(mine) - failures} passed, {failures} failed, {skipped} skipped'


def run_one(world, scenario, tools, images):
    """'ok NAME', or 'FAILED NAME' and why; a stand-in machine that failed stays."""
    machine = world.machine(scenario.name)
    try:
        play(scenario, machine, tools, images / scenario.name)
    except (ScenarioFailure, ScenarioError) as failure:
        return f'FAILED {scenario.name}: {scenario.title}\n{failure}{machine.keep()}'
    machine.discard()
    shutil.rmtree(images / scenario.name, ignore_errors=True)
    return f'ok {scenario.name}'


if __name__ == '__main__':
    sys.exit(main())
