"""Packing: size against plain greedy, and speed."""

import statistics
import subprocess
from dataclasses import dataclass

from corpora import BUILD, PEER_PACKERS, make_random, pack_command, packed_streams
from goals import Figure, middle_half
from results import Table
from timed_runs import Run, output_of, pinned, run_in_turn, run_once

GREEDY = BUILD / 'greedy_packer'
RANDOM = 1_000_000  # bytes
WAYS = {'`pack`': (), '`pack --best`': ('--best',)}


@dataclass
class Packed:
    ratio: float   # of the streams' bytes to those of plain greedy
    seconds: list  # of processor time, round by round


def measure_packing(corpora, rounds, results):
    table = Table('Packing', 'Bytes of the streams alone; speed by the processor time of the whole '
                  f'tool. Medians of {rounds} rounds.',
                  ['Packer', 'Corpus', 'Bytes', '/ plain greedy', 'MB/s a core'], [], [])
    packed = {corpus.name: _pack(corpus, rounds, table) for corpus in corpora}
    default, best = WAYS
    for corpus in corpora:
        results.figures[f'pack-best-{corpus.name}'] = Figure(
            packed[corpus.name][best].ratio, table.title, corpora=(corpus,))
    results.figures['pack-default'] = Figure(
        statistics.mean(ways[default].ratio for ways in packed.values()), table.title,
        corpora=corpora)
    size = sum(corpus.size for corpus in corpora)
    for way, key in ((default, 'pack-speed'), (best, 'pack-best-speed')):
        rounds_of_all = zip(*(ways[way].seconds for ways in packed.values()))
        speeds = [size / sum(seconds) / 1e6 for seconds in rounds_of_all]
        results.figures[key] = Figure(statistics.median(speeds), table.title,
                                      spread=middle_half(speeds), corpora=corpora)
    results.tables.append(table)


def _pack(corpus, rounds, table):
    """What each way made of the corpus; the table gets a row for each, and one for plain greedy."""
    greedy = int(output_of([GREEDY, *corpus.files]))
    table.rows.append(['plain greedy', corpus.name, f'{greedy:,}', '1.000', ''])
    images = {way: corpus.folder.with_suffix(f'.packed{"".join(options)}')
              for way, options in WAYS.items()}
    runs = {way: Run(pack_command(corpus.files, images[way], options=options))
            for way, options in WAYS.items()}
    with pinned():
        samples = run_in_turn(runs, rounds)
    packed = {}
    for way, run in runs.items():
        size = sum(len(stream) for stream in packed_streams(images[way]))
        packed[way] = Packed(size / greedy, [sample.cpu for sample in samples[way]])
        speed = corpus.size / statistics.median(packed[way].seconds) / 1e6
        table.rows.append([way, corpus.name, f'{size:,}', f'{size / greedy:.3f}', f'{speed:.1f}'])
        table.commands.append(run.text())
    return packed


def measure_packing_of_random_bytes(results):
    """Beside the peer's packer, for which such bytes are no special case."""
    file, = make_random(RANDOM)
    table = Table('Packing what can\'t be compressed', f'{RANDOM:,} random bytes.',
                  ['Packer', 'Bytes', '/ the file'], [], [])
    image = file.parent.with_suffix('.packed')
    for way, options in WAYS.items():
        run = Run(pack_command([file], image, options=options))
        run_once(run)
        stream, = packed_streams(image)
        table.rows.append([way, f'{len(stream):,}', f'{len(stream) / RANDOM:.4f}'])
        table.commands.append(run.text())
        if not options:
            results.figures['pack-random'] = Figure(len(stream) / RANDOM, table.title)
    peer = PEER_PACKERS['.Z']
    size = len(subprocess.run([*peer, file], capture_output=True, check=True).stdout)
    table.rows.append([f'`{" ".join(peer)}`', f'{size:,}', f'{size / RANDOM:.4f}'])
    results.tables.append(table)
