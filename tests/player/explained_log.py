"""Whether "moriv-image explain" makes of a silent run's log what the run was."""

import subprocess

# The event that decided how a run without a fatal one ended, by its exit code.
DECIDING = {1: ('Uninstall file is installed correctly', 'Moriv registration removed'),
            100002: ('Error installing Uninstall file',), 100004: ("Couldn't register Moriv",)}


def misunderstood(image_tool, log, exit_code):
    """Lines that tell what is wrong. log: host path."""
    done = subprocess.run([image_tool, 'explain', log], capture_output=True, text=True)
    told = [line.split(maxsplit=1) for line in done.stdout.splitlines()]
    codes = [words.removeprefix('code ').split()[0] for label, words in told if label == 'exit']
    events = [words for label, words in told if label == 'event']
    expected = _deciding_event(log.read_bytes().decode('cp1252', 'replace').splitlines(), exit_code)
    if str(exit_code) in codes and events == [expected]:
        return []
    return [f'explained as {" ".join(codes)} {events} {done.stderr}, not {exit_code} {expected}']


def _deciding_event(lines, exit_code):
    events = [line.rstrip() for line in lines if line[:1].isdigit()]
    for text in ('Fatal Error : ', *DECIDING.get(exit_code, ())):
        for event in events:
            if event.partition('- ')[2].startswith(text):
                return event
    return 'none that tells how the run ended'
