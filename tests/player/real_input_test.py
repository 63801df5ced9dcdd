"""One large run of real programs: installed byte for byte, then removed to the last file."""

import pytest

from scenario_text import parse
from stripped_libraries import SOURCE, strip_libraries

FILES = 24
DESTINATIONS = ['%INSTALL_DIR%', r'%INSTALL_DIR%\library', r'%INSTALL_DIR%;%INSTALL_DIR%\library']

SCENARIO = r"""
given image C:\Setup.exe
{files}
run /s /r
installed, listed
run C:\windows\MorivRmv.exe /s /r
removed, listed
"""


def test_real_input(player):
    if not SOURCE.is_dir():
        pytest.skip(f'{SOURCE} is not there; libwine is not installed')
    libraries = strip_libraries(player.tools.folders['real'], FILES)
    assert sum(file.stat().st_size for file in libraries) > 30_000_000
    files = [f'  {file.name} = real {file.name} -> {DESTINATIONS[place % 3]}'
             for place, file in enumerate(libraries)]
    player.play(parse('real_input', SCENARIO.format(files='\n'.join(files)), 'real input')[0])
