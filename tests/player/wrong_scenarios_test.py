"""Whether the player sees what is wrong: a scenario that says something else than happens has to fail, a
text that is no scenario is refused in one line, and what --accept prints holds."""

import re

import pytest

from player_plugin import SCENARIOS
from scenario_play import ScenarioFailure, play
from scenario_text import CHECKS, ScenarioError, parse

# Scenario, what stands there, and what is said instead.
FALSEHOODS = [
    ('fresh_silent_install', 'log\n', 'exit 100004\nlog\n'),
    ('fresh_silent_install', 'registry |', 'registry|'),
    ('fresh_silent_install', '  + C:\\Program Files\\Moriv\\\n', ''),
    ('fresh_silent_install', 'zebnet.dll = original zebnet.dll\n', 'zebnet.dl = ""\n'),
    ('fresh_silent_install', '+ C:\\windows\\MorivRmv', '~ C:\\windows\\MorivRmv'),
    ('fresh_silent_install', 'removal program', 'removal program in German'),
    ('fresh_silent_install', '"FR" unterminated', '"FR"'),
    ('fresh_silent_install', '  + [SOFTWARE\\Zeb\\Moriv\\Services]\n', ''),
    ('fresh_silent_install', '"DisplayName"="ZEB', '"displayname"="ZEB'),
    ('install_over_an_install', 'in German, listed', 'in German, listed\nregistry'),
    ('removal_by_the_removal_program', '|RemoveFiles = 10|', '|RemoveFiles = 10|\n  ||'),
    ('removal_by_the_removal_program', '  - [SOFTWARE\\Zeb\\Moriv]\n', ''),
    ('removal_by_the_setup_image', ', listed', ''),
    ('restart_after_a_removal', '  - C:\\windows\\Moriv.INF\n', ''),
    ('report_file_is_appended_to', '  heading\n  |1- File', '  |1- File'),
    ('run_without_events_leaves_the_log', 'exit -1000005', 'exit -1000005\nlog\n  fatal x'),
    ('log_heading_in_english', 'Saturday', 'saturday'),
    ('dialog_fresh_install', '  page installed\n', '  page installed in German\n'),
    ('dialog_refused_directory', '    |903 Edit shown enabled ""|\n', ''),
    ('power_lost_in_an_install', 'exit none', 'exit 1'),
    ('power_lost_in_an_install', 'first 2048', 'first 2047'),
]

# Texts that are no scenario, and the line that is named.
MALFORMED = [
    ('exit 1\n', 1), ('given files\n  C:\\a = "x"\n', ''), ('only stand-in:\nrun\n', 1),
    ('run\nonly stand-in: late\n', 2), ('run\nlog\n  no bars\n', 3), ('run\nfile\n', 2),
    ('each\n  a | b\n  1\nrun {a}\n', 3), ('each\n  a\n  1\nrun {b}\n', 4),
    ('damage C:\\a.exe\n  no records\nrun\n', 1), ('damage\n  no such damage\nrun\n', 1),
    ('run\ninstalled in Latin\n', 1), ('run\nshown\n  page x\n', 1),
    ('run\nshown\n  |box|\n    |1 x|\n', 1),
]


@pytest.fixture
def play_text(player):
    """Plays a text on a fresh machine."""
    if player.world.name != 'stand-in':
        pytest.skip('only stand-in: the player is the same in each world')

    def play_once(text, accept=False):
        machine = player.world.machine('wrong')
        try:
            play(parse('wrong', text, 'text')[0], machine, player.tools, accept)
        finally:
            machine.discard()
    return play_once


def text_of(name):
    return next(SCENARIOS.rglob(f'{name}.scenario')).read_text(encoding='utf-8')


@pytest.mark.parametrize('name, truth, falsehood', FALSEHOODS)
def test_falsehood(play_text, name, truth, falsehood):
    text = text_of(name)
    assert truth in text
    with pytest.raises(ScenarioFailure):
        play_text(text.replace(truth, falsehood, 1))


@pytest.mark.parametrize('text, line', MALFORMED)
def test_malformed(play_text, text, line):
    with pytest.raises(ScenarioError, match=f'^text:{line}.*$'):
        play_text(text)


@pytest.mark.parametrize('name', ['dialog_removal_page', 'power_lost_in_an_install',
                                  'plug_in_with_a_tail', 'dialog_services_remain_at_set_up',
                                  'dialog_cancel_in_a_long_stream'])
def test_accepted(play_text, name):
    """Without its checks a scenario fails, and what the failure prints are checks that hold."""
    check = rf'^(?:{"|".join(CHECKS)})\b.*\n(?:  .*\n)*'
    kept = re.sub(check, '', text_of(name), flags=re.M).splitlines()
    with pytest.raises(ScenarioFailure) as failure:
        play_text('\n'.join(kept), accept=True)
    blocks = re.split(r'^text:(\d+): .*\n', str(failure.value), flags=re.M)
    for place, checks in reversed(list(zip(blocks[1::2], blocks[2::2]))):
        kept[int(place):int(place)] = checks.splitlines()
    play_text('\n'.join(kept))
