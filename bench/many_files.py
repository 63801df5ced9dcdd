"""A product of many small files under Wine: its install, the dialog that looks for older ones among
them, and its removal."""

from corpora import make_slices
from goals import Figure, ratio_figure
from installing import NSIS, OWN, WORK, nsis_install, require_installed, wine_install
from results import Table
from timed_runs import BenchError, Run, medians, pinned, run_once, time_in_turn

FILES = 1000
SIZE = 8000  # bytes of each
CHECK, REMOVAL = 'dialog, until its page stands', 'silent removal'
NSIS_REMOVAL = 'NSIS, removal'
KEYS = {'install-wine-many': (OWN, NSIS), 'removal-wine-many': (REMOVAL, NSIS_REMOVAL),
        'check-wine-many': (CHECK, OWN)}


def measure_many_files(corpus, rounds, wine, results):
    """In each round the dialog and the removal find what the install in front of them has made."""
    if wine.why_not:
        results.figures |= {key: Figure(why_not=wine.why_not) for key in KEYS}
        return
    library = (wine.build / 'versioned_library.dll').read_bytes()
    files = make_slices(WORK / 'many', corpus.content()[:FILES * (SIZE - len(library))], FILES,
                        head=library)
    runs = {OWN: wine_install(files, wine, 'MorivSetup.exe'),
            CHECK: wine.until_page(WORK / 'MorivSetup.exe'),
            REMOVAL: Run(wine.command(r'C:\windows\MorivRmv.exe', '/s'), success=1)}
    if not wine.why_no_peer:
        runs[NSIS] = nsis_install(files, wine)
        runs[NSIS_REMOVAL] = Run(wine.command(r'C:\Peer\Uninstall.exe', '/S', r'_?=C:\Peer'))
    with pinned():
        _require_work(files, runs)
        seconds = time_in_turn(runs, rounds)
    table = Table(f'{FILES} small files under Wine', f'{SIZE:,} bytes each: a library with nothing '
                  f'but a version, {len(library):,} bytes, and text behind it. In each round the '
                  f'dialog finds none of them older. Medians of {rounds} rounds.',
                  ['Program', 'Seconds', 'ms a file'],
                  [[name, f'{time:.3f}', f'{time / FILES * 1e3:.2f}']
                   for name, time in medians(seconds).items()],
                  [run.text() for run in runs.values()])
    for key, (over, under) in KEYS.items():
        results.figures[key] = (
            ratio_figure(seconds[over], seconds[under], table.title, corpora=(corpus,))
            if under in seconds else Figure(why_not=wine.why_no_peer))
    results.tables.append(table)


def _require_work(files, runs):
    """Once, before anything is timed: installs install and removals remove."""
    for install, removal in ((OWN, REMOVAL), (NSIS, NSIS_REMOVAL)):
        if install in runs:
            folder = runs[install].makes
            run_once(runs[install])
            require_installed(files, folder)
            run_once(runs[removal])
            if any((folder / file.name).exists() for file in files):
                raise BenchError(f'not all removed from {folder}: {runs[removal].text()}')
