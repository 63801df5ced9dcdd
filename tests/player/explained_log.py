"""Whether "moriv-image explain" makes of a silent run's log what the run was."""

import re
import subprocess

# How the event begins that decided how a run ended: a fatal one, else one by the exit code.
DECIDING = {1: 'Uninstall file is installed correctly|Moriv registration removed',
            100002: 'Error installing Uninstall file', 100004: "Couldn't register Moriv"}


def misunderstood(image_tool, log, exit_code):
    """Lines that tell what is wrong. log: host path."""
    done = subprocess.run([image_tool, 'explain', log], capture_output=True, text=True)
    told = [re.findall(rf'^{label} +(.*)', done.stdout, re.M) for label in ('exit code', 'event')]
    text = log.read_text(encoding='cp1252', errors='replace')  # with LF
    decided = [event for begin in ('Fatal Error : ', DECIDING.get(exit_code, '$'))
               for event in re.findall(rf'^(\d+- (?:{begin}).*?) *$', text, re.M)]
    decided = decided[:1] or ['none that tells how the run ended']
    if str(exit_code) in [code.split()[0] for code in told[0]] and told[1] == decided:
        return []
    return [f'explained as {told} {done.stderr}, not {exit_code} {decided}']
