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
    world = make_world(options)
    reason = world.missing() or (real_input.missing() if options.real_input else '')
    if reason:
        tell(options, world, f'{world.name}: left out: {reason}')
        return status_without_world(options)
    tools, images = make_tools(options, world)
    try:
        require(tools.image_tool)
        scenarios = choose_scenarios(options, tools)
        failures, counts = run_all(world, scenarios, tools, images)
        tell(options, world, counts)
    except (ScenarioError, WorldError) as error:
        print(error, file=sys.stderr)
        return 2
    return 1 if failures else 0


def status_without_world(options):
    """Only what the host can't do and what was asked for is left out without a failure."""
    asked_for = os.environ.get('MORIV_WINE') == 'none'
    return LEFT_OUT if asked_for or options.world == 'wine32' else 1


def tell(options, world, line):
    """Prints the closing line, and keeps it in a file for tools/test, which tells all worlds' at its
    end."""
    print(line, flush=True)
    kind = 'real-input' if options.real_input else 'scenarios'
    options.work.mkdir(parents=True, exist_ok=True)
    (options.work / f'{kind}.{world.name}.count').write_text(f'{kind}: {line}\n')


def make_world(options):
    if options.world == 'stand-in':
        return StandIn(options.native, options.work / 'stand-in')
    bits = int(options.world[len('wine'):])
    return Wine(bits, getattr(options, f'win{bits}'), ROOT / 'tools' / 'wine',
                options.wine / f'scenarios{bits}')


def make_tools(options, world):
    """What images are made with, and the folder for their sources."""
    tools = Tools(world.stub, options.native / 'moriv-image', options.win32 / 'samples',
                  options.work / 'real-input')
    return tools, options.work / f'{world.name}-images'


def read_options():
    parser = argparse.ArgumentParser(description=__doc__)
    parser.add_argument('names', nargs='*', metavar='NAME', help='scenarios to play; without, all')
    parser.add_argument('--world', choices=['stand-in', 'wine64', 'wine32'], default='stand-in')
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
        for name in options.names:
            if name not in known:
                raise ScenarioError(f'no scenario {name}')
        files = [known[name] for name in options.names]
    return [parse(file.stem, file.read_text(encoding='utf-8'), file.name) for file in files]


def run_all(world, scenarios, tools, images):
    """Prints one line a scenario; gives the number of failures and the closing line."""
    mine = [s for s in scenarios if not s.only or world.name.lower().startswith(s.only.lower())]
    shutil.rmtree(images, ignore_errors=True)
    failures = 0
    try:
        world.open()
        with ThreadPoolExecutor(world.at_once) as pool:
            for report in pool.map(lambda s: run_one(world, s, tools, images), mine):
                print(report, flush=True)
                failures += not report.startswith('ok ')
    finally:
        world.close()
    for scenario in scenarios:
        if scenario not in mine:
            print(f'skipped {scenario.name}: only {scenario.only}: {scenario.reason}')
    skipped = len(scenarios) - len(mine)
    counts = f'{len(mine) - failures} passed, {failures} failed, {skipped} skipped'
    return failures, f'{world.name}: {counts}'


def run_one(world, scenario, tools, images):
    """'ok NAME', or 'FAILED NAME' and why; the machine of a failure stays."""
    machine = world.machine(scenario.name)
    try:
        play(scenario, machine, tools, images / scenario.name)
    except (ScenarioFailure, ScenarioError) as failure:
        where = getattr(machine, 'folder', None)
        kept = f'\nthe machine is kept in {where}' if where else ''
        if not where:
            machine.discard()
        return f'FAILED {scenario.name}: {scenario.title}\n{failure}{kept}'
    machine.discard()
    shutil.rmtree(images / scenario.name, ignore_errors=True)
    return f'ok {scenario.name}'


if __name__ == '__main__':
    sys.exit(main())
