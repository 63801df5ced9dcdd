"""Plays one scenario on one machine: prepares it, starts what the scenario starts, and compares what the
scenario says with what was done, both as checks in full: lines by what they check."""

import contextlib
import difflib
import re
import struct
from datetime import datetime

import file_tree
import log_text
import named_pages
import planned_runs
import registry_text
from good_runs import LANGUAGES, Before, checks_of
from package_image import Image, PackedImage, damage, file_content, quoted_bytes
from scenario_text import ACTIONS, DEFAULT_IMAGE, LOG, WORDS, ScenarioError, Section
from worlds import Outcome

# What the program asks of the system; only the stand-in machine tells of it.
REQUESTS = ('|font ', '|drawn ', '|beep ', '|open ', '|start ')

# What a removal leaves for the system's INF installer; one scenario has it line by line.
INF_FILE = '\r\n'.join([
    '[Version]', 'Signature=$Chicago$', 'AdvancedINF=2.0', '',
    '[Uninstall]', 'DelFiles=RemoveFiles', '',
    '[RemoveFiles]', 'MorivRmv.exe', 'MorivLog.txt', 'Moriv.INF', '',
    '[DestinationDirs]', 'RemoveFiles = 10', '']).encode('ascii')


class ScenarioFailure(Exception):
    """What a scenario says and what there was differ; the message has both, several lines long."""


def play(scenario, machine, tools, accept=False):
    """Raises ScenarioFailure, or ScenarioError for a scenario that can't be carried out. accept: the
    failure tells for each action that did not hold the checks that do, and all actions are played."""
    player = _Player(machine, tools, accept)
    sections, failures = scenario.sections, []
    if not any(section.keyword == 'given image' for section in sections):
        sections = [Section('given image', '', '', [], []), *sections]
    for section in sections:
        try:
            if section.keyword not in ACTIONS:
                getattr(player, section.keyword.replace(' ', '_'))(section)
            elif report := player.act(section):
                title = f'{section.place}: {section.keyword} {section.argument}'
                failures.append('\n'.join([title, *report]))
        except (ValueError, KeyError, OSError, IndexError, struct.error) as error:
            raise ScenarioError(f'{section.place}: {type(error).__name__}: {error}') from error
        if failures and not accept:
            break
    if failures:
        raise ScenarioFailure('\n'.join(failures))


class _Player:
    def __init__(self, machine, tools, accept):
        self.machine, self.tools, self.accept = machine, tools, accept
        self.packed = {}  # PackedImage by path
        self.last_image = DEFAULT_IMAGE  # that has run
        self.times = []  # of each run: before and after it

    # Preparations, by the section's keyword

    def given_machine(self, section):
        self.machine.settings(section.body)

    def given_user(self, section):
        self.machine.user = section.body

    def given_files(self, section):
        for line in section.body:
            path, _, content = line.partition(' = ')
            words = content.removesuffix(' read-only')
            if path.startswith('- '):
                self.machine.files.delete(path[2:])
            elif path.endswith('\\'):
                self.machine.add_drive(path[0])
                self.machine.files.host(path).mkdir(parents=True, exist_ok=True)
            else:
                self._write(path, file_content(words, path, self.tools), read_only=words != content)

    def given_registry(self, section):
        self.machine.set_registry(self.machine.registry().apply(section.body))

    def given_image(self, section):
        """Without a path: the image that every scenario has, with other options and more files."""
        path = section.argument or DEFAULT_IMAGE
        self.packed[path] = PackedImage(self.tools, section.body, usual=not section.argument)
        self._write(path, self.packed[path].bytes)

    def given_run(self, section):
        """A run that other scenarios look at closely; here it has to succeed, no more."""
        outcome = self._run(section)
        if outcome.exit_code != 1 or outcome.trouble:
            raise ScenarioFailure(f'{section.place}: a given run ends with {outcome.exit_code} '
                                  f'{outcome.trouble}')

    def damage(self, section):
        path = section.argument or DEFAULT_IMAGE
        for line in section.body:
            self.packed[path].bytes = damage(self.packed[path].bytes, line)
        self._write(path, self.packed[path].bytes)

    def _write(self, path, content, read_only=False):
        self.machine.add_drive(path[0])
        self.machine.files.write(path, content, read_only)

    # Actions

    def act(self, section):
        """What does not hold, line by line; or, to accept, the checks that do."""
        files, registry = self.machine.files.snapshot(), self.machine.registry()
        dialog = self.machine.user is not None
        plan = None
        if section.keyword == 'run':
            program, arguments, _ = _command(section.argument)
            if arguments and not dialog and self.machine.tells_requests:
                plan = planned_runs.ask(self.tools.image_tool, self.machine, program, arguments)
            outcome = self._run(section)
        else:
            self.machine.restart()
            outcome = Outcome(1, [], '')
        packed = self.packed.get(self.last_image)
        before = Before(files, registry, packed.files if packed else [], dialog)
        said = self._said(section, before)
        done = self._done(outcome, before, said)
        report = [outcome.trouble] if outcome.trouble else []
        report += [line for what in said | done for line in
                   _difference(what, said.get(what, []), done.get(what, []))]
        if plan:
            report += planned_runs.disagreements(plan, self.machine, outcome, files, registry)
        if section.keyword == 'run' and 'log' in done and not dialog:
            log = self.machine.files.host(LOG)
            report += log_text.misunderstood(self.tools.image_tool, log, outcome.exit_code)
        return _as_checks(done, before) if report and self.accept else report

    def _run(self, section):
        program, arguments, quoted = _command(section.argument)
        if program in self.packed:
            self.last_image = program
        begun = datetime.now().replace(microsecond=0)  # a heading has whole seconds
        outcome = self.machine.run(program, arguments, quoted)
        self.times.append((self.machine.now or begun, self.machine.now or datetime.now()))
        return outcome

    def _said(self, action, before):
        said = {'exit': ['1']}
        for check in sorted(action.checks, key=lambda check: check.keyword in WORDS):
            lines = [check.argument] if check.keyword == 'exit' else check.body
            if check.keyword == 'log' and lines:
                lines = ['heading', *lines]
            elif check.keyword == 'shown':
                lines = [line for line in named_pages.without_words(lines)
                         if self.machine.tells_requests or not line.startswith(REQUESTS)]
            if check.keyword in WORDS:  # behind all others
                _say_words(said, f'{check.keyword} {check.argument}', before)
            else:
                said[check.subject] = log_text.without_words(lines)
        if before.registry.terminates:
            said['registry'] = [line.removesuffix(registry_text.UNTERMINATED)
                                for line in said.get('registry', [])]
        said['files'] = sorted(said.get('files', []))
        return said

    def _done(self, outcome, before, said):
        """said: tells which texts are of interest, and words for the contents of files."""
        done = {'exit': ['none' if outcome.exit_code is None else str(outcome.exit_code)],
                'shown': [f'|{line}|' for line in outcome.shown]}
        signs = file_tree.changes(before.files, self.machine.files.snapshot())
        for what in ('log', *(what for what in said if what.startswith('text '))):
            path = LOG if what == 'log' else what.removeprefix('text ')
            if signs.get(path, '-') != '-':
                del signs[path]
                text = self.machine.files.read(path).decode(self.machine.codepage, 'replace')
                in_full = any(line.startswith('|Installing Moriv : ') for line in said.get(what, []))
                done[what] = log_text.text_lines(text, [] if in_full else self.times) or ['nothing']
        words = dict(line[2:].split(' = ', 1) for line in said['files'] if ' = ' in line)
        done['files'] = sorted(self._file_line(sign, path, words.get(path))
                               for path, sign in signs.items())
        done['registry'] = registry_text.changes(before.registry, self.machine.registry())
        return done

    def _file_line(self, sign, path, said):
        """said: words for the content, None when nothing is said of the file."""
        if sign == '-' or path.endswith('\\'):
            return f'{sign} {path}'
        content = self.machine.files.read(path)
        names = self.packed[self.last_image].contents if self.last_image in self.packed else ()
        known = [*([said] if said else []), *(f'removal program in {name}' for name in LANGUAGES),
                 *(f'original {name}' for name in names), 'the INF file',
                 *(f'first {len(content)} bytes of {name}' for name in names)]
        for words in known:
            # A damaged image may have no removal program; what is said may be no words.
            with contextlib.suppress(ValueError, KeyError, struct.error):
                if self._content(words) == content:
                    return f'{sign} {path} = {words}'
        return f'{sign} {path} = {len(content)} other bytes'

    def _content(self, words):
        """The bytes that the words behind a file's '=' stand for in a check."""
        if words == 'the INF file':
            return INF_FILE
        if match := re.fullmatch(r'(?:first (\d+) bytes of|original) (\S+)(?: of (.+))?', words):
            content = self.packed[match[3] or self.last_image].contents[match[2]]
            return content[:int(match[1] or len(content))]
        if match := re.fullmatch(r'removal program(?: in (\w+))?', words):
            language = match[1] or 'French'
            offset = LANGUAGES[language].offset if language in LANGUAGES else int(language)
            return Image(self.packed[self.last_image].bytes).removal_program(offset)
        return quoted_bytes(words)


def _say_words(said, words, before):
    """Puts the checks of a word where the scenario has none of its own; those of an end behind them."""
    events, files, registry = checks_of(words.replace(' ,', ',').strip(), before)
    if words.startswith(('registered', 'unregistered')):
        log = said.get('log', ['heading'])
        said['log'] = log + log_text.numbered(events, log)
        said['files'] = said.get('files', []) + files
    said.setdefault('log', ['heading', *log_text.numbered(events, [])])
    said.setdefault('files', sorted(files))
    said.setdefault('registry', registry)


def _as_checks(done, before):
    """The lines of checks that say all that was done, with a word where one stands for log, files and
    registry."""
    checks, lines = done | {'log': done.get('log', [])[1:]}, []
    if checks.pop('exit') != ['1']:
        lines.append(f'exit {done["exit"][0]}')
    for words in ('installed', 'installed, listed', 'removed', 'removed, listed'):
        full = {}
        with contextlib.suppress(ValueError):
            _say_words(full, words, before)
        if full and done | full == done:
            checks = {what: body for what, body in checks.items() if what not in full}
            lines.append(words)
    for what, body in checks.items():
        lines += [what, *(f'  {line}' for line in body)] if body else []
    return named_pages.with_words(log_text.with_words('\n'.join(lines))).split('\n')


def _command(text):
    """The path, all behind it and one blank, and whether it stands in quotes; without a path the image that
    every scenario has, in quotes."""
    match = re.match('"([^"]*)"(?: |$)(.*)|([A-Za-z]:\S*) ?(.*)', text)
    if not match:
        return DEFAULT_IMAGE, text, True
    return match[1] or match[3], match[2] or match[4], match[1] is not None


def _difference(what, said, done):
    if said == done:
        return []
    diff = difflib.ndiff(said, done)
    return [f'{what}: "-" is what the scenario says, "+" what there was',
            *('    ' + line for line in diff if not line.startswith('?'))]
