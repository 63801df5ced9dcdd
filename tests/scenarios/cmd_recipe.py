#!/usr/bin/python3
"""Runs the recipe for cmd.exe, as docs/deployment.md has it, on setup programs that end in different
ways, and holds the batch file's exit code against the program's."""

import shutil
import sys

sys.dont_write_bytecode = True  # before the modules of this folder
from packed_image import PackedImage
from run_scenarios import ROOT, make_tools, make_world, read_options, status_without_world
from worlds import WorldError

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


def main():
    options = read_options()
    world = make_world(options)
    if reason := world.missing():
        print(f'{world.name}: left out: {reason}')
        return status_without_world(options)
    tools, _ = make_tools(options, world)
    sources = options.work / f'{world.name}-recipe'
    shutil.rmtree(sources, ignore_errors=True)
    image = PackedImage(['zebnet.dll = sample zebnet.dll -> %INSTALL_DIR%'], tools).make(sources)
    troubles = []
    try:
        world.open()
        machine = world.machine('recipe')
        found = {1: ends(machine, image)}
        machine.discard()
        found[-1000012] = ends(machine, world.stub.read_bytes())
        machine.discard()
        machine.files.host(REMOVAL_PROGRAM).mkdir()  # in the way of the removal program
        found[100002] = ends(machine, image)
        machine.discard()
        for code, ended in found.items():
            if ended != (0 if code == 1 else code):
                troubles.append(f'for a setup program that ends with {code} it ends with {ended}')
    except WorldError as error:
        print(error, file=sys.stderr)
        return 2
    finally:
        world.close()
    print('\n'.join(troubles) or f'{world.name}: the recipe for cmd.exe ends as it says')
    return 1 if troubles else 0


if __name__ == '__main__':
    sys.exit(main())
