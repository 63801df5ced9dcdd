"""What a run did, in the form of checks, for the author of a scenario to paste (--accept)."""

import contextlib
import re
from itertools import combinations

import log_text
import named_pages
import registry_text
from good_runs import DIRECTORY, INF, LANGUAGES, REMOVAL_PROGRAM, VARIANTS, Checks, checks_of
from package_image import ImageError

LOG = r'C:\windows\MorivLog.txt'


def as_checks(player, found, action, before):
    """Lines of a scenario that say all that there was, in few words. player: of scenario_play.py."""
    texts = [check.argument for check in action.checks if check.keyword == 'text']
    files = {path: sign for path, sign in found.files.items() if path not in texts}
    log = []
    if files.get(LOG, '-') != '-' and LOG not in texts:
        del files[LOG]
        log = log_text.with_words(player.text_lines(LOG, found.files, True))[1:]
    lines = []
    if action.keyword == 'run' and found.exit_code != 1:
        lines.append(f'exit {"none" if found.exit_code is None else found.exit_code}')
    lines += _section('shown', named_pages.with_words([f'|{line}|' for line in found.shown]))
    for path in texts:
        has_heading = b'\r\n\r\nInstalling Moriv : ' in player.machine.files.read(path)
        text = log_text.with_words(player.text_lines(path, found.files, has_heading))
        lines += _section(f'text {path}', text)
    file_lines = [_file_line(player, path, sign) for path, sign in files.items()]
    actual = Checks(log, file_lines, found.registry)
    return lines + min(_ways(player, actual, before), key=len)


def _ways(player, actual, before):
    """Ways to say log, files and registry: without a word, and with each that fits."""
    yield _sections(actual, before.image)
    if any(line.startswith('fatal ') for line in actual.log):
        return
    for words in _words(player, actual.log):
        try:
            said = checks_of(words, before)
        except ValueError:
            continue
        log = log_text.number(said.log)
        if words.startswith(('registered', 'unregistered')):
            log = log_text.number(said.log, log_text.count_events(actual.log) - len(said.log) + 1)
            if actual.log[-len(log):] != log or not set(said.files) <= set(actual.files):
                continue
            rest = Checks(actual.log[:-len(log)], [f for f in actual.files if f not in said.files],
                          _unless(said.registry, actual.registry))
        else:
            rest = Checks(_unless(log, actual.log), _unless(sorted(said.files), sorted(actual.files)),
                          _unless(said.registry, actual.registry))
        if not (rest.log and rest.files) or words.startswith(('reg', 'unreg')):
            yield [words, *_sections(rest, before.image)]


def _unless(said, actual):
    """A body of its own, [''] for one that is empty, and none where the word's is right."""
    return [] if said == actual else actual or ['']


def _words(player, log):
    """All that may fit."""
    language, directory = _settings(player)
    place = '' if directory == DIRECTORY else f' {directory}'
    place += '' if language == 'French' else f' in {language}'
    folders = {match[1] for line in log if (match := re.search(r'Removing Directory :  (.*)\|', line))}
    words = [f'{word}{place}' for word in ('installed', 'registered')]
    words += [f'{word}{folder}' for word in ('removed', 'unregistered')
              for folder in ('', *(f' {folder}' for folder in sorted(folders)))]
    for count in range(len(VARIANTS)):
        for variants in combinations(VARIANTS, count):
            yield from (', '.join([word, *variants]) for word in words)


def _settings(player):
    """What the registry says of the product."""
    key = player.machine.registry().keys.get(r'software\zeb\moriv')
    values = key.values if key else {}
    texts = {name: value.without_nul().data.decode('cp1252') for name, value in values.items()}
    words = {language.word: name for name, language in LANGUAGES.items()}
    return words.get(texts.get('language'), 'French'), texts.get('installdir', DIRECTORY)


def _sections(checks, image):
    """Brief: without the image's name, and without French."""
    files = [re.sub(' in French$', '', line.replace(f' of {image}', '')) for line in checks.files]
    return [*_section('log', checks.log), *_section('files', files),
            *_section('registry', checks.registry)]


def _section(name, body):
    return [name, *('  ' + line for line in body if line)] if body else []


def _file_line(player, path, sign):
    if sign == '-' or path.endswith('\\'):
        return f'{sign} {path}'
    return f'{sign} {path} = {_content_words(player, path)}'


def _content_words(player, path):
    """Words for the file's content that a check takes."""
    content = player.machine.files.read(path)
    tries = ['the INF file'] if path.endswith('Moriv.INF') else []
    for image in sorted(player.packed, key=lambda image: image != player.last_image):
        if path.endswith('MorivRmv.exe'):
            tries += [f'removal program of {image} in {name}' for name in LANGUAGES]
        names = sorted(player.packed[image].contents, key=lambda name: not path.endswith(name))
        tries += [f'original {name} of {image}' for name in names]
        tries += [f'first {len(content)} bytes of {name}' for name in names]
    for words in tries:
        with contextlib.suppress(ImageError):  # a damaged image may have no removal program
            if player.expected_content(words) == content:
                return words
    text = content.decode('cp1252', 'replace')
    if len(text) < 200 and text.isprintable():
        return registry_text.quote(text)
    return f'{len(content)} bytes'
