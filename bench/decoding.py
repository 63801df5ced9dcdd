"""Expansion: speed against the peers', instructions, memory."""

import re
import shlex
import statistics

from corpora import BUILD
from goals import Figure
from results import Table
from timed_runs import output_of, pinned

DECODERS = {'expander': 'the expander', 'letter': 'decoder to the letter',
            'libarchive': 'libarchive, `.Z`', 'zlib': 'zlib inflate, 64 KB buffers'}
PROGRAM = BUILD / 'decode_bench'


def measure_decoding(corpora, rounds, results):
    rows = []
    for corpus in corpora:
        command = [PROGRAM, corpus.folder, corpus.streams, rounds]
        seconds = _median_seconds(command)
        for peer in ('libarchive', 'zlib'):
            results.figures[f'expand-{peer}-{corpus.name}'] = Figure(
                seconds[peer] / seconds['expander'], _text(command))
        for name, words in DECODERS.items():
            rows.append([words, corpus.name, f'{corpus.size / seconds[name] / 1e6:.0f}',
                         f'{seconds[name] / seconds["expander"]:.2f}'])
    results.tables.append(Table(
        'Expansion', 'All decoders in one process, in turn, on one CPU. The peers expand the same '
        f'files from their own formats. Medians of {rounds} rounds.',
        ['Decoder', 'Corpus', 'MB/s', 'Time / the expander\'s'], rows, _text(command)))


def measure_decoding_under_wine(corpora, rounds, wine, results):
    """The Windows build of the same program, which has no peers but the decoder to the letter."""
    rows, command = [], []
    for corpus in corpora:
        key = f'expand-wine-{corpus.name}'
        if wine.why_not:
            results.figures[key] = Figure(why_not=wine.why_not)
            continue
        command = wine.command(wine.build / 'decode_bench.exe', wine.path(corpus.folder),
                               wine.path(corpus.streams), rounds)
        seconds = _median_seconds(command)
        results.figures[key] = Figure(seconds['letter'] / seconds['expander'], _text(command))
        for name in ('expander', 'letter'):
            rows.append([DECODERS[name], corpus.name, f'{corpus.size / seconds[name] / 1e6:.0f}',
                         f'{seconds[name] / seconds["expander"]:.2f}'])
    if rows:
        results.tables.append(Table(
            'Expansion by the Windows program', f'The {wine.bits}-bit Windows build under Wine, '
            f'one process. Medians of {rounds} rounds.',
            ['Decoder', 'Corpus', 'MB/s', 'Time / the expander\'s'], rows, _text(command)))


def measure_instructions(corpus, results):
    """Instructions inside the decoder's call, for the largest file of the corpus."""
    largest = max(corpus.files, key=lambda file: file.stat().st_size)
    stream = corpus.streams / f'{largest.name}.pkz'
    counts, command = {}, []
    for decoder in ('expander', 'letter'):
        command = ['valgrind', '--tool=callgrind', '--callgrind-out-file=/dev/null',
                   '--toggle-collect=DecodeOnce', PROGRAM, 'once', decoder, stream]
        counts[decoder] = int(re.search(r'Collected : (\d+)',
                                        output_of(command, error_output=True))[1])
    results.figures['instructions'] = Figure(counts['expander'] / counts['letter'], _text(command))
    results.tables.append(Table(
        'Instructions', f'Counted by callgrind inside the call that expands {largest.name}, '
        f'{largest.stat().st_size:,} bytes.', ['Decoder', 'Million instructions', 'A byte'],
        [[DECODERS[name], f'{count / 1e6:.1f}', f'{count / largest.stat().st_size:.1f}']
         for name, count in counts.items()], _text(command)))


def measure_expander_memory(results):
    command = [PROGRAM, 'memory']
    results.figures['expander-memory'] = Figure(int(output_of(command)), _text(command))


def _median_seconds(command):
    with pinned():
        lines = output_of(command).split('\n')
    seconds = {}
    for line in filter(None, (line.strip() for line in lines)):
        name, figure = line.split(' ')
        seconds.setdefault(name, []).append(float(figure))
    return {name: statistics.median(group) for name, group in seconds.items()}


def _text(command):
    return shlex.join(str(word) for word in command)
