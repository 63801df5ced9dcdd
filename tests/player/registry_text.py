"""The registry below HKEY_LOCAL_MACHINE as scenarios see it: REGEDIT4 text, and what a run changed.

A quoted text (REG_SZ) is one with the NUL at its end; behind one without it stands "unterminated".
"""

import re
from collections import namedtuple

ROOT = 'HKEY_LOCAL_MACHINE'
REG_SZ = 1
UNTERMINATED = ' unterminated'

_SECTION = re.compile(rf'\[(-?)(?:{ROOT}\\?)?(.*)\]', re.I)
_QUOTED = r'"((?:[^"\\]|\\.)*)"'
_VALUE = re.compile(rf'(?:@|{_QUOTED})=(?:{_QUOTED}|hex\(([0-9a-fA-F]+)\):([0-9a-fA-F, ]*)|(-))'
                    rf'({UNTERMINATED})?')


# Its path below the root, as first written, and (name, type, bytes) by the lower-case name of a value.
Key = namedtuple('Key', 'path values')


class Registry:
    """Keys by their lower-case path, in the order in which they came."""

    def __init__(self, codepage='cp1252', terminates=False):
        """terminates: as Windows itself, which counts a NUL that stands behind the length that it was
        given, so that no text is without one."""
        self.keys = {}
        self.codepage = codepage
        self.terminates = terminates

    def make(self, path):
        """Makes the key and its parents; gives the key."""
        parent, _, _ = path.rpartition('\\')
        if parent and parent.lower() not in self.keys:
            self.make(parent)
        return self.keys.setdefault(path.lower(), Key(path, {}))

    def put(self, key, name, kind, data):
        if self.terminates and kind == REG_SZ and not data.endswith(b'\0'):
            data += b'\0'
        key.values[name.lower()] = name, kind, data

    def apply(self, text_lines):
        """Adds the keys and values of REGEDIT4 sections; [-KEY] and "name"=- delete."""
        key = None
        for line in text_lines:
            if section := _SECTION.fullmatch(line):
                deleted, path = section.groups()
                key = None if deleted else self.make(path) if path else Key('', {})
                if deleted:
                    self._delete(path.lower())
            elif line and not line.startswith((';', 'REGEDIT4')):
                self._put_line(key, line)
        return self

    def _delete(self, low):
        for path in [path for path in self.keys if f'{path}\\'.startswith(f'{low}\\')]:
            del self.keys[path]

    def _put_line(self, key, line):
        match = _VALUE.fullmatch(line)
        if key is None or not match:
            raise ValueError(f'no value of a key: {line}')
        name, text, kind, data, deleted, unterminated = match.groups()
        name = _unquote(name or '')
        if deleted:
            key.values.pop(name.lower(), None)
        elif text is None:
            self.put(key, name, int(kind, 16), bytes.fromhex(data.replace(',', ' ')))
        else:
            nul = b'' if unterminated else b'\0'
            self.put(key, name, REG_SZ, _unquote(text).encode(self.codepage) + nul)

    def regedit4(self):
        """The bytes of the text that holds it all, one section a key, parents first."""
        lines = ['REGEDIT4', '']
        for key in self.keys.values():
            lines.append(f'[{ROOT}\\{key.path}]')
            lines += [self._line(*value, as_bytes=True) for value in key.values.values()]
            lines.append('')
        return '\n'.join(lines).encode(self.codepage)

    def value_lines(self, key):
        """By their lower-case names."""
        return {low: self._line(*value) for low, value in key.values.items()} if key else {}

    def _line(self, name, kind, data, as_bytes=False):
        name, text = quote(name) if name else '@', data.removesuffix(b'\0')
        if as_bytes or kind != REG_SZ or any(byte < 0x20 for byte in text):
            return f'{name}=hex({kind:x}):{data.hex(",")}'
        mark = UNTERMINATED if text == data else ''
        return f'{name}={quote(text.decode(self.codepage, "replace"))}{mark}'


def changes(before, after):
    """What differs, as lines: '+ [KEY]', '- [KEY]' and '  [KEY]' for one that stays, and below a
    key that is new or stays its values with '+' and '-'. In the order of the keys' names."""
    lines = []
    for low in sorted(before.keys | after.keys):
        old, new = before.keys.get(low), after.keys.get(low)
        if new is None:
            lines.append(f'- [{old.path}]')
            continue
        was, now = before.value_lines(old), after.value_lines(new)
        values = [f'{sign} {side[name]}' for name in sorted(was | now) if was.get(name) != now.get(name)
                  for sign, side in (('-', was), ('+', now)) if name in side]
        if values or old is None:
            lines += [f'{" " if old else "+"} [{new.path}]', *values]
    return lines


def quote(text):
    return '"' + text.replace('\\', '\\\\').replace('"', '\\"') + '"'


def _unquote(text):
    return re.sub(r'\\(.)', r'\1', text)
