"""The registry below HKEY_LOCAL_MACHINE as scenarios see it: REGEDIT4 text, and what a run changed.

A text value (REG_SZ) with and without the NUL at its end is the same here: Windows itself counts a
terminator that stands behind the length that it was given.
"""

import re
from dataclasses import dataclass, field

ROOT = 'HKEY_LOCAL_MACHINE'
REG_SZ = 1


class RegistryError(Exception):
    pass


@dataclass(frozen=True)
class Value:
    name: str       # '' is the key's default value
    type: int
    data: bytes

    def same(self, other):
        return other is not None and (self.type, self._bare()) == (other.type, other._bare())

    def _bare(self):
        if self.type == REG_SZ and self.data.endswith(b'\0'):
            return self.data[:-1]
        return self.data

    def exact(self):
        """As REGEDIT4 has it, to the byte: a quoted text stands for one with its NUL."""
        return self._line(self.data, self.data.endswith(b'\0'))

    def __str__(self):
        """For a comparison: a text with and without its NUL look the same."""
        return self._line(self._bare(), True)

    def _line(self, data, terminated):
        name = _quote(self.name) if self.name else '@'
        text = self._bare()
        if self.type == REG_SZ and terminated and not any(byte < 0x20 for byte in text):
            return f'{name}={_quote(text.decode("cp1252", "replace"))}'
        return f'{name}=hex({self.type:x}):{data.hex(",")}'


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
            values = [value.exact() for value in key.values.values()]
            lines += [f'[{ROOT}\\{key.path}]', *values, '']
        return lines


def changes(before, after):
    """What differs, as lines: '+ [KEY]', '- [KEY]' and '  [KEY]' for one that stays, and below a
    key that is new or stays its values with '+' and '-'. In the order of the keys' names."""
    lines = []
    for low in sorted(before.keys | after.keys):
        old, new = before.keys.get(low), after.keys.get(low)
        if new is None:
            lines.append(f'- [{old.path}]')
            continue
        values = _value_changes(old.values if old else {}, new.values)
        if old is None:
            lines.append(f'+ [{new.path}]')
        elif values:
            lines.append(f'  [{new.path}]')
        lines += values
    return lines


def _value_changes(old, new):
    lines = []
    for name in sorted(old.keys() | new.keys()):
        was, now = old.get(name), new.get(name)
        if not now or not now.same(was):
            lines += [f'{sign} {value}' for sign, value in (('-', was), ('+', now)) if value]
    return lines


def _quote(text):
    return '"' + text.replace('\\', '\\\\').replace('"', '\\"') + '"'


def _below_root(path):
    root, _, rest = path.partition('\\')
    if root.upper().startswith('HKEY_') and root.upper() != ROOT:
        raise RegistryError(f'a key outside {ROOT}: {path}')
    return rest if root.upper() == ROOT else path


_QUOTED = r'"((?:[^"\\]|\\.)*)"'
_VALUE = re.compile(rf'(?:@|{_QUOTED})=(?:{_QUOTED}|hex\(([0-9a-fA-F]+)\):([0-9a-fA-F, ]*)|(-))$')


def _parse_value(line):
    """The name and the Value of a line, None for one that deletes."""
    match = _VALUE.match(line)
    if not match:
        raise RegistryError(f'not a registry value: {line}')
    name, text, kind, data, deleted = match.groups()
    name = _unquote(name or '')
    if deleted:
        return name, None
    if text is not None:
        return name, Value(name, REG_SZ, _unquote(text).encode('cp1252') + b'\0')
    return name, Value(name, int(kind, 16), bytes.fromhex(data.replace(',', ' ')))


def _unquote(text):
    return re.sub(r'\\(.)', r'\1', text)
