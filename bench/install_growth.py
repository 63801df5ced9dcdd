"""Native installs as packages grow, by files and by bytes."""

import statistics
from pathlib import Path

from corpora import make_slices, megabyte_of, pack_command
from goals import ratio_figure
from installing import WORK, native_install
from line_plot import line_plot
from results import Table
from timed_runs import (Run, discard_output, median_ratio, medians, output_of, pinned,
                        time_in_turn)

BYTES_OF_COUNTS = 4_000_000  # in packages that differ in the number of their files
# Where files are made: what a disk takes for a new one differs by the moment more than the programs do.
IN_MEMORY = Path('/dev/shm/moriv-bench')


def measure_file_counts(corpus, counts, rounds, results):
    """Packages of the same bytes in ever more files, against a copy of the same files."""
    content = corpus.content()[:BYTES_OF_COUNTS]
    runs = {}
    for count in counts:
        files = make_slices(WORK / f'files{count}', content, count)
        image, copy = WORK / f'files{count}.image', IN_MEMORY / f'copy{count}'
        output_of(pack_command(files, image))
        runs['install', count] = native_install(image, IN_MEMORY / f'machine-files{count}')
        runs['cp', count] = Run(['cp', '-r', files[0].parent, copy], makes=copy)
    IN_MEMORY.mkdir(exist_ok=True)
    seconds = _time_and_discard(runs, rounds)
    IN_MEMORY.rmdir()
    times = medians(seconds)
    lines = {program: [(count, times[program, count] * 1e3) for count in counts]
             for program in ('install', 'cp')}
    most = counts[-1]
    table = Table('More files of the same total', f'{len(content):,} bytes of text, natively, in memory. '
                  f'Medians of {rounds} rounds.',
                  ['Files', 'Install, ms', '`cp -r`, ms', 'Install / `cp -r`'],
                  [[str(count), f'{times["install", count] * 1e3:.1f}',
                    f'{times["cp", count] * 1e3:.1f}',
                    f'{median_ratio(seconds["install", count], seconds["cp", count]):.2f}']
                   for count in counts],
                  [runs[program, most].text() for program in ('install', 'cp')],
                  {'performance-files.svg': line_plot('4 MB in ever more files', 'files', 'ms',
                                                      lines)})
    results.figures['time-per-file'] = ratio_figure(seconds['install', most], seconds['cp', most],
                                                    table.title, corpora=(corpus,))
    results.tables.append(table)


def measure_sizes(corpus, sizes, rounds, results):
    """Packages of one file, the same MB over and over. What an install of one byte takes is taken
    off, since it would hide growth."""
    sample = megabyte_of(corpus)
    runs = {}
    for size in (0, *sizes):
        file = WORK / f'size{size}' / 'payload.dat'
        file.parent.mkdir()
        file.write_bytes(sample * size or sample[:1])
        image = WORK / f'size{size}.image'
        output_of(pack_command([file], image))
        file.unlink()
        runs[size] = native_install(image, f'machine-size{size}')
    seconds = _time_and_discard(runs, rounds)
    least = statistics.median(seconds[0])
    per_megabyte = {size: [(time - least) / size * 1e3 for time in seconds[size]]
                    for size in sizes}
    line = medians(per_megabyte)
    table = Table('Larger packages', f'One file, natively. An install of one byte takes '
                  f'{least * 1e3:.1f} ms, which is taken off in the last column. Medians of '
                  f'{rounds} rounds.', ['MB', 'Install, s', 'ms a MB'],
                  [[str(size), f'{statistics.median(seconds[size]):.3f}', f'{line[size]:.2f}']
                   for size in sizes],
                  [runs[sizes[-1]].text()],
                  {'performance-growth.svg': line_plot('Install of one file', 'MB', 'ms a MB',
                                                       {'install': list(line.items())})})
    results.figures['growth'] = ratio_figure(per_megabyte[sizes[-1]], per_megabyte[4], table.title,
                                             words={'large': sizes[-1]}, corpora=(corpus,))
    results.tables.append(table)


def _time_and_discard(runs, rounds):
    with pinned():
        seconds = time_in_turn(runs, rounds)
    for run in runs.values():
        discard_output(run)
    return seconds
