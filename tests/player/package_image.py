"""Setup images as bytes: taken apart, damaged on purpose, and the removal program that one leaves.

An image is the executable, then for each file a record and its stream, then one header that ends
the file. All integers are little-endian.
"""

import re

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


class ImageError(Exception):
    pass


def _get(block, place):
    offset, width = place
    return int.from_bytes(block[offset:offset + width], 'little')


def _set(block, place, data):
    """Puts a number or bytes into a field; bytes are filled up with zeros."""
    offset, width = place
    if isinstance(data, int):
        data = (data & (1 << 8 * width) - 1).to_bytes(width, 'little')
    if len(data) > width:
        raise ImageError(f'{len(data)} bytes for a field of {width}')
    block[offset:offset + width] = data.ljust(width, b'\0')


class Image:
    """A good image in its parts; bytes() puts them together again."""

    def __init__(self, data):
        self.header = bytearray(data[-HEADER_SIZE:])
        count, offset = (_get(self.header, HEADER_FIELDS[f]) for f in ('recordCount', 'dataOffset'))
        self.executable = data[:offset]
        self.records, self.streams = [], []
        for _ in range(count):
            record = bytearray(data[offset:offset + RECORD_SIZE])
            offset += RECORD_SIZE
            stored = _get(record, RECORD_FIELDS['storedSize'])
            self.records.append(record)
            self.streams.append(data[offset:offset + stored])
            offset += stored
        if offset != len(data) - HEADER_SIZE:
            raise ImageError('the packed image is not one whole package')

    def bytes(self):
        files = b''.join(bytes(r) + s for r, s in zip(self.records, self.streams))
        return bytes(self.executable) + files + bytes(self.header)

    def removal_program(self, language_offset):
        """What an install of this image in that language leaves as its removal program."""
        records = [bytearray(record) for record in self.records]
        for record in records:
            _set(record, RECORD_FIELDS['storedSize'], 0)
        header = bytearray(self.header)
        _set(header, HEADER_FIELDS['removalImageFlag'], 1)
        _set(header, HEADER_FIELDS['packageLength'], len(records) * RECORD_SIZE)
        _set(header, HEADER_FIELDS['defaultLanguage'], language_offset)
        return bytes(self.executable) + b''.join(records) + header


def damage(data, line):
    """The image's bytes after one line of a damage section:

    header FIELD = VALUE            record N FIELD = VALUE       N from 1
    stream N = hex BYTES            another stream; the record's storedSize follows
    stream N = first COUNT bytes    the same, cut short
    no records                      neither records nor streams, recordCount 0
    no records but N                the first N alone
    executable alone                no package at all
    cut to COUNT bytes              cut COUNT bytes from the end
    append "TEXT"

    A VALUE is a number, a "TEXT", filled "TEXT" (repeated over the field's whole width, so that no
    NUL ends it) or hex BYTES.
    """
    for pattern, change in _DAMAGES:
        if match := re.fullmatch(pattern, line):
            return change(data, *match.groups())
    raise ImageError(f'no such damage: {line}')


def _change_field(data, number, name, value):
    """Of the record with this number, of the header without one."""
    image = Image(data)
    fields = RECORD_FIELDS if number else HEADER_FIELDS
    if name not in fields:
        raise ImageError(f'no such field: {name}')
    block = image.records[int(number) - 1] if number else image.header
    _set(block, fields[name], _field_value(value, fields[name][1]))
    return image.bytes()


def _change_stream(data, number, value):
    image = Image(data)
    index = int(number) - 1
    if first := re.fullmatch(r'first (\d+) bytes', value):
        stream = image.streams[index][:int(first[1])]
    elif value.startswith('hex '):
        stream = bytes.fromhex(value[4:])
    else:
        raise ImageError(f'no such stream: {value}')
    image.streams[index] = stream
    _set(image.records[index], RECORD_FIELDS['storedSize'], len(stream))
    return image.bytes()


def _drop_records(data, kept):
    image = Image(data)
    image.records, image.streams = image.records[:kept], image.streams[:kept]
    _set(image.header, HEADER_FIELDS['recordCount'], kept)
    return image.bytes()


_DAMAGES = [
    (r'(?:header|record (\d+)) (\w+) = (.+)', _change_field),
    (r'stream (\d+) = (.+)', _change_stream),
    (r'no records(?: but (\d+))?', lambda data, kept: _drop_records(data, int(kept or 0))),
    (r'executable alone', lambda data: Image(data).executable),
    (r'cut to (\d+) bytes', lambda data, count: data[:int(count)]),
    (r'cut (\d+) bytes from the end', lambda data, count: data[:-int(count)]),
    (r'append "(.*)"', lambda data, text: data + text.encode('cp1252')),
]


def _field_value(text, width):
    if filled := re.fullmatch(r'filled "(.+)"', text):
        return (filled[1].encode('cp1252') * width)[:width]
    if re.fullmatch(r'".*"', text):
        return text[1:-1].encode('cp1252')
    return bytes.fromhex(text[4:]) if text.startswith('hex ') else int(text, 0)
