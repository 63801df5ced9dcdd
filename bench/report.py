"""The figures as a table on the terminal, and as docs/performance.md with its plots."""

import os
import platform
import re
import subprocess
from pathlib import Path

from goals import GOALS, verdict

COMPILERS = ('g++', 'i686-w64-mingw32-g++-win32', 'x86_64-w64-mingw32-g++-posix')
PEERS = ('libarchive13', 'libarchive-tools', 'zlib1g', 'ncompress', 'gzip', 'nsis', 'valgrind',
         'wine')
HEADS = ['What', 'Measured', 'Half of the rounds', 'Floor', 'Goal', '']

INTRODUCTION = """# Performance

Made by `make bench`; edits would be lost. Every figure is measured on the host below, in one run with what
it is compared with, as the median of the rounds' ratios. Ratios can be compared between hosts, times can't.
A figure that misses its floor fails `make bench`; one that misses only its goal is marked.

Of a timed figure the page also tells between what the middle half of the rounds lies: about so far do two
runs differ. A goal between the two is neither reached nor missed, but within the noise. Runs hours
apart differ by more, and so do hosts of one kind: with the same programs, expansion under Wine, libraries, has been
3.57 to 3.76 times as fast as the plain decoder, and on text 1.99 to 2.11 times as fast as zlib.
"""
QUICK_NOTE = """
This was a quick run: fewer rounds, smaller corpora.
"""
CORPORA_NOTE = """

A sum is the SHA-256 of all files of a corpus, one behind the other in the order of their names: the same
packages give the same files. MB are 1,000,000 bytes.
"""
AGAIN = """## Again

    make bench                 # everything, and this page
    make bench BENCH=quick     # a first look; its page and plots go to build/bench

The peers come from Debian, by `tools/bootstrap bench`. All timed runs share one CPU, each after a round
that warms the caches; those under Wine have a display of their own (`xvfb-run -a` before the command). Leave
the machine alone meanwhile. The commands under the tables can be given again, from the root, as long as
`build/` stands.
"""


def summary_rows(results, linked=False):
    """Rows for HEADS; a linked one leads to the section that tells more."""
    rows = []
    for goal in GOALS:
        figure = results.figures[goal.key]
        what = goal.what.format(**(figure.words or {}))
        if linked and figure.section:
            what = f'[{what}](#{_anchor(figure.section)})'
        measured = figure.why_not if figure.value is None else _number(figure.value, goal.unit)
        rows.append([what, measured, _spread(figure.spread), _limit(goal.floor, goal),
                     _limit(goal.goal, goal), verdict(goal, figure)])
    return rows


def terminal_table(rows):
    rows = [HEADS, *rows]
    widths = [max(map(len, column)) for column in zip(*rows)]
    return '\n'.join('  '.join(map(str.ljust, row, widths)).rstrip() for row in rows)


def document(results, corpora, quick):
    parts = [INTRODUCTION + (QUICK_NOTE if quick else ''),
             _markdown_table(HEADS, summary_rows(results, linked=True)),
             '## Host\n\n' + _markdown_table(['', ''], _host()),
             '## Corpora\n\n' + '\n'.join(map(_corpus_line, corpora)) + CORPORA_NOTE]
    for table in results.tables:
        parts.append(f'## {table.title}\n\n{table.text}\n\n'
                     + _markdown_table(table.heads, table.rows))
        if table.commands:
            parts.append(''.join(f'    {command}\n' for command in table.commands))
        parts += [f'![{table.title}]({plot})\n' for plot in table.plots]
    return '\n'.join([*parts, AGAIN])


def _corpus_line(corpus):
    note = '' if corpus.is_known() else ' **Not the files by which the goals were set.**'
    return (f'- **{corpus.name}**: {corpus.words}, {len(corpus.files)} files, {corpus.size:,} '
            f'bytes, of {corpus.versions}. Sum `{corpus.sum()}`.{note}')


def _markdown_table(heads, rows):
    lines = [heads, ['---'] * len(heads), *rows]
    return ''.join('| ' + ' | '.join(line) + ' |\n' for line in lines)


def _anchor(title):
    return re.sub(r'[^a-z0-9 -]', '', title.lower()).replace(' ', '-')


def _number(value, unit):
    if unit == 'bytes':
        return f'{value:,.0f} bytes'
    return f'{value:.3f}' if unit == '' else f'{value:.2f} {unit}'


def _spread(spread):
    return f'{spread[0]:.3g} to {spread[1]:.3g}' if spread else ''


def _limit(limit, goal):
    if limit is None:
        return ''
    number = f'{limit:,}' if goal.unit == 'bytes' else f'{limit:g}'
    return ('at least ' if goal.more_is_better else 'at most ') + number


def _host():
    cpus = re.findall(r'model name\s*: (.*)', Path('/proc/cpuinfo').read_text())
    memory = int(re.search(r'MemTotal:\s*(\d+)', Path('/proc/meminfo').read_text())[1])
    rows = [['CPU', f'{cpus[0]}, {len(cpus)} of them'],
            ['Memory', f'{memory / 1024 / 1024:.0f} GiB'],
            ['Kernel', f'{platform.system()} {platform.release()} {platform.machine()}'],
            ['Load', f'{os.getloadavg()[2]:.1f} programs at a time, over the last 15 minutes'],
            ['System', platform.freedesktop_os_release()['PRETTY_NAME']]]
    rows += [['Compiler', _output([compiler, '--version']).split('\n')[0]]
             for compiler in COMPILERS]
    versions = _output(['dpkg-query', '-W', '-f', '${Package} ${Version}\n', *PEERS]).splitlines()
    return [*rows, ['Peers', ', '.join(versions)]]


def _output(command):
    """A package that isn't installed is no failure."""
    return subprocess.run(command, capture_output=True, text=True).stdout
