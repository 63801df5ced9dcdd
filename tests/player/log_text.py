"""Logs as scenarios have them: lines between bars, "heading" for the four lines of a log's heading, and
one word for the three lines of a fatal event; and what "moriv-image explain" makes of a log."""

import re
import subprocess
from datetime import timedelta

# How the event begins that decided how a run ended: a fatal one, else one by the exit code.
DECIDING = {1: 'Uninstall file is installed correctly|Moriv registration removed',
            100002: 'Error installing Uninstall file', 100004: "Couldn't register Moriv"}


def numbered(events, lines):
    """The lines of events that stand behind these lines of a log."""
    first = 1 + sum(bool(re.match(r'\|\d+- ', line)) for line in lines)
    return [f'|{place}- {event}|' for place, event in enumerate(events, first)]


def without_words(lines):
    """The lines of a log, with the three of a fatal event in place of its word."""
    whole = []
    for line in lines:
        if line.startswith('fatal '):
            text = line.removeprefix('fatal ')
            blank = '' if ' :' in text else ' '  # without a detail
            whole += numbered([f'Fatal Error : {text}{blank}. '], whole)
            whole += ['||', '| (Application will exit)|']
        else:
            whole.append(line)
    return whole


def with_words(text):
    return re.sub(r'\|\d+- Fatal Error : (.*?\S) ?\. \|\n\|\|\n\| \(Application will exit\)\|',
                  r'fatal \1', text)


def text_lines(text, times):
    """The lines of a text file. times: before and after each run; a heading of that time is a word."""
    for begun, ended in times:
        for later in range(int((ended - begun).total_seconds()) + 1):
            time = (begun + timedelta(seconds=later)).strftime('%A, %d %B %Y at : %Hh %Mm %Ss')
            text = text.replace(f'\r\n\r\nInstalling Moriv : {time} \r\n\r\n', '\0\r\n')
    *lines, rest = text.split('\r\n')
    return ['heading' if line == '\0' else f'|{line}|' for line in lines] + (
        [f'|{rest}| without a line end'] if rest else [])


def misunderstood(image_tool, log, exit_code):
    """Lines that tell in what the tool takes a silent run for another one. log: host path."""
    done = subprocess.run([image_tool, 'explain', log], capture_output=True, text=True)
    told = [re.findall(rf'^{label} +(.*)', done.stdout, re.M) for label in ('exit code', 'event')]
    text = log.read_text(encoding='cp1252', errors='replace')  # with LF
    decided = [event for begin in ('Fatal Error : ', DECIDING.get(exit_code, '$'))
               for event in re.findall(rf'^(\d+- (?:{begin}).*?) *$', text, re.M)]
    decided = decided[:1] or ['none that tells how the run ended']
    if str(exit_code) in [code.split()[0] for code in told[0]] and told[1] == decided:
        return []
    return [f'explained as {told} {done.stderr}, not {exit_code} {decided}']
