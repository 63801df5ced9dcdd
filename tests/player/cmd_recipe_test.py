"""The recipe for cmd.exe, as docs/deployment.md has it, run on setup programs that end in different
ways: the batch file's exit code is 0 for a success and else the program's."""

import re

import pytest

from package_image import PackedImage
from worlds import ROOT

FOLDER = 'C:\\My Recipe\\'
DOCUMENT = (ROOT / 'docs' / 'deployment.md').read_text(encoding='utf-8')
RECIPE = DOCUMENT.partition('## cmd.exe\n')[2].partition('\n## ')[0]


@pytest.mark.parametrize('code', [1, -1000012, 100002])
def test_recipe(player, machine, code):
    setup = player.world.stub.read_bytes()  # without a package: -1000012
    if code != -1000012:
        setup = PackedImage(player.tools).bytes
    if code == 100002:
        machine.files.host(r'C:\windows\MorivRmv.exe').mkdir()  # in the way of the removal program
    lines = re.findall('^    (.*)', RECIPE, re.M)
    machine.files.write(FOLDER + 'MorivSetup.exe', setup)
    machine.files.write(FOLDER + 'recipe.cmd', '\r\n'.join([*lines, '']).encode('ascii'))
    outcome = machine.run(r'C:\windows\system32\cmd.exe', f'/c ""{FOLDER}recipe.cmd" >nul"')
    assert outcome.exit_code == (0 if code == 1 else code)
