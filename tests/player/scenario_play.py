"""Plays one scenario on one machine: prepares it, starts what the scenario starts, and compares."""

import difflib
import re
import shutil
from collections import namedtuple
from datetime import datetime
from os.path import commonprefix

import file_tree
import log_text
import named_pages
import registry_text
from actual_checks import as_checks
from explained_log import misunderstood
from good_runs import LANGUAGES, Before, checks_of
from package_image import Image, ImageError, damage
from packed_image import PackedImage, file_content, quoted_bytes
from registry_text import RegistryError
from scenario_text import ACTIONS, DEFAULT_IMAGE, WORDS, ScenarioError

LOG = r'C:\windows\MorivLog.txt'

# What the program asks of the system; only the stand-in machine tells of it.
REQUESTS = ('|font ', '|drawn ', '|beep ', '|open ', '|start ')

# What a removal leaves for the system's INF installer; one scenario has it line by line.
INF_FILE = '\r\n'.join([
    '[Version]', 'Signature=$Chicago$', 'AdvancedINF=2.0', '',
    '[Uninstall]', 'DelFiles=RemoveFiles', '',
    '[RemoveFiles]', 'MorivRmv.exe', 'MorivLog.txt', 'Moriv.INF', '',
    '[DestinationDirs]', 'RemoveFiles = 10', '']).encode('ascii')

# What images are made with: host paths of a program without a package, of the tool that packs one, of
# the folders by the kind of file that they hold, and of the folder in which images are made.
Tools = namedtuple('Tools', 'stub image_tool folders images')

# What an action did: exit code or None, shown lines, changed files by sign, changed registry lines.
Found = namedtuple('Found', 'exit_code shown files registry')


class ScenarioFailure(Exception):
    """What a scenario says and what there was differ; the message has both, several lines long."""


def play(scenario, machine, tools, accept=False):
    """Raises ScenarioFailure, or ScenarioError for a scenario that can't be carried out. accept: the
    failure tells for each action that did not hold the checks that do, and all actions are played."""
    folder = tools.images / scenario.name
    shutil.rmtree(folder, ignore_errors=True)
    failures = _play(scenario, _Player(machine, tools, folder), accept)
    shutil.rmtree(folder, ignore_errors=True)
    if failures:
        raise ScenarioFailure('\n'.join(failures))


def _play(scenario, player, accept):
    """What failed, an action each."""
    if not any(section.keyword == 'given image' for section in scenario.sections):
        player.place_image(DEFAULT_IMAGE, PackedImage([], player.tools))
    failures = []
    for section in scenario.sections:
        try:
            if section.keyword not in ACTIONS:
                player.prepare(section)
            elif report := player.act(section, accept):
                failures.append('\n'.join([f'{section.place}: {section.keyword} {section.argument}',
                                           *report]))
        except (ImageError, RegistryError, ValueError, KeyError, OSError) as error:
            raise ScenarioError(f'{section.place}: {type(error).__name__}: {error}') from error
        if failures and not accept:
            break
    return failures


class _Player:
    def __init__(self, machine, tools, folder):
        self.machine = machine
        self.tools = tools
        self.folder = folder  # for the sources of the images
        self.images = {}      # path -> the image's bytes
        self.packed = {}      # path -> PackedImage
        self.last_image = DEFAULT_IMAGE  # that has run
        self.now = None       # the machine's own time, when it is set
        self.times = []       # of each run: before and after it

    # Preparations

    def prepare(self, section):
        getattr(self, '_' + section.keyword.replace(' ', '_'))(section)

    def _given_machine(self, section):
        self.machine.settings(section.body)
        for line in section.body:
            if line.startswith('now = '):
                self.now = datetime.fromisoformat(line.removeprefix('now = '))

    def _given_user(self, section):
        self.machine.user(section.body)

    def _given_files(self, section):
        for line in section.body:
            if line.startswith('- '):
                self.machine.files.delete(line[2:])
                continue
            path, _, content = line.partition(' = ')
            self.machine.add_drive(path[0].lower())
            if path.endswith('\\'):
                self.machine.files.host(path).mkdir(parents=True, exist_ok=True)
            else:
                words = content.removesuffix(' read-only')
                data = file_content(words, path, self.tools)
                self.machine.files.write(path, data, read_only=words != content)

    def _given_registry(self, section):
        self.machine.set_registry(self.machine.registry().apply(section.body))

    def _given_image(self, section):
        """Without a path: the image that every scenario has, with other options and more files."""
        self.place_image(section.argument or DEFAULT_IMAGE,
                         PackedImage(section.body, self.tools, not section.argument))

    def place_image(self, path, packed):
        self.packed[path] = packed
        self._place(path, packed.make(self.folder / path.rpartition('\\')[2]))

    def _given_run(self, section):
        """A run that other scenarios look at closely; here it has to succeed, no more."""
        outcome = self._run(section)
        if outcome.exit_code != 1 or outcome.trouble:
            raise ScenarioFailure(f'{section.place}: a given run ends with {outcome.exit_code} '
                                  f'{outcome.trouble}')

    def _damage(self, section):
        path = section.argument or DEFAULT_IMAGE
        if path not in self.images:
            raise ValueError(f'no image {path}')
        data = self.images[path]
        for line in section.body:
            data = damage(data, line)
        self._place(path, data)

    def _place(self, path, data):
        self.images[path] = data
        self.machine.add_drive(path[0].lower())
        self.machine.files.write(path, data)

    # Actions

    def act(self, section, accept):
        """What does not hold, line by line; accept: in its place the checks that do."""
        files, registry = self.machine.files.snapshot(), self.machine.registry()
        report, code, shown, dialog = [], None, [], self.machine.has_user
        if section.keyword == 'restart':
            self.machine.restart()
        else:
            outcome = self._run(section)
            code, shown = outcome.exit_code, outcome.shown
            report += [outcome.trouble] if outcome.trouble else []
        exact = self.machine.keeps_texts
        found = Found(code, shown, file_tree.changes(files, self.machine.files.snapshot()),
                      registry_text.changes(registry, self.machine.registry(), exact))
        packed = self.packed.get(self.last_image)
        before = Before(files, registry, self.last_image, packed.files if packed else [], dialog, exact)
        report += self._compare(found, section, before)
        has_log = found.files.get(LOG, '-') != '-'
        if section.keyword == 'run' and has_log and not dialog:
            report += misunderstood(self.tools.image_tool, self.machine.files.host(LOG), code)
        if report and accept:
            return as_checks(self, found, section, before)
        return report

    def _run(self, section):
        program, arguments = _program_and_arguments(section.argument)
        if program in self.images:
            self.last_image = program
        begun = datetime.now().replace(microsecond=0)  # a heading has whole seconds
        outcome = self.machine.run(program, arguments)
        self.times.append((self.now or begun, self.now or datetime.now()))
        return outcome

    def _compare(self, found, action, before):
        texts = {c.argument or LOG: (['heading'] if c.keyword == 'log' and c.body else []) + c.body
                 for c in action.checks if c.keyword in ('log', 'text')}
        others = {c.keyword: c for c in action.checks if c.keyword not in ('log', 'text')}
        if len(texts) + len(others) != len(action.checks):
            raise ValueError('two checks of the same thing')
        body = {keyword: check.body for keyword, check in others.items()}
        if not before.exact and 'registry' in body:
            body['registry'] = [registry_text.inexact(line) for line in body['registry']]
        self._say_words(action, before, texts, body)
        report = []
        if action.keyword == 'run':
            actual = 'none' if found.exit_code is None else str(found.exit_code)
            expected = others['exit'].argument if 'exit' in others else '1'
            report += _difference('exit code', [expected], [actual])
        shown = [line for line in named_pages.without_words(body.get('shown', []))
                 if self.machine.tells_requests or not line.startswith(REQUESTS)]
        report += _difference('shown', shown, [f'|{line}|' for line in found.shown])
        for path, lines in texts.items():
            expected = log_text.without_words(lines)
            report += _difference(path, expected,
                                  self.text_lines(path, found.files, 'heading' in expected))
        files = {path: sign for path, sign in found.files.items() if path not in texts}
        report += self._compare_files(body.get('files', []), files)
        return report + _difference('registry', body.get('registry', []), found.registry)

    @staticmethod
    def _say_words(action, before, texts, body):
        """Puts the checks of a word where the scenario has none of its own."""
        for check in action.checks:
            if check.keyword in WORDS:
                words = f'{check.keyword} {check.argument}'.replace(' ,', ',').strip()
                words = checks_of(words, before)
                ends = check.keyword in ('registered', 'unregistered')
                log = log_text.without_words(texts.get(LOG, ['heading']) if ends else ['heading'])
                log += log_text.number(words.log, 1 + log_text.count_events(log))
                files = (body.get('files', []) if ends else []) + words.files
                texts[LOG] = log if ends else texts.get(LOG, log)
                if not texts[LOG]:
                    del texts[LOG]  # an empty section: the log was not written
                body['files'] = files if ends else body.get('files', files)
                body.setdefault('registry', words.registry)

    def text_lines(self, path, changed, headings):
        """The lines of a text file that the run wrote, as a text section has them; headings: with
        one word for the four lines of a log's heading."""
        if changed.get(path) not in ('+', '~'):
            return [f'(the run did not write {path})']
        text = self.machine.files.read(path).decode('cp1252', 'replace')
        return log_text.text_lines(text, self.times if headings else None)

    def _compare_files(self, lines, found):
        actual = []
        for line in lines:
            sign, path, words = _split_file_line(line)
            if found.get(path) == sign:
                del found[path]
                actual.append(line + self._content_trouble(path, words))
        for path, sign in found.items():
            is_file = sign != '-' and not path.endswith('\\')
            size = f' = {len(self.machine.files.read(path))} bytes' if is_file else ''
            actual.append(f'{sign} {path}{size}')
        return _difference('files', sorted(lines), sorted(actual))

    def _content_trouble(self, path, words):
        actual = self.machine.files.read(path) if words else ''
        expected = self.expected_content(words) if words else ''
        if actual == expected:
            return ''
        at = len(commonprefix([actual, expected]))
        return f' BUT {len(actual)} bytes for {len(expected)}, other from byte {at} on'

    def expected_content(self, words):
        """The bytes that the words behind a file's '=' stand for in a check."""
        if words == 'the INF file':
            return INF_FILE
        if match := re.fullmatch(r'original (\S+)(?: of (.+))?', words):
            return self._original(*match.groups())
        if match := re.fullmatch(r'first (\d+) bytes of (\S+)', words):
            return self._original(match[2], None)[:int(match[1])]
        if match := re.fullmatch(r'removal program(?: of (.+?))?(?: in (\w+))?', words):
            image, language = match[1] or self.last_image, match[2] or 'French'
            offset = LANGUAGES[language].offset if language in LANGUAGES else int(language)
            return Image(self.images[image]).removal_program(offset)
        if re.fullmatch('".*"', words):
            return quoted_bytes(words)
        raise ValueError(f'no such content: {words}')

    def _original(self, name, image):
        """Of the image that ran last, unless another one is named."""
        return self.packed[image or self.last_image].contents[name]


def _program_and_arguments(text):
    """The path, in quotes when it has blanks, and all that stands behind it and one blank; without a path
    the image that every scenario has."""
    if quoted := re.match('"([^"]*)"(?: |$)(.*)', text):
        return quoted.groups()
    if not re.match(r'[A-Za-z]:', text):
        return DEFAULT_IMAGE, text
    program, _, arguments = text.partition(' ')
    return program, arguments


def _split_file_line(line):
    match = re.fullmatch(r'([-+~]) (.*?)(?: = (.+))?', line)
    if not match or (match[3] is None) != (match[1] == '-' or match[2].endswith('\\')):
        raise ValueError(f'not a line of files: {line}')
    return match[1], match[2], match[3]


def _difference(what, expected, actual):
    if expected == actual:
        return []
    diff = difflib.ndiff(expected, actual)
    return [f'{what}: "-" is what the scenario says, "+" what there was',
            *('    ' + line for line in diff if not line.startswith('?'))]
