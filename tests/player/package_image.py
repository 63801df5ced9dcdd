"""Setup images: made of files, taken apart, damaged on purpose, and the removal program that one leaves.

An image is the executable, then for each file a record and its stream, then one header that ends
the file. All integers are little-endian.
"""

import random
import re
import subprocess
from collections import namedtuple
from pathlib import Path
from struct import Struct
from tempfile import TemporaryDirectory

HEADER = Struct('<H26s2H3I260sI260s')
Header = namedtuple('Header', 'headerSize magic recordCount removalImageFlag spaceNeeded packageLength '
                    'dataOffset defaultDirectory defaultLanguage reserved')
RECORD = Struct('<H32s260s128s3H2I260s')
Record = namedtuple('Record', 'recordSize fileName destination versionLanguage versionFirst '
                    'versionSecond versionThird fileSize storedSize reserved')

# The image that a scenario has unless it needs another one.
USUAL_FILES = ('zebdial.exe = 5000 bytes -> %INSTALL_DIR%', 'zebnet.dll = 3000 bytes -> %INSTALL_DIR%')

# What images are made with: host paths of the world's program without a package, of the tool that packs
# one, of folders with real files, by the word for such a file, and of the 64-bit Windows program.
Tools = namedtuple('Tools', 'stub image_tool folders stub64')

_PACKED = {}  # images by all that goes into them: most scenarios have the same


class PackedImage:
    """A setup image as a 'given image' section describes it. Has its files as (name, destination), their
    contents by name, and the image's bytes."""

    def __init__(self, tools, body=(), usual=True):
        """usual: the body changes the usual image, a file of the same name takes the other's place."""
        options = {'default_directory': "'C:\\Program Files\\Moriv'", 'default_language': "'french'"}
        flags, lines = [], {}  # lines of files, by name
        stub = tools.stub
        for line in [*(USUAL_FILES if usual else ()), *body]:
            name, _, value = line.partition(' = ')
            if ' -> ' in line:
                lines[name] = line
            elif line == 'with versions':
                lines = {name: f'{name} = sample {name} -> %INSTALL_DIR%' for name in lines}
            elif line in ('allow unknown macros', 'packed best'):
                flags.append('--' + line.removeprefix('packed ').replace(' ', '-'))
            elif line == '64-bit program':
                stub = tools.stub64
            else:
                options[name.replace(' ', '_')] = value if value.isdigit() else f"'{value}'"
        parts = [re.fullmatch('(.+?) = (.*) -> (.*)', line).groups() for line in lines.values()]
        self.files = [(name, destination) for name, _, destination in parts]
        self.contents = {name: file_content(words, f'packed {name}', tools) for name, words, _ in parts}
        key = str((stub, options, flags, self.files)), *self.contents.values()
        if key not in _PACKED:
            _PACKED[key] = self._pack(tools.image_tool, stub, options, flags)
        self.bytes = _PACKED[key]

    def _pack(self, image_tool, stub, options, flags):
        lines = ['[package]', *(f'{name} = {value}' for name, value in options.items())]
        with TemporaryDirectory() as folder:
            for name, destination in self.files:
                Path(folder, name).write_bytes(self.contents[name])
                lines += ['[[file]]', f"source = '{name}'", f"destination = '{destination}'"]
            description, image = Path(folder, 'package.toml'), Path(folder, 'image.packed')
            description.write_text('\n'.join(lines) + '\n', encoding='utf-8')
            done = subprocess.run([image_tool, 'pack', description, '--stub', stub, '-o', image,
                                   *flags], capture_output=True, text=True)
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
        self.header = Header._make(HEADER.unpack(data[-HEADER.size:]))
        self.executable, rest = data[:self.header.dataOffset], data[self.header.dataOffset:-HEADER.size]
        self.records, self.streams = [], []
        for _ in range(self.header.recordCount):
            self.records.append(Record._make(RECORD.unpack_from(rest)))
            end = RECORD.size + self.records[-1].storedSize
            self.streams.append(rest[RECORD.size:end])
            rest = rest[end:]
        if rest:
            raise ValueError('the packed image is not one whole package')

    def bytes(self):
        files = [RECORD.pack(*record) + stream for record, stream in zip(self.records, self.streams)]
        return b''.join([self.executable, *files, HEADER.pack(*self.header)])

    def change_record(self, index, **values):
        self.records[index] = self.records[index]._replace(**values)

    def removal_program(self, language_offset):
        """What an install of this image in that language leaves as its removal program."""
        self.records = [record._replace(storedSize=0) for record in self.records]
        self.streams = [b''] * len(self.records)
        self.header = self.header._replace(removalImageFlag=1, defaultLanguage=language_offset,
                                           packageLength=len(self.records) * RECORD.size)
        return self.bytes()


def damage(data, line):
    """The image's bytes after one line of a damage section. Records and streams count from 1. A value
    is a number, a "TEXT", or filled "TEXT": repeated over the whole field, so that no NUL ends it."""
    if match := re.fullmatch(r'cut (\d+) bytes from the end', line):
        return data[:-int(match[1])]
    if match := re.fullmatch(r'append (".*")', line):
        return data + quoted_bytes(match[1])
    image = Image(data)
    if line == 'executable alone':
        return image.executable
    if match := re.fullmatch(r'header (\w+) = (.+)', line):
        image.header = image.header._replace(**{match[1]: _value(match[2])})
    elif match := re.fullmatch(r'record (\d+) (\w+) = (.+)', line):
        image.change_record(int(match[1]) - 1, **{match[2]: _value(match[3])})
    elif match := re.fullmatch(r'stream (\d+) = hex (.+)', line):
        index, stream = int(match[1]) - 1, bytes.fromhex(match[2])
        image.streams[index] = stream
        image.change_record(index, storedSize=len(stream))
    elif match := re.fullmatch(r'no records(?: but (\d+))?', line):
        image.records = image.records[:int(match[1] or 0)]
        image.header = image.header._replace(recordCount=len(image.records))
    else:
        raise ValueError(f'no such damage: {line}')
    return image.bytes()


def _value(text):
    if quoted := re.fullmatch('(filled )?"(.*)"', text):
        return quoted[2].encode('cp1252') * (260 if quoted[1] else 1)
    return int(text, 0)
