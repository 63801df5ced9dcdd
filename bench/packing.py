"""Packing: size against plain greedy, and speed."""

import subprocess

from corpora import BUILD, PEER_PACKERS, make_random, pack_command, packed_streams
from goals import Figure
from results import Table
from timed_runs import Run, output_of, run_once

GREEDY = BUILD / 'greedy_packer'
RANDOM = 1_000_000  # bytes


def measure_packing(corpora, results):
    table = Table('Packing', 'Bytes of the streams alone; speed by the processor time of the whole '
                  'tool.', ['Packer', 'Corpus', 'Bytes', '/ plain greedy', 'MB/s a core'], [], [])
    ratios, seconds, best_seconds = [], 0, 0  # of the default packer, and of the best
    for corpus in corpora:
        greedy = int(output_of([GREEDY, *corpus.files]))
        table.rows.append(['plain greedy', corpus.name, f'{greedy:,}', '1.000', ''])
        by_default, cpu = _pack(corpus, (), greedy, table)
        ratios.append(by_default)
        seconds += cpu
        at_best, cpu = _pack(corpus, ('--best',), greedy, table)
        best_seconds += cpu
        results.figures[f'pack-best-{corpus.name}'] = Figure(at_best, table.title)
    results.figures['pack-default'] = Figure(sum(ratios) / len(ratios), table.title)
    size = sum(corpus.size for corpus in corpora)
    results.figures['pack-speed'] = Figure(size / seconds / 1e6, table.title)
    results.figures['pack-best-speed'] = Figure(size / best_seconds / 1e6, table.title)
    results.tables.append(table)


def measure_packing_of_random_bytes(results):
    """Beside the peer's packer, for which such bytes are no special case."""
    file, = make_random(RANDOM)
    table = Table('Packing what can\'t be compressed', f'{RANDOM:,} random bytes.',
                  ['Packer', 'Bytes', '/ the file'], [], [])
    image = file.parent.with_suffix('.packed')
    for options in ((), ('--best',)):
        run = Run(pack_command([file], image, options=options))
        run_once(run)
        stream, = packed_streams(image)
        table.rows.append([f'`{" ".join(["pack", *options])}`', f'{len(stream):,}',
                           f'{len(stream) / RANDOM:.4f}'])
        table.commands.append(run.text())
        if not options:
            results.figures['pack-random'] = Figure(len(stream) / RANDOM, table.title)
    peer = PEER_PACKERS['.Z']
    size = len(subprocess.run([*peer, file], capture_output=True, check=True).stdout)
    table.rows.append([f'`{" ".join(peer)}`', f'{size:,}', f'{size / RANDOM:.4f}'])
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
