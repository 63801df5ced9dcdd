"""Logs as scenarios have them: lines between bars, "heading" for the heading of a log, and one word for
the three lines of a fatal event."""

import re
from datetime import timedelta


def number(events, first=1):
    """Lines of a log."""
    return [f'|{place}- {event}|' for place, event in enumerate(events, first)]


def count_events(lines):
    return sum(bool(re.match(r'\|\d+- |fatal ', line)) for line in lines)


def without_words(lines):
    """The lines of a log, with the three of a fatal event in place of its word."""
    whole = []
    for line in lines:
        if line.startswith('fatal '):
            text = line.removeprefix('fatal ')
            blank = '' if ' :' in text else ' '  # without a detail
            whole += number([f'Fatal Error : {text}{blank}. '], 1 + count_events(whole))
            whole += ['||', '| (Application will exit)|']
        else:
            whole.append(line)
    return whole


def with_words(lines):
    text = '\n'.join(lines)
    return re.sub(r'\|\d+- Fatal Error : (.*?\S) ?\. \|\n\|\|\n\| \(Application will exit\)\|',
                  r'fatal \1', text).split('\n') if lines else []


def text_lines(text, times):
    """The lines of a text file. times: before and after each run, for headings; None for a text without."""
    parts = re.split(r'\r\n\r\nInstalling Moriv : (.*?) \r\n\r\n', text) if times else [text]
    lines = []
    for place, part in enumerate(parts):
        if place % 2 == 1:
            lines.append(_heading(part, times))
        elif part:
            lines += [f'|{line}|' for line in part.split('\r\n')]
            # What stands behind the last line end: nothing, as it should be.
            if lines.pop() != '||':
                lines.append(f'|{part.split(chr(10))[-1]}| without a line end')
    return lines


def _heading(stamp, times):
    """'heading' if the time is that of a run, else what it is."""
    good = {(begun + timedelta(seconds=later)).strftime('%A, %d %B %Y at : %Hh %Mm %Ss')
            for begun, ended in times for later in range(int((ended - begun).total_seconds()) + 1)}
    return 'heading' if stamp in good else f'heading with the time "{stamp}"'
