"""The files that are packed, expanded and installed.

  libraries   40 of Wine's own libraries, stripped: the largest, one of a family (msvcp70, msvcp71 and
              so on are nearly the same file), none above 3,000,000 bytes
  text        C headers and documentation, in files of 1,000,000 bytes
"""

import random
import re
import shutil
import subprocess
import sys
from pathlib import Path

from timed_runs import BenchError, output_of

ROOT = Path(__file__).resolve().parent.parent
sys.path.insert(0, str(ROOT / 'tests/scenarios'))
from package_image import Image  # noqa: E402

BUILD = ROOT / 'build/bench'
STUB = BUILD / 'MorivSetup'
IMAGE_TOOL = BUILD / 'moriv-image'

LIBRARIES = Path('/usr/lib/x86_64-linux-gnu/wine/x86_64-windows')
STRIP = 'x86_64-w64-mingw32-strip'
LARGEST_LIBRARY = 3_000_000
TEXT_FILE = 1_000_000
HEADERS = Path('/usr/include')
DOCUMENTS = Path('/usr/share/doc')


def make_libraries(folder, count):
    _make_anew(folder)
    families = {}
    stripped = folder / 'stripped'
    sources = sorted(LIBRARIES.glob('*.dll'), key=lambda file: (-file.stat().st_size, file.name))
    for source in sources:
        family = re.match('[a-z]*', source.name)[0]
        if len(families) == count:
            break
        if family in families:
            continue
        output_of([STRIP, '-o', stripped, source])
        if stripped.stat().st_size <= LARGEST_LIBRARY:
            families[family] = stripped.rename(folder / source.name)
    stripped.unlink(missing_ok=True)
    if len(families) < count:
        raise BenchError(f'{LIBRARIES} has too few libraries')
    return sorted(families.values())


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
    image.parent.mkdir(parents=True, exist_ok=True)
    lines = ['[package]']
    for file in files:
        lines += ['[[file]]', f"source = '{file.name}'", "destination = '%INSTALL_DIR%'"]
    description = image.with_suffix('.toml')
    description.write_text('\n'.join(lines) + '\n', encoding='utf-8')
    return [IMAGE_TOOL, 'pack', description, '--source-dir', files[0].parent, '--stub', stub,
            '-o', image, *options]


def packed_streams(image):
    return Image(image.read_bytes()).streams


def write_streams(files, image, folder):
    """The streams of the files in a folder: the image's, and those of the peers' formats."""
    _make_anew(folder)
    for file, stream in zip(files, packed_streams(image)):
        (folder / f'{file.name}.pkz').write_bytes(stream)
        (folder / f'{file.name}.Z').write_bytes(_piped(['compress', '-b16', '-f', '-c', file]))
        (folder / f'{file.name}.gz').write_bytes(_piped(['gzip', '-9', '-n', '-c', file]))


def _piped(command):
    return subprocess.run([str(word) for word in command], capture_output=True, check=True).stdout


def _make_anew(folder):
    shutil.rmtree(folder, ignore_errors=True)
    folder.mkdir(parents=True)
