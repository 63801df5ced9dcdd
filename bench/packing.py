"""Packing: size against plain greedy, and speed."""

from corpora import BUILD, pack_command, packed_streams
from goals import Figure
from results import Table
from timed_runs import Run, output_of, run_once

GREEDY = BUILD / 'greedy_packer'


def measure_packing(corpora, results):
    table = Table('Packing', 'Bytes of the streams alone; speed by the processor time of the whole '
                  'tool.', ['Packer', 'Corpus', 'Bytes', '/ plain greedy', 'MB/s a core'], [], [])
    ratios, seconds = [], 0  # of the default packer
    for corpus in corpora:
        greedy = int(output_of([GREEDY, *corpus.files]))
        table.rows.append(['plain greedy', corpus.name, f'{greedy:,}', '1.000', ''])
        by_default, cpu = _pack(corpus, (), greedy, table)
        ratios.append(by_default)
        seconds += cpu
        at_best, _ = _pack(corpus, ('--best',), greedy, table)
        results.figures[f'pack-best-{corpus.name}'] = Figure(at_best, table.title)
    results.figures['pack-default'] = Figure(sum(ratios) / len(ratios), table.title)
    results.figures['pack-speed'] = Figure(sum(corpus.size for corpus in corpora) / seconds / 1e6,
                                           table.title)
    results.tables.append(table)


def _pack(corpus, options, greedy, table):
    """The streams' bytes against those of plain greedy, and the processor time."""
    image = corpus.folder.with_suffix('.packed')
    run = Run(pack_command(corpus.files, image, options=options))
    seconds = run_once(run).cpu
    size = sum(len(stream) for stream in packed_streams(image))
    table.rows.append([f'`{" ".join(["pack", *options])}`', corpus.name, f'{size:,}',
                       f'{size / greedy:.3f}', f'{corpus.size / seconds / 1e6:.1f}'])
    table.commands.append(run.text())
    return size / greedy, seconds
