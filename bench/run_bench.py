#!/usr/bin/env python3
"""Measures what goals.py asks for, prints the table and writes docs/performance.md with its plots.

  run_bench.py [quick]

Ends with 1 when a figure misses its floor, with 2 when something could not be run. A quick run has
fewer rounds and smaller corpora, and leaves docs alone: its page is build/bench/performance.md.
"""
import re
import shutil
import subprocess
import sys
from dataclasses import dataclass
from pathlib import Path

import decoding
import install_growth
import installing
import many_files
import packing
import starting
import tool_growth
from corpora import BUILD, make_corpora
from goals import Figure
from report import document, summary_rows, terminal_table
from results import Results, Table
from timed_runs import BenchError, output_of, text_of
from wine_host import WineHost

SHIPPED = Path('build/bench-win32/MorivSetup.exe')


@dataclass
class Extent:
    libraries: int  # files
    text: int
    decoding: int   # rounds
    packing: int
    installing: int
    many: int
    sizing: int
    counts: tuple   # files
    sizes: tuple    # MB; the last one is held against 4
    tool_counts: tuple  # files, for the image tool
    tool_sizes: tuple   # MB


WHOLE = Extent(40, 11, 7, 3, 9, 5, 5, (1, 10, 100, 1000), (1, 4, 10, 40, 100, 400),
               (10, 100, 1000, 10_000), (1, 4, 16, 64, 250, 1000))
QUICK = Extent(8, 4, 3, 1, 3, 3, 3, (1, 10, 100, 1000), (1, 4, 10, 40),
               (10, 100, 1000), (1, 4, 16, 64))


def measure(extent):
    results = Results()
    say('corpora')
    corpora = libraries, text = make_corpora(extent.libraries, extent.text)
    say('expansion')
    decoding.measure_decoding(corpora, extent.decoding, results)
    decoding.measure_instructions(libraries, results)
    decoding.measure_expander_memory(results)
    say('packing')
    packing.measure_packing(corpora, extent.packing, results)
    packing.measure_packing_of_random_bytes(results)
    say('installs')
    installing.measure_native_install(libraries, extent.installing, results)
    with WineHost() as wine:
        say(f'no Wine, {wine.why_not}' if wine.why_not else f'under Wine, {wine.bits} bits')
        decoding.measure_decoding_under_wine(corpora, extent.decoding, wine, results)
        installing.measure_wine_install(libraries, extent.installing, wine, results)
        installing.measure_small_wine_install(libraries, extent.installing, wine, results)
        many_files.measure_many_files(text, extent.many, wine, results)
        starting.measure_starts(libraries, extent.installing, wine, results)
    say('growth')
    install_growth.measure_file_counts(text, extent.counts, extent.installing, results)
    install_growth.measure_sizes(libraries, extent.sizes, extent.sizing, results)
    tool_growth.measure_by_files(text, extent.tool_counts, results)
    tool_growth.measure_by_bytes(libraries, extent.tool_sizes, results)
    measure_program_size(results)
    return corpora, results


def measure_program_size(results):
    command = ['x86_64-w64-mingw32-objdump', '-h', SHIPPED]
    section = re.search(r'^\s*\d+ \.rsrc\s+([0-9a-f]+)', output_of(command), re.MULTILINE)
    size, resources = SHIPPED.stat().st_size, int(section[1], 16)
    table = Table('Size', 'The 32-bit Windows program, without a package.', ['Part', 'Bytes'],
                  [['whole', f'{size:,}'], ['resources', f'{resources:,}'],
                   ['the rest', f'{size - resources:,}']],
                  [f'stat -c %s {SHIPPED}', text_of(command)])
    results.figures['region'] = Figure(size, table.title)
    results.figures['code'] = Figure(size - resources, table.title)
    results.tables.append(table)


def say(what):
    print(f'bench: {what}', flush=True)


def write_document(folder, results, corpora, quick):
    (folder / 'performance.md').write_text(document(results, corpora, quick), encoding='utf-8')
    for table in results.tables:
        for name, plot in table.plots.items():
            (folder / name).write_text(plot, encoding='utf-8')


def main():
    quick = sys.argv[1:] == ['quick']
    if sys.argv[1:] and not quick:
        sys.exit(__doc__)
    shutil.rmtree(installing.WORK, ignore_errors=True)
    installing.WORK.mkdir(parents=True)
    try:
        corpora, results = measure(QUICK if quick else WHOLE)
    except (BenchError, OSError, subprocess.SubprocessError) as error:
        print(f'bench: {error}', file=sys.stderr)
        return 2
    write_document(BUILD if quick else Path('docs'), results, corpora, quick)
    rows = summary_rows(results)
    print(terminal_table(rows))
    missed = [what for what, *_, verdict in rows if verdict.startswith('floor missed')]
    if missed:
        print(f'bench: {len(missed)} of {len(rows)} miss their floor')
    return 1 if missed else 0


if __name__ == '__main__':
    sys.exit(main())
