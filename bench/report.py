"""The figures as a table on the terminal, and as docs/performance.md with its plots."""

import platform
import re

from corpora import ROOT
from goals import GOALS, Figure, verdict
from timed_runs import output_of

COMPILERS = ('g++', 'i686-w64-mingw32-g++-win32', 'x86_64-w64-mingw32-g++-win32')
PEERS = ('libarchive13', 'libarchive-tools', 'zlib1g', 'ncompress', 'gzip', 'nsis', 'valgrind',
         'wine')


def summary_rows(results):
    rows = []
    for goal in GOALS:
        figure = results.figures.get(goal.key, Figure(why_not='nothing measured it'))
        what = goal.what.format(**(figure.words or {}))
        measured = figure.why_not if figure.value is None else _number(figure.value, goal.unit)
        floor = '' if goal.floor is None else _limit(goal.floor, goal)
        rows.append([what, measured, floor, _limit(goal.goal, goal), verdict(goal, figure)])
    return rows


def terminal_table(rows):
    rows = [['What', 'Measured', 'Floor', 'Goal', ''], *rows]
    widths = [max(len(row[column]) for row in rows) for column in range(5)]
    return '\n'.join('  '.join(cell.ljust(width) for cell, width in zip(row, widths)).rstrip()
                     for row in rows)


def document(results, corpora, quick):
    whole = [
        '# Performance', '',
        'Made by `make bench`; do not edit. Every figure is measured on the host below, in one run with '
        'what it is compared with. A figure beyond its floor fails `make bench`; one short of its goal '
        'is marked. Ratios can be compared between hosts, times can\'t.', '']
    if quick:
        whole += ['This is a quick run: fewer rounds, smaller corpora.', '']
    whole += _markdown_table(['What', 'Measured', 'Floor', 'Goal', 'Verdict'], summary_rows(results))
    whole += ['', '## Host', '', *_markdown_table(['', ''], _host()), '', '## Corpora', '']
    for corpus in corpora:
        whole.append(f'- **{corpus.name}**: {corpus.words}, {len(corpus.files)} files, '
                     f'{corpus.size:,} bytes.')
    whole += ['', 'MB are 1,000,000 bytes.', '']
    for table in results.tables:
        whole += [f'## {table.title}', '', table.text, '', *_markdown_table(table.heads, table.rows),
                  '', f'    {_relative(table.command)}', '']
        if table.plot:
            whole += [f'![{table.title}]({table.plot})', '']
    whole += ['## Commands', '', 'Each figure of the first table came from this command, run from the '
              'root after `make bench` has made its input; the peer\'s is like it.', '']
    for goal in GOALS:
        figure = results.figures.get(goal.key)
        if figure and figure.command:
            whole.append(f'- {goal.what.format(**(figure.words or {}))}:\n  `{_relative(figure.command)}`')
    whole += ['', '## Again', '',
              '    make bench                 # everything, and this page',
              '    make bench BENCH=quick     # a first look: page and plots go to build/bench',
              '',
              'The peers come from Debian, by `tools/bootstrap --bench`. All runs share one CPU, each '
              'after a round that warms the caches. Leave the machine alone meanwhile.']
    return '\n'.join(whole) + '\n'


def _markdown_table(heads, rows):
    lines = [heads, ['---'] * len(heads), *rows]
    return ['| ' + ' | '.join(line) + ' |' for line in lines]


def _number(value, unit):
    if unit == 'bytes':
        return f'{value:,.0f} bytes'
    return f'{value:.3f}' if unit == '' else f'{value:.2f} {unit}'


def _limit(limit, goal):
    number = f'{limit:,}' if goal.unit == 'bytes' else f'{limit:g}'
    return ('at least ' if goal.more_is_better else 'at most ') + number


def _relative(text):
    return text.replace(f'{ROOT}/', '')


def _host():
    cpu = re.search(r'model name\s*: (.*)', (ROOT / '/proc/cpuinfo').read_text())[1]
    cpus = (ROOT / '/proc/cpuinfo').read_text().count('\nprocessor') + 1
    memory = int(re.search(r'MemTotal:\s*(\d+)', (ROOT / '/proc/meminfo').read_text())[1])
    rows = [['CPU', f'{cpu}, {cpus} of them'],
            ['Memory', f'{memory / 1024 / 1024:.0f} GiB'],
            ['Kernel', f'{platform.system()} {platform.release()} {platform.machine()}'],
            ['System', platform.freedesktop_os_release()['PRETTY_NAME']]]
    rows += [['Compiler', output_of([compiler, '--version']).split('\n')[0]]
             for compiler in COMPILERS]
    rows.append(['Peers', ', '.join(
        f'{package} {version}' for package in PEERS
        if (version := _version(package)))])
    return rows


def _version(package):
    try:
        return output_of(['dpkg-query', '-W', '-f', '${Version}', package])
    except Exception:  # not installed
        return ''
