"""Whole installs: natively against the system's tools, under Wine against another installer or
against the program with its polls put back."""

import filecmp

from corpora import BUILD, make_slices, pack_command
from goals import Figure, ratio_figure
from results import Table
from timed_runs import (BenchError, Run, median_ratio, medians, output_of, pinned,
                        run_with_peak, time_in_turn)

WORK = BUILD / 'runs'
INSTALLED = 'Program Files/Moriv'
NSIS_SCRIPT = 'bench/nsis_peer.nsi'
OWN, EMPTY, NSIS = 'silent install', 'empty program', 'NSIS zlib'
SMALL_PACKAGE = 241_664  # bytes in three files


def native_install(image, name):
    machine = WORK / name
    return Run([image, '/s'], makes=machine, environment={'MORIV_MACHINE': machine})


def require_installed(files, folder):
    wrong = filecmp.cmpfiles(files[0].parent, folder, [file.name for file in files], shallow=False)
    if wrong[1] or wrong[2]:
        raise BenchError(f'not installed as packed, in {folder}: {wrong[1] + wrong[2]}')


def measure_native_install(corpus, rounds, results):
    archive, extracted = WORK / 'libraries.tar.Z', WORK / 'extracted'
    output_of(['bsdtar', '-cZf', archive, '-C', corpus.folder, *(f.name for f in corpus.files)])
    peer = '`bsdtar -x`'
    runs = {OWN: native_install(corpus.image, 'machine'),
            peer: Run(['bsdtar', '-xf', archive, '-C', extracted], folder=extracted)}
    with pinned():
        seconds = time_in_turn(runs, rounds)
    require_installed(corpus.files, WORK / 'machine/drive_c' / INSTALLED)
    require_installed(corpus.files, extracted)
    table = install_table('Install, natively', f'{len(corpus.files)} libraries, {corpus.size:,} '
                          f'bytes, on one CPU, in turn. Medians of {rounds} rounds.',
                          runs, seconds)
    results.figures['install-native'] = ratio_figure(seconds[OWN], seconds[peer], table.title,
                                                     corpora=(corpus,))
    results.tables.append(table)


def measure_wine_install(corpus, rounds, wine, results):
    if wine.why_not:
        results.figures['install-wine'] = Figure(why_not=wine.why_not, words={'peer': 'a peer'})
        results.figures['wine-memory'] = Figure(why_not=wine.why_not)
        return
    polling, peer = 'the same with its polls put back', NSIS
    runs = {OWN: wine_install(corpus.files, wine, 'MorivSetup.exe'),
            polling: wine_install(corpus.files, wine, 'polling_setup.exe'),
            EMPTY: Run(wine.command(wine.build / 'empty_program.exe'), success=1)}
    if wine.bits == 32:
        runs[peer] = nsis_install(corpus.files, wine)
    else:
        peer = polling
    with pinned():
        seconds = time_in_turn(runs, rounds)
        peaks = {}
        for name, run in runs.items():
            _, peaks[name] = run_with_peak(run)
            if run.makes:
                require_installed(corpus.files, run.makes)
    table = install_table(f'Install of the {wine.bits}-bit Windows program under Wine',
                          'The same libraries; program and Wine server on one CPU. Medians of '
                          f'{rounds} rounds.', runs, seconds)
    table.heads.append('Peak memory, MB')
    for row, peak in zip(table.rows, peaks.values()):
        row.append(f'{peak / 1e6:.1f}')
    results.figures['install-wine'] = ratio_figure(seconds[OWN], seconds[peer], table.title,
                                                   words={'peer': peer}, corpora=(corpus,))
    results.figures['wine-memory'] = Figure((peaks[OWN] - peaks[EMPTY]) / 1e6, table.title)
    results.tables.append(table)


def measure_small_wine_install(corpus, rounds, wine, results):
    if wine.why_no_peer:
        results.figures['install-wine-small'] = Figure(why_not=wine.why_no_peer)
        return
    files = make_slices(WORK / 'small', corpus.files[0].read_bytes()[:SMALL_PACKAGE], 3)
    runs = {OWN: wine_install(files, wine, 'MorivSetup.exe'), NSIS: nsis_install(files, wine)}
    with pinned():
        seconds = time_in_turn(runs, rounds)
    table = install_table('Install of three small files under Wine', f'{SMALL_PACKAGE:,} bytes. '
                          f'Medians of {rounds} rounds.', runs, seconds)
    results.figures['install-wine-small'] = ratio_figure(seconds[OWN], seconds[NSIS], table.title,
                                                         corpora=(corpus,))
    results.tables.append(table)


def wine_install(files, wine, program):
    """The first run registers the directory, so all use the same."""
    image = WORK / program
    output_of(pack_command(files, image, stub=wine.build / program))
    return Run(wine.command(image, '/s', r'/d:C:\Moriv'), makes=wine.drive() / 'Moriv', success=1)


def nsis_install(files, wine):
    installer = WORK / 'nsis_peer.exe'
    output_of(['makensis', '-V1', '-NOCD', f'-DOUTPUT={installer}', f'-DFOLDER={files[0].parent}',
               NSIS_SCRIPT])
    return Run(wine.command(installer, '/S'), makes=wine.drive() / 'Peer')


def install_table(title, text, runs, seconds):
    return Table(title, text, ['Program', 'Seconds', 'Silent install / it'],
                 [[name, f'{time:.3f}', f'{median_ratio(seconds[OWN], seconds[name]):.2f}']
                  for name, time in medians(seconds).items()],
                 [run.text() for run in runs.values()])
