"""What a start costs under Wine: the dialog's until its page stands, and a removal program's."""

from corpora import IMAGE_TOOL, make_slices, pack_command
from goals import Figure, ratio_figure
from installing import EMPTY, SMALL_PACKAGE, WORK
from results import Table
from timed_runs import Run, medians, output_of, pinned, time_in_turn

DIALOG, EMPTY_DIALOG, REMOVAL_PROGRAM = 'dialog', 'empty dialog', 'removal program'
KEYS = {'dialog-start': (DIALOG, EMPTY_DIALOG), 'removal-start': (REMOVAL_PROGRAM, EMPTY)}


def measure_starts(corpus, rounds, wine, results):
    """On a machine without the product."""
    if wine.why_not:
        results.figures |= {key: Figure(why_not=wine.why_not) for key in KEYS}
        return
    image, removal = WORK / 'three.exe', WORK / 'MorivRmv.exe'
    files = make_slices(WORK / 'three', corpus.content()[:SMALL_PACKAGE], 3)
    output_of(pack_command(files, image, stub=wine.build / 'MorivSetup.exe'))
    output_of([IMAGE_TOOL, 'removal', image, '-o', removal])
    runs = {DIALOG: wine.until_page(image),
            EMPTY_DIALOG: wine.until_page(wine.build / 'empty_dialog.exe'),
            # A help that is silent: it does nothing.
            REMOVAL_PROGRAM: Run(wine.command(removal, '/h', '/s')),
            EMPTY: Run(wine.command(wine.build / 'empty_program.exe'), success=1)}
    with pinned():
        seconds = time_in_turn(runs, rounds)
    table = Table('Starts under Wine', 'Of the dialogs until a page stands, which a program beside '
                  'them sees; the empty dialog has the same controls and pictures. Of the others '
                  f'from start to end; they do nothing. Medians of {rounds} rounds.',
                  ['Program', 'ms'],
                  [[name, f'{time * 1e3:.1f}'] for name, time in medians(seconds).items()],
                  [run.text() for run in runs.values()])
    for key, (over, under) in KEYS.items():
        results.figures[key] = ratio_figure(seconds[over], seconds[under], table.title)
    results.tables.append(table)
