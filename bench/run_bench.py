#!/usr/bin/env python3
"""Measures what goals.py asks for, prints the table and writes docs/performance.md with its plots.

  run_bench.py [quick]

Ends with 1 when a figure is beyond its floor. A quick run has fewer rounds and smaller corpora, and
leaves docs alone: its page is build/bench/performance.md.
"""
import re
import shutil
import sys
from dataclasses import dataclass
from pathlib import Path

import decoding
import installing
import packing
from corpora import BUILD, ROOT, make_libraries, make_text, pack_command, write_streams
from goals import GOALS, Figure, verdict
from line_plot import line_plot
from report import document, summary_rows, terminal_table
from results import Results
from timed_runs import BenchError, output_of
from wine_host import WineHost

SHIPPED = ROOT / 'build/bench-win32/MorivSetup.exe'


@dataclass
class Extent:
    libraries: int        # files
    text: int
    decoding: int         # rounds
    installing: int
    sizing: int
    counts: tuple         # files of the packages that differ in their number
    sizes: tuple          # MB of the packages that differ in size; 4 is what the last is held against


WHOLE = Extent(40, 11, 7, 9, 5, (1, 10, 100, 1000), (1, 4, 10, 40, 100, 400))
QUICK = Extent(8, 3, 3, 3, 3, (1, 10, 100, 1000), (1, 4, 10, 40))
BYTES_OF_COUNTS = 4_000_000


@dataclass
class Corpus:
    name: str
    words: str
    files: list

    @property
    def folder(self):
        return self.files[0].parent

    @property
    def streams(self):
        return self.folder.with_suffix('.streams')

    @property
    def image(self):
        return self.folder.with_suffix('.image')

    @property
    def size(self):
        return sum(file.stat().st_size for file in self.files)


def make_corpora(extent):
    folder = BUILD / 'corpora'
    corpora = [Corpus('libraries', 'Wine\'s own libraries, stripped',
                      make_libraries(folder / 'libraries', extent.libraries)),
               Corpus('text', 'C headers and documentation',
                      make_text(folder / 'text', extent.text))]
    for corpus in corpora:
        output_of(pack_command(corpus.files, corpus.image))
        write_streams(corpus.files, corpus.image, corpus.streams)
    return corpora


def megabyte_of(corpus):
    """Equal parts out of the middle of each file."""
    size = 1_000_000 // len(corpus.files)
    parts = []
    for file in corpus.files:
        content = file.read_bytes()
        parts.append(content[len(content) // 2:][:size])
    return b''.join(parts)


def measure_program_size(results):
    command = ['x86_64-w64-mingw32-objdump', '-h', SHIPPED]
    resources = re.search(r'^\s*\d+ \.rsrc\s+([0-9a-f]+)', output_of(command), re.MULTILINE)
    text = f'x86_64-w64-mingw32-objdump -h {SHIPPED}'
    size = SHIPPED.stat().st_size
    results.figures['region'] = Figure(size, f'stat -c %s {SHIPPED}')
    results.figures['code'] = Figure(size - int(resources[1], 16), text)


def measure(extent):
    results = Results()
    say('corpora')
    corpora = make_corpora(extent)
    libraries, text = corpora
    say('expansion')
    decoding.measure_decoding(corpora, extent.decoding, results)
    decoding.measure_instructions(libraries, results)
    decoding.measure_expander_memory(results)
    say('packing')
    packing.measure_packing(corpora, results)
    say('installs')
    installing.measure_native_install(libraries, extent.installing, results)
    with WineHost() as wine:
        say(f'under Wine, {wine.bits} bits' if not wine.why_not else f'no Wine: {wine.why_not}')
        decoding.measure_decoding_under_wine(corpora, extent.decoding, wine, results)
        installing.measure_wine_install(libraries, extent.installing, wine, results)
        installing.measure_small_wine_install(libraries, extent.installing, wine, results)
    say('growth')
    content = b''.join(file.read_bytes() for file in text.files) * 2
    counts = installing.measure_file_counts(content[:BYTES_OF_COUNTS], extent.counts,
                                            extent.installing, results)
    sizes = installing.measure_sizes(megabyte_of(libraries), extent.sizes, extent.sizing, results)
    measure_program_size(results)
    results.plots = {
        'performance-files.svg': line_plot('4 MB in ever more files', 'files', 'ms', counts),
        'performance-growth.svg': line_plot('Install of one file, by its size', 'MB', 'ms a MB',
                                            sizes)}
    return corpora, results


def say(what):
    print(f'bench: {what}', flush=True)


def write_document(folder, results, corpora, quick):
    (folder / 'performance.md').write_text(document(results, corpora, quick), encoding='utf-8')
    for name, plot in results.plots.items():
        (folder / name).write_text(plot, encoding='utf-8')


def main():
    quick = sys.argv[1:] == ['quick']
    if sys.argv[1:] and not quick:
        sys.exit(__doc__)
    shutil.rmtree(installing.WORK, ignore_errors=True)
    try:
        corpora, results = measure(QUICK if quick else WHOLE)
    except BenchError as error:
        print(f'bench: {error}', file=sys.stderr)
        return 2
    finally:
        shutil.rmtree(installing.WORK, ignore_errors=True)
    write_document(BUILD if quick else ROOT / 'docs', results, corpora, quick)
    rows = summary_rows(results)
    print(terminal_table(rows))
    below = [row[0] for row in rows if row[-1] == 'below the floor']
    for what in below:
        print(f'bench: below the floor: {what}')
    return 1 if below else 0


if __name__ == '__main__':
    sys.exit(main())
