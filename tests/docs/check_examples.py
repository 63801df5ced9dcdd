#!/usr/bin/python3
"""Plays the examples of moriv-image in README.md and docs/image-tool.md: check_examples.py BUILD, the
folder of the native build. Every "$" command there is run, and what stands below it must come out;
numbers may be others, since they change with the compiler, and "..." stands for any lines. Every key of
the tool's JSON is to stand on its page. The words below the pictures of docs/screenshots.md are those of
the dialog."""

import json
import os
import re
import shlex
import shutil
import subprocess
import sys
import tempfile
from pathlib import Path

ROOT = Path(__file__).resolve().parent.parent.parent
BUILD = Path(sys.argv[1]).resolve()
# What a user does at each page of the dialog, and the image and options that show them.
DIALOG_RUNS = [
    ('build/demo/MorivSetup', '', 'at-poll 2 show/show/press 2/answer no/press 907/show/press 1'),
    ('build/demo/MorivSetup', '', 'show/press 909/show/press 1'),
    ('build/demo/MorivSetup', '', 'show/close/answer yes'),
    ('build/demo/MorivSetup', '/u', 'show/press 908/show/press 1'),
    ('./damaged-tail', '', 'show/press 906'),
    ('build/demo/MorivSetup', '/h', ''),
]
BLOCK = re.compile(r'(?:^ {4}.*\n|^\n(?= {4}))+', re.MULTILINE)
COMMAND = re.compile(r'^\$ ((?:build/native/)?moriv-image .*)$')


def blocks(name):
    """The indented blocks of a page, without their indent."""
    return [re.sub('^ {4}', '', block, flags=re.MULTILINE).strip('\n') + '\n'
            for block in BLOCK.findall((ROOT / name).read_text('utf-8'))]


def examples(name):
    """Command and expected output of each example."""
    for block in blocks(name):
        command, shown = None, []
        for line in [*block.splitlines(), '$']:
            if not line.startswith('$'):
                shown.append(line)
                continue
            if command:
                yield command, '\n'.join(shown).strip()
            found = COMMAND.match(line)
            command, shown = found and found[1], []


def pattern(shown):
    parts = []
    for line in shown.splitlines():
        words = re.sub(r'\d+', '0', ' '.join(line.split()))
        parts.append(r'(?:.*\n)*?' if words == '...' else re.escape(words) + '\n')
    return re.compile(''.join(parts))


def run(command):
    words = shlex.split(command)
    done = subprocess.run([str(BUILD / 'moriv-image'), *words[1:]], capture_output=True, text=True)
    return done.stdout + done.stderr


def prepare(package):
    """What the examples of the image tool's page take for granted."""
    image = bytearray(Path('build/demo/MorivSetup').read_bytes())
    at = image.index(b'PKZ', int.from_bytes(image[-528:-524], 'little'))
    image[at + 20000:at + 20002] = b'\xff\xff'
    Path('damaged').write_bytes(image)
    subprocess.run(['build/demo/MorivSetup', '/s /r'], env=os.environ | {'MORIV_MACHINE': 'pc'},
                   stdout=subprocess.DEVNULL)
    Path('pc/drive_c/Program Files/Moriv/notes.txt').write_text('a foreign file')
    Path('pc/drive_c/Program Files/Moriv/zebnet.dll').chmod(0o444)
    logs = [block for block in blocks('docs/log.md') if 'Fatal Error' in block]
    Path('MorivLog.txt').write_text('\n\n' + logs[-1], newline='\r\n')
    for name, text in {'Setup-4.1.7.exe': package, 'Setup-4.1.8.exe': newer(package)}.items():
        Path('package.toml').write_text(text)
        run(f'moriv-image pack package.toml --source-dir build/win32/samples '
            f'--stub build/native/MorivSetup -o {name}')
    shutil.copy('samples/reference.toml', 'package.toml')


def newer(package):
    """One file is newer, one has moved, one is gone and one has come."""
    first, second, third = re.findall(r'\[\[file\]\].*?(?=\[\[file\]\]|\Z)', package, re.DOTALL)
    return (package[:package.index('[[file]]')] + first.rstrip() + '\nversion = "4.1.8"\n\n' +
            second.replace("'%INSTALL_DIR%'", r"'%INSTALL_DIR%\bin'") +
            third.replace('source = "zebddb.exe"', 'source = "zebddb.exe"\nname = "zebbase.exe"'))


def keys(value):
    if isinstance(value, dict):
        return set(value).union(*map(keys, value.values()))
    return set().union(*map(keys, value)) if isinstance(value, list) else set()


def check_keys():
    page = (ROOT / 'docs/image-tool.md').read_text('utf-8')
    documented = set(re.findall('`(\\w+)`', page[page.index('\n## JSON'):]))
    for command in ('list damaged', 'verify damaged', 'diff Setup-4.1.7.exe Setup-4.1.8.exe',
                    'explain MorivLog.txt', 'plan damaged'):
        unknown = keys(json.loads(run(f'moriv-image {command} --json'))) - documented
        assert not unknown, f'{command}: {unknown}'


def told_dialog(image, options, script):
    """A user's run of the dialog in French, as make demo-dialog tells it."""
    Path('user').write_text(script.replace('/', '\n') + '\n')
    with open('shown', 'w') as shown:
        subprocess.run([image, options + ' /FRA'], stdout=shown,
                       env=os.environ | {'MORIV_MACHINE': 'dialog-pc', 'MORIV_USER': 'user'})
    return subprocess.run([str(ROOT / 'tools/tell-dialog'), 'user', 'shown'], capture_output=True,
                          text=True).stdout


def check_dialog():
    """But for sizes and the file that is copied, which are the package's."""
    image = Path('build/demo/MorivSetup').read_bytes()
    Path('damaged-tail').write_bytes(image[:-100])
    Path('damaged-tail').chmod(0o755)
    told = ''
    for number, dialog_run in enumerate(DIALOG_RUNS):
        told += told_dialog(*dialog_run)
        if number == 1:
            Path('dialog-pc/drive_c/Program Files/Moriv/zebnet.dll').unlink()

    def words(text):
        return re.sub(r'[\d,]+ M[bo]|\\\w+\.\w+', '', ' '.join(text.split()))
    pages = blocks('docs/screenshots.md')
    for page in pages:
        assert words(page) in words(told), f'docs/screenshots.md:\n{page}\n{told}'
    assert len(pages) == len(list((ROOT / 'docs/screenshots').glob('fra-*.png')))


def main():
    count = 0
    with tempfile.TemporaryDirectory() as folder:
        for link, target in {'build/native': BUILD, 'build/win32': BUILD.parent / 'win32',
                             'samples': ROOT / 'samples'}.items():
            (Path(folder) / link).parent.mkdir(parents=True, exist_ok=True)
            (Path(folder) / link).symlink_to(target)
        (Path(folder) / 'build/demo').mkdir()
        os.chdir(folder)
        shutil.copy('build/win32/samples/zebdial.exe', '.')
        for name in ('README.md', 'docs/image-tool.md'):
            for block in blocks(name):
                if block.startswith('[package]'):
                    Path('my.toml').write_text(block)
            for command, shown in examples(name):
                said = '\n'.join(' '.join(line.split()) for line in run(command).splitlines())
                said = re.sub(r'\d+', '0', said).strip() + '\n'
                assert pattern(shown).fullmatch(said.lstrip('\n')), f'{name}: {command}\n{said}'
                count += 1
            if name == 'README.md':
                prepare(Path('samples/reference.toml').read_text())
        check_keys()
        check_dialog()
    print(f'{count} examples')


main()
