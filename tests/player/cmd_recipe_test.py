#!/usr/bin/python3
"""Runs the recipe for cmd.exe, as docs/deployment.md has it, on setup programs that end in different
ways, and holds the batch file's exit code against the program's."""

import sys

sys.dont_write_bytecode = True  # before the modules of this folder
from packed_image import PackedImage
from run_scenarios import ROOT, in_world, read_options

FOLDER = 'C:\\My Recipe\\'
REMOVAL_PROGRAM = 'C:\\windows\\MorivRmv.exe'


def recipe():
    """The indented lines under the heading."""
    text = (ROOT / 'docs' / 'deployment.md').read_text(encoding='utf-8')
    section = text.partition('## cmd.exe\n')[2].partition('\n## ')[0]
    lines = [line[4:] for line in section.splitlines() if line.startswith('    ')]
    return '\r\n'.join(lines).encode('ascii') + b'\r\n'


def ends(machine, setup):
    """What the batch file ends with for this setup program."""
    machine.files.write(FOLDER + 'MorivSetup.exe', setup)
    machine.files.write(FOLDER + 'recipe.cmd', recipe())
    command = f'/c ""{FOLDER}recipe.cmd" >nul"'
    return machine.run(r'C:\windows\system32\cmd.exe', command).exit_code


def run_recipe(world, tools, images):
    image = PackedImage(['zebnet.dll = sample zebnet.dll -> %INSTALL_DIR%'], tools).make(images)
    machine = world.machine('recipe')
    found = {1: ends(machine, image)}
    machine.discard()
    found[-1000012] = ends(machine, world.stub.read_bytes())
    machine.discard()
    machine.files.host(REMOVAL_PROGRAM).mkdir()  # in the way of the removal program
    found[100002] = ends(machine, image)
    machine.discard()
    troubles = [f'for a setup program that ends with {code} it ends with {ended}'
                for code, ended in found.items() if ended != (0 if code == 1 else code)]
    return len(troubles), '\n'.join(troubles) or 'the recipe for cmd.exe ends as it says'


if __name__ == '__main__':
    sys.exit(in_world(read_options(), run_recipe))
