"""The files that are packed, expanded and installed.

  libraries   40 of Wine's own libraries, stripped: the largest, one of a family (msvcp70, msvcp71
              and so on are nearly the same file), none above 3,000,000 bytes
  text        C headers and documentation, in files of 1,000,000 bytes
"""

import os
import random
import shutil
import subprocess
import sys
from dataclasses import dataclass
from pathlib import Path

from timed_runs import BenchError, output_of

# All paths are relative to the root, so that a command can be told and repeated as it was run.
os.chdir(Path(__file__).resolve().parent.parent)
sys.path.insert(0, 'tests/player')
from package_image import Image  # noqa: E402
from stripped_libraries import SOURCE, strip_libraries  # noqa: E402

BUILD = Path('build/bench')
STUB = BUILD / 'MorivSetup'
IMAGE_TOOL = BUILD / 'moriv-image'

LARGEST_LIBRARY = 3_000_000
TEXT_FILE = 1_000_000
PEER_PACKERS = {'.Z': ('compress', '-b16', '-f', '-c'), '.gz': ('gzip', '-9', '-n', '-c')}
HEADERS = Path('/usr/include')
DOCUMENTS = Path('/usr/share/doc')


@dataclass
class Corpus:
    name: str
    words: str
    files: list

    @property
    def folder(self):
        return self.files[0].parent

    @property
    def streams(self):
        return self.folder.with_suffix('.streams')

    @property
    def image(self):
        return self.folder.with_suffix('.image')

    @property
    def size(self):
        return sum(file.stat().st_size for file in self.files)


def make_corpora(libraries, text):
    """Corpora of so many files, each with its image and its streams."""
    folder = BUILD / 'corpora'
    corpora = [Corpus('libraries', "Wine's own libraries, stripped",
                      make_libraries(folder / 'libraries', libraries)),
               Corpus('text', 'C headers and documentation', make_text(folder / 'text', text))]
    for corpus in corpora:
        output_of(pack_command(corpus.files, corpus.image))
        write_streams(corpus)
    return corpora


def megabyte_of(corpus):
    """Equal parts out of the middle of each file."""
    size = 1_000_000 // len(corpus.files)
    parts = []
    for file in corpus.files:
        content = file.read_bytes()
        parts.append(content[len(content) // 2:][:size])
    return b''.join(parts)


def make_libraries(folder, count):
    _make_anew(folder)
    files = strip_libraries(folder, count, LARGEST_LIBRARY)
    if not files:
        raise BenchError(f'{SOURCE} has too few libraries')
    return files


def make_text(folder, count):
    """Two thirds of it headers, one third documentation."""
    _make_anew(folder)
    documents = count // 3
    text = [*_cut(HEADERS, '**/*.h', count - documents), *_cut(DOCUMENTS, '**/*', documents)]
    files = []
    for number, content in enumerate(text, 1):
        files.append(folder / f'text{number:02}.txt')
        files[-1].write_bytes(content)
    return files


def _cut(source, pattern, count):
    """The plain text files below a folder, in an order that is random but always the same."""
    paths = sorted(path for path in source.glob(pattern)
                   if path.is_file() and not path.is_symlink() and path.suffix != '.gz')
    random.Random(1).shuffle(paths)
    text = bytearray()
    for path in paths:
        content = path.read_bytes()
        if b'\0' not in content:
            text += content
        if len(text) >= count * TEXT_FILE:
            return [bytes(text[i * TEXT_FILE:(i + 1) * TEXT_FILE]) for i in range(count)]
    raise BenchError(f'{source} has less than {count * TEXT_FILE} bytes of text')


def make_random(size):
    """A file of random bytes, always the same ones."""
    folder = BUILD / 'corpora' / 'random'
    _make_anew(folder)
    file = folder / 'random.dat'
    file.write_bytes(random.Random(1).randbytes(size))
    return [file]


def make_slices(folder, content, count):
    """The content cut into files of one size."""
    _make_anew(folder)
    size = len(content) // count
    files = []
    for number in range(count):
        files.append(folder / f'part{number:04}.dat')
        files[-1].write_bytes(content[number * size:(number + 1) * size])
    return files


def pack_command(files, image, stub=STUB, options=()):
    """The command that makes a setup image of the files; its description is written here."""
    lines = ['[package]']
    for file in files:
        lines += ['[[file]]', f"source = '{file.name}'", "destination = '%INSTALL_DIR%'"]
    description = image.with_suffix('.toml')
    description.write_text('\n'.join(lines) + '\n', encoding='utf-8')
    return [IMAGE_TOOL, 'pack', description, '--source-dir', files[0].parent, '--stub', stub,
            '-o', image, *options]


def packed_streams(image):
    return Image(image.read_bytes()).streams


def write_streams(corpus):
    """For each file the stream of the image, and those of the peers' formats."""
    _make_anew(corpus.streams)
    for file, stream in zip(corpus.files, packed_streams(corpus.image)):
        (corpus.streams / f'{file.name}.pkz').write_bytes(stream)
        for extension, packer in PEER_PACKERS.items():
            packed = subprocess.run([*packer, file], capture_output=True, check=True).stdout
            (corpus.streams / f'{file.name}{extension}').write_bytes(packed)


def _make_anew(folder):
    shutil.rmtree(folder, ignore_errors=True)
    folder.mkdir(parents=True)
