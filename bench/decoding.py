"""Expansion: speed against the peers', instructions, memory."""

import re

from corpora import BUILD
from goals import Figure, ratio_figure
from results import Table
from timed_runs import median_ratio, medians, output_of, pinned, text_of

DECODERS = {'expander': 'the expander', 'plain': 'plain decoder',
            'libarchive': 'libarchive, `.Z`', 'zlib': 'zlib inflate, 64 KB buffers'}
HEADS = ['Decoder', 'Corpus', 'MB/s', "Time / the expander's"]
PROGRAM = BUILD / 'decode_bench'


def measure_decoding(corpora, rounds, results):
    table = Table('Expansion', 'All decoders in one process, in turn, on one CPU; processor time. The '
                  'expander has the streams that `pack` makes, the peers those of their own '
                  f'formats. Medians of {rounds} rounds.', HEADS, [], [])
    for corpus in corpora:
        command = [PROGRAM, corpus.folder, corpus.streams, rounds]
        seconds = _time_decoders(command, corpus, table)
        for peer in ('libarchive', 'zlib'):
            results.figures[f'expand-{peer}-{corpus.name}'] = ratio_figure(
                seconds[peer], seconds['expander'], table.title, corpora=(corpus,))
    results.tables.append(table)


def measure_decoding_under_wine(corpora, rounds, wine, results):
    """The Windows build of the same program, which has no peers but the plain decoder."""
    keys = {corpus.name: f'expand-wine-{corpus.name}' for corpus in corpora}
    if wine.why_not:
        results.figures |= {key: Figure(why_not=wine.why_not) for key in keys.values()}
        return
    table = Table('Expansion by the Windows program', f'The {wine.bits}-bit Windows build under '
                  f'Wine, one process. Medians of {rounds} rounds.', HEADS, [], [])
    for corpus in corpora:
        command = wine.command(wine.build / 'decode_bench.exe', corpus.folder, corpus.streams,
                               rounds)
        seconds = _time_decoders(command, corpus, table)
        results.figures[keys[corpus.name]] = ratio_figure(seconds['plain'], seconds['expander'],
                                                          table.title, corpora=(corpus,))
    results.tables.append(table)


def measure_instructions(corpus, results):
    """Instructions inside the decoder's call, for the largest file of the corpus."""
    largest = max(corpus.files, key=lambda file: file.stat().st_size)
    size = largest.stat().st_size
    stream = corpus.streams / f'{largest.name}.pkz'
    table = Table('Instructions', 'Counted by callgrind inside the call that expands '
                  f'{largest.name}, {size:,} bytes.',
                  ['Decoder', 'Million instructions', 'Instructions a byte'], [], [])
    counts = {}
    for decoder in ('expander', 'plain'):
        command = ['valgrind', '--tool=callgrind', '--callgrind-out-file=/dev/null',
                   '--toggle-collect=DecodeOnce', PROGRAM, 'once', decoder, stream]
        counts[decoder] = int(re.search(r'Collected : (\d+)',
                                        output_of(command, error_output=True))[1])
        table.commands.append(text_of(command))
        table.rows.append([DECODERS[decoder], f'{counts[decoder] / 1e6:.1f}',
                           f'{counts[decoder] / size:.1f}'])
    results.figures['instructions'] = Figure(counts['expander'] / counts['plain'], table.title,
                                             corpora=(corpus,))
    results.tables.append(table)


def measure_expander_memory(results):
    command = [PROGRAM, 'memory']
    size = int(output_of(command))
    table = Table('Memory of one expander', 'Heap of one expander with its tables, taken once and '
                  'never more.', ['Bytes'], [[f'{size:,}']], [text_of(command)])
    results.figures['expander-memory'] = Figure(size, table.title)
    results.tables.append(table)


def _time_decoders(command, corpus, table):
    """Seconds of each decoder's rounds; the table gets a row for each."""
    with pinned():
        lines = output_of(command).splitlines()
    seconds = {}
    for line in lines:
        name, figure = line.split()
        seconds.setdefault(name, []).append(float(figure))
    for name, time in medians(seconds).items():
        table.rows.append([DECODERS[name], corpus.name, f'{corpus.size / time / 1e6:.0f}',
                           f'{median_ratio(seconds[name], seconds["expander"]):.2f}'])
    table.commands.append(text_of(command))
    return seconds
