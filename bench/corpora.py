"""The files that are packed, expanded and installed. All come from packages that the bench
installs, so that a host with the same versions has the same bytes.

  libraries   40 of Wine's own libraries, stripped: the largest, one of a family (msvcp70, msvcp71
              and so on are nearly the same file), none above 3,000,000 bytes
  text        sources, headers and documentation, in files of 1,000,000 bytes
"""

import hashlib
import os
import random
import shutil
import subprocess
import sys
from dataclasses import dataclass
from pathlib import Path

from package_files import text_files_of, version_of
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

# Package: endings. Each comes with a package of tools/bootstrap, and hardly gets a new version while
# a Debian release lasts.
LIBRARY_PACKAGES = ('libwine', 'binutils-mingw-w64-x86-64')
SOURCES = {'googletest': ('.cc', '.h'), 'libcli11-dev': ('.hpp',),
           'libtomlplusplus-dev': ('.h', '.inl'), 'libstdc++-12-dev': ('.h', '.tcc')}
DOCUMENTS = {'cmake-data': ('.rst',), 'python3-pytest': ('.py',)}

# The corpora by which the goals were set, whole and of a quick run.
KNOWN_SUMS = {
    '062e65e1626316711ee36d83dbed47e3ee6db35728fdc5f00c4bf14e858d6fc2',  # libraries
    '335882246968339ce72507e9b0f08c9bc82cc2bc52aa2f00cafce9f6b1c608f4',  # text
    '78434a6122ca04c135d66812511a1217f8135b3bc35367e6b1d2efe1dd1a26f0',  # 8 libraries
    '35bde00848de67bccfb5cbfe9faa6d00816b043d586efe3c7ced8820b5f6bf61',  # 4 files of text
}


@dataclass
class Corpus:
    name: str
    words: str
    packages: tuple  # names
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

    @property
    def versions(self):
        return ', '.join(map(version_of, self.packages))

    def content(self):
        return b''.join(file.read_bytes() for file in self.files)

    def sum(self):
        """SHA-256 of all files, one behind the other."""
        return hashlib.sha256(self.content()).hexdigest()

    def is_known(self):
        return self.sum() in KNOWN_SUMS


def make_corpora(libraries, text):
    """Corpora of so many files, each with its image and its streams."""
    folder = BUILD / 'corpora'
    corpora = [Corpus('libraries', "Wine's own libraries, stripped", LIBRARY_PACKAGES,
                      make_libraries(folder / 'libraries', libraries)),
               Corpus('text', 'sources, headers and documentation', (*SOURCES, *DOCUMENTS),
                      make_text(folder / 'text', text))]
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
    """Two thirds of it sources and headers, one third documentation."""
    _make_anew(folder)
    documents = count // 3
    text = [*_cut(SOURCES, count - documents), *_cut(DOCUMENTS, documents)]
    files = []
    for number, content in enumerate(text, 1):
        files.append(folder / f'text{number:02}.txt')
        files[-1].write_bytes(content)
    return files


def _cut(packages, count):
    """The packages' texts, in an order that is random but always the same."""
    paths = [path for package, endings in packages.items()
             for path in text_files_of(package, endings)]
    random.Random(1).shuffle(paths)
    text = b''.join(path.read_bytes() for path in paths)
    if len(text) < count * TEXT_FILE:
        raise BenchError(f'less than {count * TEXT_FILE} bytes of text in {", ".join(packages)}')
    return [text[i * TEXT_FILE:(i + 1) * TEXT_FILE] for i in range(count)]


def make_random(size):
    """A file of random bytes, always the same ones."""
    folder = BUILD / 'corpora' / 'random'
    _make_anew(folder)
    file = folder / 'random.dat'
    file.write_bytes(random.Random(1).randbytes(size))
    return [file]


def make_slices(folder, content, count, head=b''):
    """The content cut into files of one size, each with the head before it."""
    _make_anew(folder)
    size = len(content) // count
    files = []
    for number in range(count):
        files.append(folder / f'part{number:05}.dat')
        files[-1].write_bytes(head + content[number * size:(number + 1) * size])
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
