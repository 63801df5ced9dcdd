"""Plays one scenario on one machine: prepares it, starts what the scenario starts, and compares."""

import difflib
import re
from collections import namedtuple
from datetime import datetime, timedelta
from os.path import commonprefix

import file_tree
import registry_text
from package_image import Image, ImageError, damage
from packed_image import PackedImage, file_content, quoted_bytes
from registry_text import RegistryError
from scenario_text import ACTIONS, ScenarioError

LOG = r'C:\windows\MorivLog.txt'
LANGUAGES = {'English': 0, 'French': 10000, 'German': 20000, 'Italian': 30000, 'Spanish': 40000}

# What the program asks of the system; only the stand-in machine tells of it.
REQUESTS = ('|beep ', '|open ', '|start ')

# What a removal leaves for the system's INF installer; one scenario has it line by line.
INF_FILE = '\r\n'.join([
    '[Version]', 'Signature=$Chicago$', 'AdvancedINF=2.0', '',
    '[Uninstall]', 'DelFiles=RemoveFiles', '',
    '[RemoveFiles]', 'MorivRmv.exe', 'MorivLog.txt', 'Moriv.INF', '',
    '[DestinationDirs]', 'RemoveFiles = 10', '']).encode('ascii')


# What an action did: exit code or None, shown lines, changed files by sign, changed registry lines.
Found = namedtuple('Found', 'exit_code shown files registry')


class ScenarioFailure(Exception):
    """What a scenario says and what there was differ; the message has both, several lines long."""


def play(scenario, machine, tools, folder):
    """Raises ScenarioFailure, or ScenarioError for a scenario that can't be carried out.

    tools: what images are made with (packed_image.py); folder: for the sources of the images.
    """
    player = _Player(machine, tools, folder)
    for section in scenario.sections:
        if section.keyword in ACTIONS:
            player.act(section)
        else:
            player.prepare(section)


class _Player:
    def __init__(self, machine, tools, folder):
        self.machine = machine
        self.tools = tools
        self.folder = folder
        self.images = {}      # path -> the image's bytes
        self.originals = {}   # image path -> {file name: content}
        self.now = None       # the machine's own time, when it is set

    # Preparations

    def prepare(self, section):
        try:
            getattr(self, '_' + section.keyword.replace(' ', '_'))(section)
        except (ImageError, RegistryError, ValueError) as error:
            raise ScenarioError(f'{section.place}: {error}') from error

    def _given_machine(self, section):
        self.machine.settings(section.body)
        for line in section.body:
            if line.startswith('now = '):
                self.now = datetime.fromisoformat(line[len('now = '):])

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
        path = section.argument
        packed = PackedImage(section.body, self.tools)
        data = packed.make(self.folder / path.rpartition('\\')[2])
        self.originals[path] = packed.contents
        self._place(path, data)

    def _given_run(self, section):
        """A run that other scenarios look at closely; here it has to succeed, no more."""
        outcome = self.machine.run(*_program_and_arguments(section))
        if outcome.exit_code != 1 or outcome.trouble:
            raise ScenarioFailure(f'{section.place}: given run {section.argument}\n'
                                  f'exit code {outcome.exit_code} {outcome.trouble}')

    def _damage(self, section):
        data = self.images[section.argument]
        for line in section.body:
            data = damage(data, line)
        self._place(section.argument, data)

    def _place(self, path, data):
        self.images[path] = data
        self.machine.add_drive(path[0].lower())
        self.machine.files.write(path, data)

    # Actions

    def act(self, section):
        files = self.machine.files.snapshot()
        registry = self.machine.registry()
        report = []
        if section.keyword == 'restart':
            self.machine.restart()
            exit_code, shown = None, []
        else:
            outcome = self.machine.run(*_program_and_arguments(section))
            exit_code, shown = outcome.exit_code, outcome.shown
            if outcome.trouble:
                report.append(outcome.trouble)
        found = Found(exit_code, shown, file_tree.changes(files, self.machine.files.snapshot()),
                      registry_text.changes(registry, self.machine.registry()))
        report += self._compare(found, section)
        if report:
            what = f'{section.place}: {section.keyword} {section.argument}'
            raise ScenarioFailure('\n'.join([what, *report]))

    def _compare(self, found, action):
        texts = {c.argument or LOG: c for c in action.checks if c.keyword in ('log', 'text')}
        others = {c.keyword: c for c in action.checks if c.keyword not in ('log', 'text')}
        if len(texts) + len(others) != len(action.checks):
            raise ScenarioError(f'{action.place}: two checks of the same thing')
        if (action.keyword == 'run') != ('exit' in others):
            raise ScenarioError(f'{action.place}: a run has an exit code, a restart has none')
        body = {keyword: check.body for keyword, check in others.items()}
        report = []
        if 'exit' in others:
            actual = 'none' if found.exit_code is None else str(found.exit_code)
            report += _difference('exit code', [others['exit'].argument], [actual])
        shown = [line for line in body.get('shown', [])
                 if self.machine.tells_requests or not line.startswith(REQUESTS)]
        report += _difference('shown', shown, [f'|{line}|' for line in found.shown])
        for path, check in texts.items():
            expected = (['heading'] if check.keyword == 'log' else []) + check.body
            lines = self._text_lines(path, found.files, 'heading' in expected)
            report += _difference(path, expected, lines)
        files = {path: sign for path, sign in found.files.items() if path not in texts}
        report += self._compare_files(body.get('files', []), files, action.place)
        return report + _difference('registry', body.get('registry', []), found.registry)

    def _text_lines(self, path, changed, headings):
        """The lines of a text file that the run wrote, as a text section has them; headings: with
        one word for the four lines of a log's heading."""
        if changed.get(path) not in ('+', '~'):
            return [f'(the run did not write {path})']
        text = self.machine.files.read(path).decode('cp1252', 'replace')
        lines = []
        parts = re.split(r'\r\n\r\nInstalling Moriv : (.*?) \r\n\r\n', text) if headings else [text]
        for number, part in enumerate(parts):
            if number % 2 == 1:
                lines.append(self._heading_line(part))
            elif part:
                lines += [f'|{line}|' for line in part.split('\r\n')]
                # What stands behind the last line end: nothing, as it should be.
                if lines.pop() != '||':
                    lines.append(f'|{part.split(chr(10))[-1]}| without a line end')
        return lines

    def _heading_line(self, stamp):
        """'heading' if the time is good, else what it is."""
        latest = self.now or datetime.now()
        seconds = 0 if self.now else 600
        good = {(latest - timedelta(seconds=ago)).strftime('%A, %d %B %Y at : %Hh %Mm %Ss')
                for ago in range(seconds + 1)}
        return 'heading' if stamp in good else f'heading with the time "{stamp}"'

    def _compare_files(self, lines, found, place):
        actual = []
        for line in lines:
            sign, path, words = _split_file_line(line, place)
            if found.get(path) == sign:
                del found[path]
                actual.append(line + self._content_trouble(path, words, place))
        for path, sign in found.items():
            is_file = sign != '-' and not path.endswith('\\')
            size = f' = {len(self.machine.files.read(path))} bytes' if is_file else ''
            actual.append(f'{sign} {path}{size}')
        return _difference('files', sorted(lines), sorted(actual))

    def _content_trouble(self, path, words, place):
        actual = self.machine.files.read(path) if words else ''
        expected = self._expected_content(words, place) if words else ''
        if actual == expected:
            return ''
        at = len(commonprefix([actual, expected]))
        return f' BUT {len(actual)} bytes for {len(expected)}, other from byte {at} on'

    def _expected_content(self, words, place):
        contents = [  # what may stand behind a file's '='
            (r'the INF file', lambda: INF_FILE),
            (r'original (\S+)(?: of (.+))?', self._original),
            (r'first (\d+) bytes of (\S+)', lambda n, name: self._original(name, None)[:int(n)]),
            (r'removal program of (.+) in (\w+)', lambda image, language:
                Image(self.images[image]).removal_program(int(LANGUAGES.get(language, language)))),
            (r'(".*")', quoted_bytes),
        ]
        try:
            for pattern, content in contents:
                if match := re.fullmatch(pattern, words):
                    return content(*match.groups())
        except (KeyError, ValueError) as error:
            raise ScenarioError(f'{place}: {words}: {error}') from error
        raise ScenarioError(f'{place}: no such content: {words}')

    def _original(self, name, image):
        if image is None and len(self.originals) != 1:
            raise ValueError('of which image?')
        return self.originals[image or next(iter(self.originals))][name]


def _program_and_arguments(section):
    """The path, in quotes when it has blanks, and all that stands behind it and one blank."""
    if quoted := re.match('"([^"]*)"(?: |$)(.*)', section.argument):
        return quoted.groups()
    program, _, arguments = section.argument.partition(' ')
    return program, arguments


def _split_file_line(line, place):
    match = re.fullmatch(r'([-+~]) (.*?)(?: = (.+))?', line)
    if not match or (match[3] is None) != (match[1] == '-' or match[2].endswith('\\')):
        raise ScenarioError(f'{place}: not a line of files: {line}')
    return match[1], match[2], match[3]


def _difference(what, expected, actual):
    if expected == actual:
        return []
    diff = difflib.ndiff(expected, actual)
    return [f'{what}: "-" is what the scenario says, "+" what there was',
            *('    ' + line for line in diff if not line.startswith('?'))]
