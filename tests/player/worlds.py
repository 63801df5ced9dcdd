"""The worlds in which a scenario can be played: the stand-in machine, and two of Wine.

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
from datetime import datetime
from pathlib import Path

from file_tree import FileTree
from registry_text import Registry

ROOT = Path(__file__).resolve().parent.parent.parent
BUILD = ROOT / 'build'
WORLDS = ('stand-in', 'wine64', 'wow64')
LEFT_OUT = 77  # exit status that CTest reports as "Skipped"
READ_ONLY_DRIVE = 'R'
TIME_LIMIT = int(os.environ.get('MORIV_TIME_LIMIT', 60))  # seconds, for one program

# What a program did: its exit code (None when it ended without one), the lines that it showed, and
# what is wrong with the run itself, '' when nothing.
Outcome = namedtuple('Outcome', 'exit_code shown trouble')


class WorldError(Exception):
    """The world itself can't be had or broke down. status: what the session ends with."""

    def __init__(self, message, status=2):
        super().__init__(message)
        self.status = status


class NotOnThisHost(Exception):
    """Why a machine can't be as a scenario asks for."""


def make_world(name, native, work, wine=BUILD / 'wine'):
    """native: folder of the native build; work: folder for machines; wine: folder for Wine prefixes."""
    return StandIn(native, work) if name == 'stand-in' else {'wine64': Wine64, 'wow64': Wow64}[name](wine)


class Machine:
    """What all machines do alike. Has its files, and a script for the next run's user."""

    codepage = 'cp1252'
    now = None   # its own time, when it is set
    user = None  # what the user of the next run does, line by line; the run behind it has none

    def add_drive(self, letter):
        """What it needs beside its folder. READ_ONLY_DRIVE becomes a disk that programs can't write to."""

    def run(self, program, arguments, quoted=True):
        """quoted: the program's path stands in quotes in its command line."""
        user, self.user = self.user, None
        if user is not None:
            self.script.write_text('\n'.join(user) + '\n', encoding='utf-8')
        return self._run(program, arguments, quoted, user is not None)


class StandIn:
    name = 'stand-in'
    kinds = (name,)  # what scenarios for one kind of world call it
    at_once = 2

    def __init__(self, native, work):
        self.stub, self.tool = native / 'MorivSetup', native / 'moriv-machine'
        self.work = work.resolve()
        self.fresh = self.work / 'fresh'

    def open(self):
        require(self.stub, self.tool)
        shutil.rmtree(self.work, ignore_errors=True)
        self.work.mkdir(parents=True)
        _call(self.tool, 'new', self.fresh)

    def close(self):
        pass

    def machine(self, name):
        return StandInMachine(shutil.copytree(self.fresh, self.work / name), self.tool)


class StandInMachine(Machine):
    tells_requests = True  # what the program asks of the system is shown

    def __init__(self, folder, tool):
        self.folder, self.tool = folder, tool
        self.files, self.script = FileTree(folder), folder.with_suffix('.user')

    def settings(self, lines):
        (self.folder / 'machine.ini').write_text('\n'.join(lines) + '\n', encoding='utf-8')
        settings = dict(line.split(' = ', 1) for line in lines if ' = ' in line)
        self.codepage = f'cp{settings.get("codepage", 1252)}'
        self.now = datetime.fromisoformat(settings['now']) if 'now' in settings else None

    def add_drive(self, letter):
        if letter == READ_ONLY_DRIVE:
            (self.folder / 'machine.ini').write_text(f'[disk {letter}]\nreadonly = 1\n')

    def registry(self):
        text = (self.folder / 'registry.reg').read_bytes().decode(self.codepage, 'replace')
        return Registry(self.codepage).apply(text.splitlines())

    def set_registry(self, registry):
        (self.folder / 'registry.reg').write_bytes(registry.regedit4())

    def _run(self, program, arguments, quoted, has_user):
        command = [self.files.host(program), *([arguments] if arguments else [])]
        environment = os.environ | {'MORIV_MACHINE': str(self.folder), 'LC_ALL': 'C.UTF-8'}
        if has_user:
            environment['MORIV_USER'] = str(self.script)
        try:
            done = self._start(command, environment)
        except (subprocess.TimeoutExpired, OSError) as error:
            return Outcome(None, [], str(error))
        code, shown = _split_exit_code(done.stdout.decode('utf-8', 'replace').splitlines())
        errors = done.stderr.decode('utf-8', 'replace').strip()
        status = 0 if code in (None, 0, 1) or code > 100000 else 1
        if errors or code is not None and done.returncode != status:
            errors = f'exit status {done.returncode} for exit code {code}, standard error: {errors}'
        return Outcome(code, shown, errors)

    def _start(self, command, environment):
        """Another thread's child, before it has become a program of its own, can still hold the new
        file open for writing; then the system refuses to start it, and soon no more."""
        for attempt in range(100):
            try:
                return subprocess.run(command, cwd=self.folder, env=environment,
                                      capture_output=True, timeout=TIME_LIMIT)
            except OSError as error:
                if error.errno != errno.ETXTBSY or attempt == 99:
                    raise
                time.sleep(0.02)

    def restart(self):
        _call(self.tool, 'restart', self.folder)

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


class Wine:
    at_once = 1
    renamed = ()  # folders, as programs name them and as they lie in the prefix
    tool = ROOT / 'tools' / 'wine'

    # All that the program and the scenarios touch; the rest of Wine's registry is not looked at. The
    # last three are there on a fresh machine.
    WATCHED = [rf'SOFTWARE\{key}' for key in (
        'Zeb', 'Netscape', r'Classes\http\shell\open\command', r'Classes\htmlfile\shell\open\command',
        *(rf'Microsoft\Windows\CurrentVersion\{key}' for key in ('Uninstall', 'RunOnce', 'App Paths')))]

    def __init__(self, folder):
        self.kinds = ('Wine', self.name)
        self.prefix, build = folder / f'scenarios-{self.name}', BUILD / f'win{self.bits}'
        self.stub, self.driver = build / 'MorivSetup.exe', build / 'tests' / 'dialog_driver.exe'
        self.agent = None  # its process

    def open(self):
        answer = subprocess.run([self.tool, 'can-run', self.name], capture_output=True, text=True)
        if answer.returncode != 0:
            # Only what the host can't do and what was asked for is left out without a failure.
            asked_for = os.environ.get('MORIV_WINE') == 'none' or self.bits == 32
            raise WorldError(f'left out: {(answer.stdout or answer.stderr).strip()}',
                             LEFT_OUT if asked_for else 1)
        agent = self.driver.with_name('scenario_agent.exe')
        require(self.stub, agent, self.driver)
        self.prefix.parent.mkdir(parents=True, exist_ok=True)
        # Two runs in one prefix would see each other's files; the second one waits.
        self.lock = open(f'{self.prefix}.in-use', 'w')
        fcntl.flock(self.lock, fcntl.LOCK_EX)
        _call(self.tool, 'prefix', self.prefix, self.name)
        # A display of their own for all windows of the session.
        display = ['xvfb-run', '-a', '-s', '-screen 0 1024x768x24']
        read_only = self.prefix / f'drive_{READ_ONLY_DRIVE.lower()}'
        read_only.mkdir(exist_ok=True)
        # Root in a container can't mount, as a rule.
        self.can_mount = subprocess.run([self.tool.with_name('read-only'), read_only, 'true'],
                                        stderr=subprocess.DEVNULL).returncode == 0
        environment = {'MORIV_WINE_READ_ONLY': str(read_only)} if self.can_mount else {}
        with open(f'{self.prefix}.agent-log', 'wb') as errors:
            self.agent = subprocess.Popen([*display, self.tool, 'run', self.prefix, agent],
                                          stdin=subprocess.PIPE, stdout=subprocess.PIPE, stderr=errors,
                                          env=os.environ | environment)
        self.fresh_registry = Registry(terminates=True)
        for key in self.WATCHED[4:]:
            self.fresh_registry.make(key)
        WineMachine(self).discard()  # what an earlier session left

    def close(self):
        if self.agent:
            self.agent.stdin.close()
            self.agent.wait(timeout=TIME_LIMIT)
            _call(self.tool, 'stop', self.prefix)

    def machine(self, name):
        return WineMachine(self)

    def ask(self, command):
        """Sends one command to the agent in the session (tools/windows/scenario_agent.cpp); gives the
        lines of its answer."""
        with contextlib.suppress(BrokenPipeError):  # the missing answer tells it below
            self.agent.stdin.write(command.encode('cp1252') + b'\n')
            self.agent.stdin.flush()
        lines = []
        for raw in self.agent.stdout:
            line = raw.decode('cp1252', 'replace').rstrip('\r\n')
            if line == '.':
                return lines
            if line.startswith('failed: '):
                raise WorldError(f'{command}: {line}')
            lines.append(line)
        raise WorldError(f'the agent under Wine ended at "{command}"; see {self.prefix}.agent-log')


class Wine64(Wine):
    name, bits = 'wine64', 64
    views = (64,)


class Wow64(Wine):
    """The 32-bit program on a 64-bit Windows. The agent is a 32-bit program too, and sees the registry and
    the system directory as the program does."""

    name, bits = 'wow64', 32
    views = (64, 32)  # of the registry; the last one is the program's
    renamed = ((r'C:\windows\system32', r'C:\windows\syswow64'),
               (r'C:\windows\sysnative', r'C:\windows\system32'))


class WineMachine(Machine):
    tells_requests = False

    def __init__(self, world):
        self.world = world
        self.files, self.script = FileTree(world.prefix, world.renamed), Path(f'{world.prefix}.user')

    def registry(self):
        registry = Registry(terminates=True)
        for line in [line for key in self.world.WATCHED for line in self.world.ask(f'dump {key}')]:
            what, *words = line.split(' ')
            if what == 'key':
                key = registry.make(' '.join(words))
            else:
                name, data = (bytes.fromhex(text.strip('-')) for text in words[1:])
                registry.put(key, name.decode(self.codepage, 'replace'), int(words[0]), data)
        return registry

    def set_registry(self, registry):
        for key in self.world.WATCHED:
            self.world.ask(f'delete {key}')
        watched = [f'{key}\\'.lower() for key in self.world.WATCHED]
        for low, key in registry.keys.items():
            # In one of them, or a parent, which every machine has.
            if not any(f'{low}\\'.startswith(one) or one.startswith(f'{low}\\') for one in watched):
                raise WorldError(f'not watched under Wine: {key.path}')
            self.world.ask(f'key {key.path}')
            for name, kind, data in key.values.values():
                name = name.encode(self.codepage).hex()
                self.world.ask(f'value {kind} {name or "-"} {data.hex() or "-"}')

    def add_drive(self, letter):
        if letter == READ_ONLY_DRIVE and not self.world.can_mount:
            raise NotOnThisHost('this host lets nobody mount a read-only disk')
        drive = f'drive_{letter.lower()}'
        (self.world.prefix / drive).mkdir(exist_ok=True)
        link = self.world.prefix / 'dosdevices' / f'{letter.lower()}:'
        if not link.is_symlink():
            link.symlink_to(f'../{drive}')

    def _run(self, program, arguments, quoted, has_user):
        """A user's script is played by tools/windows/dialog_driver.cpp, which writes what is shown."""
        command_line = f'"{program}" {arguments}' if quoted else f'{program} {arguments}'
        if not has_user:
            code, rest = _split_exit_code(self._start(program, command_line))
            return Outcome(code, [], ' '.join(rest))
        shown = Path(f'{self.world.prefix}.shown')
        shown.write_bytes(b'')
        driver, script, output = (_windows_path(p) for p in (self.world.driver, self.script, shown))
        answer = self._start(driver, f'{driver} {script} {output} {command_line}')
        code, lines = _split_exit_code(shown.read_text(encoding='utf-8', errors='replace').splitlines())
        trouble = '' if code is not None else f'the driver gave no exit code: {" ".join(answer)}'
        return Outcome(code, lines, trouble)

    def _start(self, program, command_line):
        """A busy host refuses to start a program now and then, with an internal error."""
        for _ in range(3):
            answer = self.world.ask(f'run {TIME_LIMIT} {program}\t{command_line}')
            if answer != ['cannot start: 1359']:
                break
        return answer

    def restart(self):
        # Only what a start does with one-time commands; the session and the agent stay.
        _call(self.world.tool, 'run', self.world.prefix, 'wineboot', '-r')

    def keep(self):
        self.discard()
        return ''

    def discard(self):
        """Takes away what a scenario left; the first one finds the prefix as made."""
        listing = self.world.prefix / 'fresh-files'
        if not listing.exists():
            listing.write_text('\n'.join(self.files.snapshot()), encoding='utf-8')
        fresh = set(listing.read_text(encoding='utf-8').split('\n'))
        for path in sorted(self.files.snapshot().keys() - fresh):
            self.files.delete(path)
        for drive in self.world.prefix.glob('drive_[!c]'):
            if drive.name[-1] != READ_ONLY_DRIVE.lower():  # a mount of the agent's
                drive.rmdir()
            (self.world.prefix / 'dosdevices' / f'{drive.name[-1]}:').unlink(missing_ok=True)
        for view in self.world.views:
            self.world.ask(f'view {view}')
            self.set_registry(self.world.fresh_registry)


def _windows_path(path):
    """Drive Z: of a prefix is the whole host."""
    return 'Z:' + str(path.resolve()).replace('/', '\\')


def require(*products):
    for product in products:
        if not product.exists():
            raise WorldError(f'{product} is missing; run "make" first')


def _call(*command):
    done = subprocess.run(command, capture_output=True, text=True, timeout=10 * TIME_LIMIT)
    if done.returncode != 0:
        raise WorldError(f'{command[0]}: {(done.stderr or done.stdout).strip()}')
