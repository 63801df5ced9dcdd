"""Contents of files as scenarios write them, and setup images made of such files.

`tools` is what images are made with (scenario_play.Tools).
"""

import random
import re
import subprocess

# The image that a scenario has unless it needs another one.
USUAL_FILES = ['zebdial.exe = 5000 bytes -> %INSTALL_DIR%', 'zebnet.dll = 3000 bytes -> %INSTALL_DIR%']

_PACKED = {}  # images by all that goes into them: most scenarios have the same


class PackedImage:
    """A setup image as a 'given image' section describes it, made with the image tool."""

    def __init__(self, body, tools, usual=True):
        """usual: the body changes the usual image, a file of the same name takes the other's place."""
        self.tools = tools
        self.options = {'default_directory': "'C:\\Program Files\\Moriv'",
                        'default_language': '"french"'}
        self.flags = []       # of the image tool
        self.files = []       # (name, destination)
        self.contents = {}    # name -> bytes
        lines = {}            # of files, by name
        for line in [*(USUAL_FILES if usual else []), *body]:
            if ' -> ' in line:
                lines[line.partition(' = ')[0]] = line
            elif line == 'with versions':
                lines = {name: f'{name} = sample {name} -> %INSTALL_DIR%' for name in lines}
            else:
                self._set_option(line)
        for line in lines.values():
            self._add_file(line)

    def _add_file(self, line):
        words, _, destination = line.partition(' -> ')
        name, _, content = words.partition(' = ')
        self.files.append((name, destination))
        self.contents[name] = file_content(content, 'packed ' + name, self.tools)

    def _set_option(self, line):
        name, _, value = line.partition(' = ')
        quote = {'default directory': "'", 'default language': '"', 'space needed': ''}
        if name in quote:
            self.options[name.replace(' ', '_')] = quote[name] + value + quote[name]
        elif line == 'allow unknown macros':
            self.flags.append('--allow-unknown-macros')
        else:
            raise ValueError(f'no such line of an image: {line}')

    def make(self, folder):
        """The image's bytes; folder takes the sources and is made here."""
        key = (self.tools.stub, *self.options.values(), *self.flags, *self.files, *self.contents.values())
        if key in _PACKED:
            return _PACKED[key]
        folder.mkdir(parents=True)
        lines = ['[package]', *(f'{name} = {value}' for name, value in self.options.items())]
        for name, destination in self.files:
            (folder / name).write_bytes(self.contents[name])
            lines += ['[[file]]', f"source = '{name}'", f"destination = '{destination}'"]
        description, image = folder / 'package.toml', folder / 'image.packed'
        description.write_text('\n'.join(lines) + '\n', encoding='utf-8')
        done = subprocess.run([self.tools.image_tool, 'pack', description,
                               '--stub', self.tools.stub, '-o', image, *self.flags],
                              capture_output=True, text=True)
        if done.returncode != 0:
            raise ValueError(done.stderr.strip())
        return _PACKED.setdefault(key, image.read_bytes())


def file_content(words, seed, tools):
    """The bytes that the words behind a file's '=' stand for: "TEXT", N bytes, or a real file."""
    if re.fullmatch(r'\d+ bytes', words):
        return _sample_bytes(seed, int(words.split()[0]))
    if re.fullmatch('".*"', words):
        return quoted_bytes(words)
    kind, _, name = words.partition(' ')
    if kind not in tools.folders:
        raise ValueError(f'no such content: {words}')
    return (tools.folders[kind] / name).read_bytes()


def quoted_bytes(words):
    """The bytes of a "TEXT" in code page 1252, with \\r, \\n, \\t, \\" and \\\\."""
    escapes = {'r': '\r', 'n': '\n', 't': '\t'}
    return re.sub(r'\\(.)', lambda m: escapes.get(m[1], m[1]), words[1:-1]).encode('cp1252')


def _sample_bytes(seed, size):
    """Bytes that a packer finds partly easy and partly hard; always the same for the same seed."""
    source = random.Random(seed)
    phrase = source.randbytes(23)
    blocks, length = [], 0
    while length < size:
        block = source.choice([phrase * 9, source.randbytes(97), bytes(200), phrase[:7] * 20])
        blocks.append(block)
        length += len(block)
    return b''.join(blocks)[:size]
