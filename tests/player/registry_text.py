"""The registry below HKEY_LOCAL_MACHINE as scenarios see it: REGEDIT4 text, and what a run changed.

A quoted text (REG_SZ) is one with the NUL at its end; behind one without it stands "unterminated". Where
texts are not compared exactly both are the same: Windows itself counts a terminator that stands behind
the length that it was given.
"""

import re
from dataclasses import dataclass, field

ROOT = 'HKEY_LOCAL_MACHINE'
REG_SZ = 1
UNTERMINATED = ' unterminated'


class RegistryError(Exception):
    pass


@dataclass(frozen=True)
class Value:
    name: str       # '' is the key's default value
    type: int
    data: bytes

    def without_nul(self):
        if self.type == REG_SZ and self.data.endswith(b'\0'):
            return Value(self.name, self.type, self.data[:-1])
        return self

    def line(self, exact=True):
        """As scenarios have it; not exact: without a word on whether there is a NUL at the end."""
        text = self.without_nul().data
        if self.type != REG_SZ or any(byte < 0x20 for byte in text):
            return self._hex(self.data if exact else text)
        mark = UNTERMINATED if exact and text == self.data else ''
        return f'{self._name()}={quote(text.decode("cp1252", "replace"))}{mark}'

    def regedit(self):
        """As REGEDIT4 has it, to the byte: a quoted text stands for one with its NUL."""
        return self.line() if self.data.endswith(b'\0') else self._hex(self.data)

    def _name(self):
        return quote(self.name) if self.name else '@'

    def _hex(self, data):
        return f'{self._name()}=hex({self.type:x}):{data.hex(",")}'


@dataclass
class Key:
    path: str                                    # below the root, as first written
    values: dict = field(default_factory=dict)   # lower-case name -> Value


class Registry:
    """Keys by their lower-case path, in the order in which they came."""

    def __init__(self):
        self.keys = {}

    def make(self, path):
        """Makes the key and its parents; gives the key."""
        parent, _, _ = path.rpartition('\\')
        if parent and parent.lower() not in self.keys:
            self.make(parent)
        return self.keys.setdefault(path.lower(), Key(path))

    def delete(self, path):
        low = path.lower()
        for key in [k for k in self.keys if k == low or k.startswith(low + '\\')]:
            del self.keys[key]

    def apply(self, text_lines):
        """Adds the keys and values of REGEDIT4 sections; [-KEY] and "name"=- delete."""
        key = None
        for line in text_lines:
            if not line or line.startswith((';', 'REGEDIT4')):
                continue
            if line.startswith('[-') and line.endswith(']'):
                self.delete(_below_root(line[2:-1]))
                key = None
            elif line.startswith('[') and line.endswith(']'):
                path = _below_root(line[1:-1])
                key = self.make(path) if path else Key('')
            elif key is None:
                raise RegistryError(f'a value without a key: {line}')
            else:
                name, value = _parse_value(line)
                if value is None:
                    key.values.pop(name.lower(), None)
                else:
                    key.values[name.lower()] = value
        return self

    def sections(self):
        """REGEDIT4 sections, one a key, parents first."""
        lines = []
        for key in self.keys.values():
            values = [value.regedit() for value in key.values.values()]
            lines += [f'[{ROOT}\\{key.path}]', *values, '']
        return lines


def changes(before, after, exact):
    """What differs, as lines: '+ [KEY]', '- [KEY]' and '  [KEY]' for one that stays, and below a
    key that is new or stays its values with '+' and '-'. In the order of the keys' names."""
    lines = []
    for low in sorted(before.keys | after.keys):
        old, new = before.keys.get(low), after.keys.get(low)
        if new is None:
            lines.append(f'- [{old.path}]')
            continue
        values = _value_changes(old.values if old else {}, new.values, exact)
        if old is None:
            lines.append(f'+ [{new.path}]')
        elif values:
            lines.append(f'  [{new.path}]')
        lines += values
    return lines


def _value_changes(old, new, exact):
    lines = []
    for name in sorted(old.keys() | new.keys()):
        was, now = (values[name].line(exact) if name in values else None for values in (old, new))
        if was != now:
            lines += [f'{sign} {line}' for sign, line in (('-', was), ('+', now)) if line]
    return lines


def inexact(line):
    """A line of changes() without a word on the NUL at the end of a text."""
    return re.sub(r'(=hex\(1\):.*),00$', r'\1', line.removesuffix(UNTERMINATED))


def quote(text):
    return '"' + text.replace('\\', '\\\\').replace('"', '\\"') + '"'


def _below_root(path):
    root, _, rest = path.partition('\\')
    if root.upper().startswith('HKEY_') and root.upper() != ROOT:
        raise RegistryError(f'a key outside {ROOT}: {path}')
    return rest if root.upper() == ROOT else path


_QUOTED = r'"((?:[^"\\]|\\.)*)"'
_VALUE = re.compile(rf'(?:@|{_QUOTED})=(?:{_QUOTED}|hex\(([0-9a-fA-F]+)\):([0-9a-fA-F, ]*)|(-))'
                    rf'({UNTERMINATED})?$')


def _parse_value(line):
    """The name and the Value of a line, None for one that deletes."""
    match = _VALUE.match(line)
    if not match:
        raise RegistryError(f'not a registry value: {line}')
    name, text, kind, data, deleted, unterminated = match.groups()
    name = _unquote(name or '')
    if deleted:
        return name, None
    if text is not None:
        data = _unquote(text).encode('cp1252')
        return name, Value(name, REG_SZ, data if unterminated else data + b'\0')
    return name, Value(name, int(kind, 16), bytes.fromhex(data.replace(',', ' ')))


def _unquote(text):
    return re.sub(r'\\(.)', r'\1', text)
