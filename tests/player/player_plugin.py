"""pytest's plugin for scenarios: each scenario is an item, played in the world of the session."""

from concurrent.futures import ThreadPoolExecutor
from pathlib import Path

import pytest

from package_image import Tools
from scenario_play import ScenarioFailure, play
from scenario_text import ScenarioError, parse
from worlds import BUILD, ROOT, WORLDS, NotOnThisHost, WorldError, make_world, require

SCENARIOS = ROOT / 'tests' / 'scenarios'
PROGRAMS = ROOT / 'tests' / 'player'


def pytest_addoption(parser):
    group = parser.getgroup('scenarios')
    group.addoption('--world', choices=WORLDS, default=WORLDS[0])
    group.addoption('--fail-fast', action='store_const', const=1, dest='maxfail',
                    help='end at the first failure')
    group.addoption('--accept', action='store_true',
                    help='print what a run does in the form of checks, where its checks do not hold')
    group.addoption('--native', type=Path, default=BUILD / 'native', help='the native build')
    group.addoption('--wine', type=Path, default=BUILD / 'wine', help='folder for Wine prefixes')


def pytest_configure(config):
    config.player = Player(config.option)
    names = config.option.file_or_dir or [str(SCENARIOS)]
    config.args = list(map(_path, [str(SCENARIOS), str(PROGRAMS)] if names == ['all'] else names))


def _path(name):
    """What pytest has to collect for a name of the command line."""
    if Path(name.partition('::')[0]).exists():
        return name
    file_name, bracket, _ = name.partition('[')
    found = [*SCENARIOS.rglob(f'{file_name}.scenario'), *PROGRAMS.glob(f'{file_name}_test.py'),
             *SCENARIOS.glob(f'{file_name}/')]
    if found:
        return f'{found[0]}::{name}' if bracket else str(found[0])
    raise pytest.UsageError(f'no scenario and no folder {name}')


def pytest_collect_file(file_path, parent):
    return ScenarioFile.from_parent(parent, path=file_path) if file_path.suffix == '.scenario' else None


class ScenarioFile(pytest.File):
    def collect(self):
        for scenario in parse(self.path.stem, self.path.read_text(encoding='utf-8'), self.path.name):
            item = ScenarioItem.from_parent(self, name=scenario.name)
            item.scenario = scenario
            yield item


class ScenarioItem(pytest.Item):
    outcome = None  # of a play that has begun beside others

    def runtest(self):
        player = self.config.player
        if not player.can_play(self.scenario):
            pytest.skip(f'only {self.scenario.only}: {self.scenario.reason}')
        if self.outcome:
            self.outcome.result()
        else:
            try:
                player.play(self.scenario)
            except NotOnThisHost as reason:
                pytest.skip(str(reason))

    def repr_failure(self, excinfo):
        if isinstance(excinfo.value, (ScenarioError, ScenarioFailure, WorldError)):
            return f'{self.scenario.title}\n{excinfo.value}'
        return super().repr_failure(excinfo)

    def reportinfo(self):
        return self.path, None, self.name


def pytest_collection_finish(session):
    """The world is had when all that it is for is known. Where several machines can be had at once,
    scenarios are played beside each other, in the order in which their outcomes are asked for."""
    player = session.config.player
    if session.config.option.collectonly or not session.items or session.testsfailed:
        return
    try:
        require(player.tools.image_tool)
        player.world.open()
    except WorldError as error:
        player.tell(error)
        pytest.exit(str(error), error.status)
    if player.world.at_once > 1:
        player.pool = ThreadPoolExecutor(player.world.at_once)
        for item in session.items:
            if isinstance(item, ScenarioItem) and player.can_play(item.scenario):
                item.outcome = player.pool.submit(player.play, item.scenario)


def pytest_sessionfinish(session):
    player = session.config.player
    if player.pool:
        player.pool.shutdown(cancel_futures=True)
    player.world.close()


def pytest_terminal_summary(terminalreporter, config):
    passed, failed, errors, skipped = (len(terminalreporter.stats.get(kind, [])) for kind in
                                       ('passed', 'failed', 'error', 'skipped'))
    config.player.tell(f'{passed} passed, {failed + errors} failed, {skipped} skipped')


@pytest.fixture(scope='session')
def player(request):
    return request.config.player


@pytest.fixture
def machine(player):
    """A fresh one under Wine, for what the stand-in can't do."""
    if player.world.name == 'stand-in':
        pytest.skip('only Wine: the stand-in starts no program of Windows')
    machine = player.world.machine('windows')
    yield machine
    machine.discard()


class Player:
    """One world, and what scenarios are played with in it."""

    def __init__(self, options):
        self.accept = options.accept
        self.work = options.native / 'scenarios'
        self.world = make_world(options.world, options.native, self.work / 'stand-in', options.wine)
        folders = {'sample': BUILD / 'win32' / 'samples', 'real': self.work / f'{options.world}-real'}
        self.tools = Tools(self.world.stub, options.native / 'moriv-image', folders,
                           BUILD / 'win64' / 'MorivSetup.exe')
        self.pool = None

    def tell(self, line):
        """Prints the closing line, and keeps it for tools/test, which tells all worlds' at its end."""
        line = f'scenarios: {self.world.name}: {line}'
        print(line)
        self.work.mkdir(parents=True, exist_ok=True)
        (self.work / f'scenarios.{self.world.name}.count').write_text(line + '\n')

    def can_play(self, scenario):
        return scenario.only in ('', *self.world.kinds)

    def play(self, scenario):
        """Raises what play() raises; the stand-in machine of a scenario that failed stays."""
        machine = self.world.machine(scenario.name)
        try:
            play(scenario, machine, self.tools, self.accept)
        except (ScenarioFailure, ScenarioError) as failure:
            raise type(failure)(f'{failure}{machine.keep()}') from failure
        machine.discard()
