"""The two worlds in which a scenario can be played: the stand-in machine, and Wine.

A world gives machines, one after the other or (the stand-in) several at once. A machine has a file
tree and a registry, starts programs and can be restarted.
"""

import contextlib
import errno
import fcntl
import os
import shutil
import subprocess
import time
from collections import namedtuple
from pathlib import Path

from file_tree import FileTree
from registry_text import Registry, Value

TIME_LIMIT = int(os.environ.get('MORIV_TIME_LIMIT', 60))  # seconds, for one program

# What a program did: its exit code (None when it ended without one), the lines that it showed, and
# what is wrong with the run itself, '' when nothing.
Outcome = namedtuple('Outcome', 'exit_code shown trouble')


class WorldError(Exception):
    """The world itself can't be had or broke down."""


class Machine:
    """What the machines of both worlds do alike."""

    def __init__(self, script):
        """script: file for what the user of the next run does."""
        self.script = script
        self.has_user = False

    def user(self, lines):
        """The script of the user of the next run."""
        self.script.write_text('\n'.join(lines) + '\n', encoding='utf-8')
        self.has_user = True

    def take_user(self):
        """Whether the run that begins now has a user; the one behind it has none."""
        had_user, self.has_user = self.has_user, False
        return had_user


class StandIn:
    name = 'stand-in'
    at_once = 2

    def __init__(self, native, work):
        """native: folder of the native build; work: folder for machines."""
        self.stub = native / 'MorivSetup'
        self.machine_tool = native / 'moriv-machine'
        self.work = work

    def missing(self):
        return ''

    def open(self):
        require(self.stub, self.machine_tool)
        self.fresh = self.work / 'fresh'
        shutil.rmtree(self.work, ignore_errors=True)
        self.work.mkdir(parents=True)
        _call([self.machine_tool, 'new', self.fresh])

    def close(self):
        pass

    def machine(self, name):
        folder = self.work / name
        shutil.copytree(self.fresh, folder)
        return StandInMachine(folder, self.machine_tool)


class StandInMachine(Machine):
    tells_requests = True  # what the program asks of the system is shown
    keeps_texts = True     # in the registry, with their NUL or without

    def __init__(self, folder, machine_tool):
        super().__init__(folder.with_suffix('.user'))
        self.folder = folder
        self.machine_tool = machine_tool
        self.files = FileTree(folder)

    def settings(self, lines):
        (self.folder / 'machine.ini').write_text('\n'.join(lines) + '\n', encoding='utf-8')

    def registry(self):
        text = (self.folder / 'registry.reg').read_bytes().decode('cp1252', 'replace')
        return Registry().apply(text.splitlines())

    def set_registry(self, registry):
        text = '\n'.join(['REGEDIT4', '', *registry.sections()])
        (self.folder / 'registry.reg').write_bytes(text.encode('cp1252'))

    def run(self, program, arguments):
        try:
            done = self._start([self.files.host(program), *([arguments] if arguments else [])])
        except subprocess.TimeoutExpired:
            return Outcome(None, [], f'ended after {TIME_LIMIT} seconds')
        except OSError as error:
            return Outcome(None, [], f'cannot start: {error}')
        code, shown = _split_exit_code(done.stdout.decode('utf-8', 'replace').splitlines())
        return Outcome(code, shown, _trouble(done, code))

    def add_drive(self, letter):
        """A drive exists when its folder does."""
        (self.folder / f'drive_{letter}').mkdir(exist_ok=True)

    def _start(self, command):
        """Another thread's child, before it has become a program of its own, can still hold the new
        file open for writing; then the system refuses to start it, and soon no more."""
        user = {'MORIV_USER': str(self.script)} if self.take_user() else {}
        environment = os.environ | {'MORIV_MACHINE': str(self.folder), 'LC_ALL': 'C.UTF-8'} | user
        for attempt in range(100):
            try:
                return subprocess.run(command, cwd=self.folder, env=environment,
                                      capture_output=True, timeout=TIME_LIMIT)
            except OSError as error:
                if error.errno != errno.ETXTBSY or attempt == 99:
                    raise
                time.sleep(0.02)

    def restart(self):
        _call([self.machine_tool, 'restart', self.folder])

    def keep(self):
        return f'\nthe machine is kept in {self.folder}'

    def discard(self):
        shutil.rmtree(self.folder)
        self.script.unlink(missing_ok=True)


def _split_exit_code(lines):
    """The exit code that the last line tells, None when it tells none, and the lines before it."""
    if lines and lines[-1].startswith('exit code: '):
        return int(lines[-1].removeprefix('exit code: ')), lines[:-1]
    return None, lines


def _trouble(done, code):
    """What is wrong beyond the exit code: anything on standard error, or a wrong exit status."""
    errors = done.stderr.decode('utf-8', 'replace').strip()
    if errors:
        return f'standard error (exit status {done.returncode}): {errors}'
    if code is not None and done.returncode != (0 if code in (0, 1) or code > 100000 else 1):
        return f'exit status {done.returncode} for exit code {code}'
    return ''


class Wine:
    at_once = 1

    # All that the program and the scenarios touch; the rest of Wine's registry is not looked at.
    WATCHED = (r'SOFTWARE\Zeb', r'SOFTWARE\Netscape',
               r'SOFTWARE\Classes\http\shell\open\command',
               r'SOFTWARE\Classes\htmlfile\shell\open\command',
               r'SOFTWARE\Microsoft\Windows\CurrentVersion\Uninstall',
               r'SOFTWARE\Microsoft\Windows\CurrentVersion\RunOnce',
               r'SOFTWARE\Microsoft\Windows\CurrentVersion\App Paths')

    def __init__(self, bits, build, tool, prefix):
        """bits: 32 or 64; build: folder of that Windows build; tool: tools/wine."""
        self.name = f'wine{bits}'
        self.bits = bits
        self.stub = build / 'MorivSetup.exe'
        self.agent_program = build / 'tests' / 'scenario_agent.exe'
        self.driver = build / 'tests' / 'dialog_driver.exe'
        self.tool = tool
        self.prefix = prefix
        self.agent = None

    def missing(self):
        """Why this host can't have the world; '' when it can."""
        answer = subprocess.run([self.tool, 'can-run', str(self.bits)],
                                capture_output=True, text=True)
        return '' if answer.returncode == 0 else answer.stdout.strip() or answer.stderr.strip()

    def open(self):
        require(self.stub, self.agent_program, self.driver)
        self.prefix.parent.mkdir(parents=True, exist_ok=True)
        # Two runs in one prefix would see each other's files; the second one waits.
        self.lock = open(f'{self.prefix}.in-use', 'w')
        fcntl.flock(self.lock, fcntl.LOCK_EX)
        _call([self.tool, 'prefix', self.prefix, str(self.bits)])
        self.files = FileTree(self.prefix)
        # A display of their own for all windows of the session.
        display = ['xvfb-run', '-a', '-s', '-screen 0 1024x768x24']
        self.agent = Agent([*display, self.tool, 'run', self.prefix, self.agent_program],
                           f'{self.prefix}.agent-log')
        self.clean_files()
        for key in self.WATCHED:
            self.agent.ask(f'delete {key}')
        # As on a fresh stand-in machine.
        for key in self.WATCHED[4:]:
            self.agent.ask(f'key {key}')

    def clean_files(self):
        """Takes away what an earlier scenario left; the first one finds the prefix as made."""
        listing = self.prefix / 'fresh-files'
        if not listing.exists():
            listing.write_text('\n'.join(self.files.snapshot()), encoding='utf-8')
        fresh = set(listing.read_text(encoding='utf-8').split('\n'))
        for path in sorted(self.files.snapshot().keys() - fresh):
            self.files.delete(path)
        for drive in self.prefix.glob('drive_[!c]'):
            drive.rmdir()
            (self.prefix / 'dosdevices' / f'{drive.name[-1]}:').unlink(missing_ok=True)

    def close(self):
        if self.agent:
            self.agent.close()
            _call([self.tool, 'stop', self.prefix])

    def machine(self, name):
        return WineMachine(self)


class WineMachine(Machine):
    tells_requests = False
    keeps_texts = False

    def __init__(self, world):
        super().__init__(Path(f'{world.prefix}.user'))
        self.world = world
        self.files = world.files
        self.agent = world.agent
        self.fresh_registry = self.registry()

    def registry(self):
        registry = Registry()
        for key in self.world.WATCHED:
            current = None
            for line in self.agent.ask(f'dump {key}'):
                kind, _, rest = line.partition(' ')
                if kind == 'key':
                    current = registry.make(rest)
                else:
                    _add_dumped_value(current, rest)
        return registry

    def set_registry(self, registry):
        for key in self.world.WATCHED:
            self.agent.ask(f'delete {key}')
        watched = tuple(key.lower() for key in self.world.WATCHED)
        for key in registry.keys.values():
            if not key.path.lower().startswith(watched):
                if any((w + '\\').startswith(key.path.lower() + '\\') for w in watched):
                    continue  # a parent that every machine has
                raise WorldError(f'not watched under Wine: {key.path}')
            self.agent.ask(f'key {key.path}')
            for value in key.values.values():
                name = value.name.encode('cp1252').hex() or '-'
                self.agent.ask(f'value {value.type} {name} {value.data.hex() or "-"}')

    def add_drive(self, letter):
        (self.world.prefix / f'drive_{letter}').mkdir(exist_ok=True)
        link = self.world.prefix / 'dosdevices' / f'{letter}:'
        if not link.is_symlink():
            link.symlink_to(f'../drive_{letter}')

    def run(self, program, arguments):
        """A user's script is played by tools/windows/dialog_driver.cpp, which writes what is shown."""
        if not self.take_user():
            code, rest = _split_exit_code(self.agent.ask(f'run {TIME_LIMIT} {program}\t{arguments}'))
            return Outcome(code, [], ' '.join(rest))
        shown = Path(f'{self.world.prefix}.shown')
        shown.write_bytes(b'')
        driver, script, output = (_windows_path(p) for p in (self.world.driver, self.script, shown))
        answer = self.agent.ask(f'run {TIME_LIMIT} {driver}\t{script} {output} "{program}" {arguments}')
        code, lines = _split_exit_code(shown.read_bytes().decode('utf-8', 'replace').splitlines())
        trouble = '' if code is not None else f'the driver gave no exit code: {" ".join(answer)}'
        return Outcome(code, lines, trouble)

    def restart(self):
        # Only what a start does with one-time commands; the session and the agent stay.
        _call([self.world.tool, 'run', self.world.prefix, 'wineboot', '-r'])

    def keep(self):
        self.discard()
        return ''

    def discard(self):
        self.world.clean_files()
        self.set_registry(self.fresh_registry)


def _windows_path(path):
    """Drive Z: of a prefix is the whole host."""
    return 'Z:' + str(Path(path).resolve()).replace('/', '\\')


def _add_dumped_value(key, text):
    kind, name, data = text.split(' ')
    name, data = (bytes.fromhex('' if part == '-' else part) for part in (name, data))
    name = name.decode('cp1252', 'replace')
    key.values[name.lower()] = Value(name, int(kind), data)


class Agent:
    """The helper program in a Wine session (tools/windows/scenario_agent.cpp)."""

    def __init__(self, command, error_log):
        self.error_log = error_log
        with open(error_log, 'wb') as errors:
            self.process = subprocess.Popen(command, stdin=subprocess.PIPE, stdout=subprocess.PIPE,
                                            stderr=errors)

    def ask(self, command):
        """Sends one command; gives the lines of its answer."""
        with contextlib.suppress(BrokenPipeError):  # the missing answer tells it below
            self.process.stdin.write(command.encode('cp1252') + b'\n')
            self.process.stdin.flush()
        lines = []
        for raw in self.process.stdout:
            line = raw.decode('cp1252', 'replace').rstrip('\r\n')
            if line == '.':
                return lines
            if line.startswith('failed: '):
                raise WorldError(f'{command}: {line}')
            lines.append(line)
        raise WorldError(f'the agent under Wine ended at "{command}"; see {self.error_log}')

    def close(self):
        self.process.stdin.close()
        self.process.wait(timeout=TIME_LIMIT)


def require(*products):
    for product in products:
        if not product.exists():
            raise WorldError(f'{product} is missing; run "make" first')


def _call(command):
    done = subprocess.run(command, capture_output=True, text=True, timeout=10 * TIME_LIMIT)
    if done.returncode != 0:
        raise WorldError(f'{command[0]}: {(done.stderr or done.stdout).strip()}')
