"""Time and memory of the image tool's commands as packages grow, by files and by bytes."""

import re
import statistics
from dataclasses import dataclass

from corpora import IMAGE_TOOL, make_slices, megabyte_of, pack_command
from goals import Figure
from installing import WORK
from line_plot import line_plot
from results import Table
from timed_runs import Run, output_of, pinned, run_with_peak

COMMANDS = ('pack', 'verify', 'diff', 'plan')
BYTES_A_FILE = 1000
ROUNDS = 3
MANY_FILES, MANY_BYTES = 1000, 100_000_000  # one round for a package of more
COST = ('Seconds, and MB of memory at the peak; on one CPU, so in one thread. The copy of a machine '
        'that `plan` works on lies in memory.')
# Disks differ by a hundred times in what it costs to make and delete a file.
IN_MEMORY = {'TMPDIR': '/dev/shm'}


@dataclass
class Cost:
    seconds: float
    peak: int  # bytes of memory


def measure_by_files(corpus, counts, results):
    content = corpus.content()
    folder = WORK / 'growth-files'
    costs = {count: _measure(make_slices(folder, content[:count * BYTES_A_FILE], count))
             for count in counts}
    results.tables.append(_table('The image tool, by files', 'Files', costs,
                                 f'{BYTES_A_FILE:,} bytes of text in each file.'))


def measure_by_bytes(corpus, sizes, results):
    sample = megabyte_of(corpus)
    costs = {size: _measure(make_slices(WORK / 'growth-bytes', sample * size, 1)) for size in sizes}
    table = _table('The image tool, by bytes', 'MB', costs, 'One file, the same MB over and over.')
    growth = costs[sizes[-1]]['verify'].peak - costs[sizes[0]]['verify'].peak
    results.figures['verify-memory'] = Figure(growth / 1e6, table.title,
                                                     words={'large': sizes[-1]})
    results.tables.append(table)


def _measure(files):
    """What each command takes, by its name."""
    is_small = len(files) <= MANY_FILES and sum(file.stat().st_size for file in files) <= MANY_BYTES
    rounds = ROUNDS if is_small else 1
    costs = {}
    with pinned():
        for command, run in _runs(files).items():
            samples = [run_with_peak(run) for _ in range(rounds)]
            costs[command] = Cost(statistics.median(sample.seconds for sample, _ in samples),
                                  max(peak for _, peak in samples))
    return costs


def _runs(files):
    """By command; the first makes the image for the others."""
    image = files[0].parent.with_suffix('.image')
    arguments = {'verify': [image],
                 'diff': [image, image],  # so all bytes of both are compared
                 'plan': [image]}
    known = re.findall(r'^  ([a-z]+) ', output_of([IMAGE_TOOL, '--help']), re.MULTILINE)
    return {'pack': Run(pack_command(files, image))} | {
        command: Run([IMAGE_TOOL, command, *words], environment=IN_MEMORY)
        for command, words in arguments.items() if command in known}


def _table(title, head, costs, text):
    commands = list(next(iter(costs.values())))
    missing = [f'`{command}`' for command in COMMANDS if command not in commands]
    left_out = f' This tool has no {" and no ".join(missing)}.' if missing else ''
    rows = [[f'{x:,}', *(f'{cost[command].seconds:.3f}' for command in commands),
             *(f'{cost[command].peak / 1e6:.1f}' for command in commands)]
            for x, cost in costs.items()]
    return Table(title, f'{text} {COST}{left_out}',
                 [head, *(f'`{command}`, s' for command in commands),
                  *(f'`{command}`, MB' for command in commands)], rows, [],
                 plots=_plots(title, head, costs, commands))


def _plots(title, head, costs, commands):
    def plot(what, unit, value):
        lines = {command: [(x, value(cost[command])) for x, cost in costs.items()]
                 for command in commands}
        return line_plot(f'{title}: {what}', head, unit, lines, by_decades=True)

    name = f'performance-tool-{head.lower()}'
    return {f'{name}-time.svg': plot('time', 's', lambda cost: cost.seconds),
            f'{name}-memory.svg': plot('memory', 'MB', lambda cost: cost.peak / 1e6)}
