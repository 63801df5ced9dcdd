"""Setup images: made of files, taken apart, damaged on purpose, and the removal program that one leaves.

An image is the executable, then for each file a record and its stream, then one header that ends
the file. All integers are little-endian.
"""

import random
import re
import subprocess
from collections import namedtuple
from pathlib import Path
from tempfile import TemporaryDirectory

HEADER_SIZE = 568
RECORD_SIZE = 696

# Name: (offset, width); a width of 2 or 4 is a number, any other a text.
HEADER_FIELDS = {
    'headerSize': (0, 2), 'magic': (2, 26), 'recordCount': (28, 2), 'removalImageFlag': (30, 2),
    'spaceNeeded': (32, 4), 'packageLength': (36, 4), 'dataOffset': (40, 4),
    'defaultDirectory': (44, 260), 'defaultLanguage': (304, 4), 'reserved': (308, 260),
}
RECORD_FIELDS = {
    'recordSize': (0, 2), 'fileName': (2, 32), 'destination': (34, 260),
    'versionLanguage': (294, 128), 'versionFirst': (422, 2), 'versionSecond': (424, 2),
    'versionThird': (426, 2), 'fileSize': (428, 4), 'storedSize': (432, 4), 'reserved': (436, 260),
}

# The image that a scenario has unless it needs another one.
USUAL_FILES = ('zebdial.exe = 5000 bytes -> %INSTALL_DIR%', 'zebnet.dll = 3000 bytes -> %INSTALL_DIR%')

# What images are made with: host paths of a program without a package, of the tool that packs one, and
# of folders with real files, by the word for such a file.
Tools = namedtuple('Tools', 'stub image_tool folders')

_PACKED = {}  # images by all that goes into them: most scenarios have the same


class PackedImage:
    """A setup image as a 'given image' section describes it. Has its files as (name, destination), their
    contents by name, and the image's bytes."""

    def __init__(self, tools, body=(), usual=True):
        """usual: the body changes the usual image, a file of the same name takes the other's place."""
        options = {'default_directory': "'C:\\Program Files\\Moriv'", 'default_language': "'french'"}
        flags, lines = [], {}  # lines of files, by name
        for line in [*(USUAL_FILES if usual else ()), *body]:
            name, _, value = line.partition(' = ')
            if ' -> ' in line:
                lines[name] = line
            elif line == 'with versions':
                lines = {name: f'{name} = sample {name} -> %INSTALL_DIR%' for name in lines}
            elif line in ('allow unknown macros', 'packed best'):
                flags.append('--' + line.removeprefix('packed ').replace(' ', '-'))
            else:
                options[name.replace(' ', '_')] = value if value.isdigit() else f"'{value}'"
        parts = [re.fullmatch('(.+?) = (.*) -> (.*)', line).groups() for line in lines.values()]
        self.files = [(name, destination) for name, _, destination in parts]
        self.contents = {name: file_content(words, f'packed {name}', tools) for name, words, _ in parts}
        key = str((tools.stub, options, flags, self.files)), *self.contents.values()
        if key not in _PACKED:
            _PACKED[key] = self._pack(tools, options, flags)
        self.bytes = _PACKED[key]

    def _pack(self, tools, options, flags):
        lines = ['[package]', *(f'{name} = {value}' for name, value in options.items())]
        with TemporaryDirectory() as folder:
            for name, destination in self.files:
                Path(folder, name).write_bytes(self.contents[name])
                lines += ['[[file]]', f"source = '{name}'", f"destination = '{destination}'"]
            description, image = Path(folder, 'package.toml'), Path(folder, 'image.packed')
            description.write_text('\n'.join(lines) + '\n', encoding='utf-8')
            done = subprocess.run([tools.image_tool, 'pack', description, '--stub', tools.stub,
                                   '-o', image, *flags], capture_output=True, text=True)
            if done.returncode != 0:
                raise ValueError(done.stderr.strip())
            return image.read_bytes()


def file_content(words, seed, tools):
    """The bytes that the words behind a file's '=' stand for: "TEXT", N bytes, or a real file."""
    kind, _, name = words.partition(' ')
    if name == 'bytes':
        return _sample_bytes(seed, int(kind))
    return (tools.folders[kind] / name).read_bytes() if kind in tools.folders else quoted_bytes(words)


def quoted_bytes(words):
    """The bytes of a "TEXT" in code page 1252, with \\r, \\n, \\t, \\" and \\\\."""
    if not re.fullmatch('".*"', words):
        raise ValueError(f'no such content: {words}')
    escapes = {'r': '\r', 'n': '\n', 't': '\t'}
    return re.sub(r'\\(.)', lambda m: escapes.get(m[1], m[1]), words[1:-1]).encode('cp1252')


def _sample_bytes(seed, size):
    """Bytes that a packer finds partly easy and partly hard; always the same for the same seed."""
    source = random.Random(seed)
    phrase = source.randbytes(23)
    content = bytearray()
    while len(content) < size:
        content += source.choice([phrase * 9, source.randbytes(97), bytes(200), phrase[:7] * 20])
    return bytes(content[:size])


class Image:
    """A good image in its parts; bytes() puts them together again."""

    def __init__(self, data):
        self.header = bytearray(data[-HEADER_SIZE:])
        count, offset = (_number(self.header, HEADER_FIELDS[f]) for f in ('recordCount', 'dataOffset'))
        self.executable = data[:offset]
        self.records, self.streams = [], []
        for _ in range(count):
            self.records.append(bytearray(data[offset:offset + RECORD_SIZE]))
            offset += RECORD_SIZE
            stored = _number(self.records[-1], RECORD_FIELDS['storedSize'])
            self.streams.append(data[offset:offset + stored])
            offset += stored
        if offset != len(data) - HEADER_SIZE:
            raise ValueError('the packed image is not one whole package')

    def bytes(self):
        files = (part for file in zip(self.records, self.streams) for part in file)
        return b''.join([self.executable, *files, self.header])

    def set_stream(self, index, stream):
        self.streams[index] = stream
        _set(self.records[index], RECORD_FIELDS['storedSize'], len(stream))

    def removal_program(self, language_offset):
        """What an install of this image in that language leaves as its removal program."""
        for index in range(len(self.records)):
            self.set_stream(index, b'')
        for name, value in (('removalImageFlag', 1), ('defaultLanguage', language_offset),
                            ('packageLength', len(self.records) * RECORD_SIZE)):
            _set(self.header, HEADER_FIELDS[name], value)
        return self.bytes()


def damage(data, line):
    """The image's bytes after one line of a damage section:

    header FIELD = VALUE            record N FIELD = VALUE       N from 1
    stream N = hex BYTES            another stream; the record's storedSize follows
    no records                      neither records nor streams, recordCount 0
    no records but N                the first N alone
    executable alone                no package at all
    cut N bytes from the end
    append "TEXT"

    A VALUE is a number, a "TEXT", filled "TEXT" (repeated over the field's whole width, so that no
    NUL ends it) or hex BYTES.
    """
    for pattern, change in _DAMAGES:
        if match := re.fullmatch(pattern, line):
            return change(data, *match.groups())
    raise ValueError(f'no such damage: {line}')


def _change_field(data, number, name, value):
    """Of the record with this number, of the header without one."""
    image = Image(data)
    block = image.records[int(number) - 1] if number else image.header
    _set(block, (RECORD_FIELDS if number else HEADER_FIELDS)[name], _value(value))
    return image.bytes()


def _change_stream(data, number, stream):
    image = Image(data)
    image.set_stream(int(number) - 1, bytes.fromhex(stream))
    return image.bytes()


def _drop_records(data, kept):
    image = Image(data)
    image.records = image.records[:int(kept or 0)]
    _set(image.header, HEADER_FIELDS['recordCount'], len(image.records))
    return image.bytes()


_DAMAGES = [
    (r'(?:header|record (\d+)) (\w+) = (.+)', _change_field),
    (r'stream (\d+) = hex (.+)', _change_stream),
    (r'no records(?: but (\d+))?', _drop_records),
    (r'executable alone', lambda data: Image(data).executable),
    (r'cut (\d+) bytes from the end', lambda data, count: data[:-int(count)]),
    (r'append (".*")', lambda data, text: data + quoted_bytes(text)),
]


def _value(text):
    if quoted := re.fullmatch('(filled )?"(.*)"', text):
        return quoted[2].encode('cp1252') * (260 if quoted[1] else 1)
    return bytes.fromhex(text[4:]) if text.startswith('hex ') else int(text, 0)


def _number(block, place):
    offset, width = place
    return int.from_bytes(block[offset:offset + width], 'little')


def _set(block, place, data):
    """Puts a number or bytes into a field; bytes are filled up with zeros, or cut off."""
    offset, width = place
    if isinstance(data, int):
        data = (data & (1 << 8 * width) - 1).to_bytes(width, 'little')
    block[offset:offset + width] = data.ljust(width, b'\0')[:width]
