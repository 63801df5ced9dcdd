"""The recipe for cmd.exe, as docs/deployment.md has it, run on setup programs that end in different
ways: the batch file's exit code is 0 for a success and else the program's."""

from pathlib import Path

import pytest

from package_image import PackedImage

FOLDER = 'C:\\My Recipe\\'
DOCUMENT = Path(__file__).resolve().parent.parent.parent / 'docs' / 'deployment.md'


def recipe():
    """The indented lines under the heading."""
    section = DOCUMENT.read_text(encoding='utf-8').partition('## cmd.exe\n')[2].partition('\n## ')[0]
    lines = [line[4:] for line in section.splitlines() if line.startswith('    ')]
    return '\r\n'.join(lines).encode('ascii') + b'\r\n'


@pytest.mark.parametrize('code', [1, -1000012, 100002])
def test_recipe(player, code):
    if player.world.name == 'stand-in':
        pytest.skip('only Wine: the stand-in has no cmd.exe')
    machine = player.world.machine('recipe')
    setup = player.world.stub.read_bytes()  # without a package: -1000012
    if code != -1000012:
        setup = PackedImage(player.tools).bytes
    if code == 100002:
        machine.files.host(r'C:\windows\MorivRmv.exe').mkdir()  # in the way of the removal program
    machine.files.write(FOLDER + 'MorivSetup.exe', setup)
    machine.files.write(FOLDER + 'recipe.cmd', recipe())
    outcome = machine.run(r'C:\windows\system32\cmd.exe', f'/c ""{FOLDER}recipe.cmd" >nul"')
    machine.discard()
    assert outcome.exit_code == (0 if code == 1 else code)
