"""Whole installs: natively against the system's tools, under Wine against another installer or
against the program with its polls put back."""

import filecmp
import statistics

from corpora import BUILD, ROOT, make_slices, pack_command
from goals import Figure
from results import Table
from timed_runs import BenchError, Run, median_seconds, output_of, pinned, run_in_turn

WORK = BUILD / 'runs'
INSTALLED = 'Program Files/Moriv'
NSIS_SCRIPT = ROOT / 'bench/nsis_peer.nsi'


def native_install(image, name):
    machine = WORK / name
    return Run([image, '/s'], makes=machine, environment={'MORIV_MACHINE': machine})


def require_installed(files, folder):
    wrong = filecmp.cmpfiles(files[0].parent, folder, [file.name for file in files], shallow=False)
    if wrong[1] or wrong[2]:
        raise BenchError(f'not installed as packed, in {folder}: {wrong[1] + wrong[2]}')


def measure_native_install(corpus, rounds, results):
    archive = WORK / 'libraries.tar.Z'
    archive.parent.mkdir(parents=True, exist_ok=True)
    output_of(['bsdtar', '-cZf', archive, '-C', corpus.folder, *(f.name for f in corpus.files)])
    extracted = WORK / 'extracted'
    runs = {'silent install': native_install(corpus.image, 'machine'),
            '`bsdtar -x`': Run(['bsdtar', '-xf', archive, '-C', extracted], folder=extracted)}
    with pinned():
        seconds = median_seconds(run_in_turn(runs, rounds))
    require_installed(corpus.files, WORK / 'machine/drive_c' / INSTALLED)
    require_installed(corpus.files, extracted)
    command = runs['silent install'].text()
    results.figures['install-native'] = Figure(
        seconds['silent install'] / seconds['`bsdtar -x`'], command)
    results.tables.append(_install_table(
        'Install, natively', f'{len(corpus.files)} libraries, {corpus.size:,} bytes, on one CPU, in '
        f'turn. Medians of {rounds} rounds.', seconds, command))


def measure_wine_install(corpus, rounds, wine, results):
    keys = ('install-wine', 'wine-memory')
    if wine.why_not:
        results.figures |= {key: Figure(why_not=wine.why_not, words={'peer': 'its peer'})
                            for key in keys}
        return
    runs = {'silent install': _wine_install(corpus.files, wine, 'MorivSetup.exe'),
            'with a poll of the system each time': _wine_install(corpus.files, wine,
                                                                 'polling_setup.exe')}
    peer = 'with a poll of the system each time'
    if wine.bits == 32:
        peer = 'NSIS, zlib'
        runs[peer] = _nsis_install(corpus.files, wine)
    runs['empty program'] = Run(wine.command(wine.build / 'empty_program.exe'), success=1)
    with pinned():
        samples = run_in_turn(runs, rounds)
    seconds = median_seconds(samples)
    peaks = {name: statistics.median(sample.peak for sample in group)
             for name, group in samples.items()}
    require_installed(corpus.files, wine.drive() / 'silent install')
    command = runs['silent install'].text()
    results.figures['install-wine'] = Figure(
        seconds['silent install'] / seconds[peer], command,
        words={'peer': 'NSIS zlib' if wine.bits == 32 else 'the same with its polls put back'})
    results.figures['wine-memory'] = Figure(
        (peaks['silent install'] - peaks['empty program']) / 1e6, command)
    results.tables.append(_install_table(
        f'Install of the {wine.bits}-bit Windows program under Wine',
        f'The same libraries; program and Wine server on one CPU. Medians of {rounds} rounds.',
        seconds, command, peaks))


def measure_small_wine_install(corpus, rounds, wine, results):
    """Three files, 241,664 bytes together."""
    why_not = wine.why_not or ('' if wine.bits == 32 else 'NSIS makes 32-bit programs alone')
    if why_not:
        results.figures['install-wine-small'] = Figure(why_not=why_not)
        return
    files = make_slices(WORK / 'small', corpus.files[0].read_bytes()[:241_664], 3)
    runs = {'silent install': _wine_install(files, wine, 'MorivSetup.exe'),
            'NSIS': _nsis_install(files, wine)}
    with pinned():
        seconds = median_seconds(run_in_turn(runs, rounds))
    results.figures['install-wine-small'] = Figure(seconds['silent install'] / seconds['NSIS'],
                                                   runs['silent install'].text())


def measure_file_counts(content, counts, rounds, results):
    """Packages of the same bytes in ever more files, against a copy of the same files."""
    runs = {}
    for count in counts:
        files = make_slices(WORK / f'files{count}', content, count)
        image = WORK / f'files{count}.image'
        output_of(pack_command(files, image))
        runs['install', count] = native_install(image, f'machine-files{count}')
        runs['cp', count] = Run(['cp', '-r', files[0].parent, WORK / f'copy{count}'],
                                makes=WORK / f'copy{count}')
    with pinned():
        seconds = median_seconds(run_in_turn(runs, rounds))
    most = counts[-1]
    command = runs['install', most].text()
    results.figures['time-per-file'] = Figure(seconds['install', most] / seconds['cp', most],
                                              command)
    results.tables.append(Table(
        'More files of the same total', f'{len(content):,} bytes of text, natively. Medians of '
        f'{rounds} rounds.', ['Files', 'Install, ms', '`cp -r`, ms', 'Install / `cp`'],
        [[str(count), f'{seconds["install", count] * 1e3:.1f}', f'{seconds["cp", count] * 1e3:.1f}',
          f'{seconds["install", count] / seconds["cp", count]:.2f}'] for count in counts], command,
        plot='performance-files.svg'))
    return {program: [(count, seconds[program, count] * 1e3) for count in counts]
            for program in ('install', 'cp')}


def measure_sizes(sample, sizes, rounds, results):
    """Packages of one file, the same MB over and over. What an install of next to nothing takes is
    taken off, since it would hide growth."""
    runs = {}
    for size in (0, *sizes):
        file = WORK / f'size{size}' / 'payload.dat'
        file.parent.mkdir(parents=True, exist_ok=True)
        file.write_bytes(sample * size or sample[:1])
        image = WORK / f'size{size}.image'
        output_of(pack_command([file], image))
        file.unlink()
        runs[size] = native_install(image, f'machine-size{size}')
    with pinned():
        seconds = median_seconds(run_in_turn(runs, rounds))
    per_megabyte = {size: (seconds[size] - seconds[0]) / size * 1e3 for size in sizes}
    command = runs[sizes[-1]].text()
    results.figures['growth'] = Figure(per_megabyte[sizes[-1]] / per_megabyte[4], command,
                                       words={'large': sizes[-1]})
    results.tables.append(Table(
        'Larger packages', f'One file, natively. An install of one byte takes {seconds[0] * 1e3:.1f} '
        f'ms, which is taken off. Medians of {rounds} rounds.', ['MB', 'Install, s', 'ms a MB'],
        [[str(size), f'{seconds[size]:.3f}', f'{per_megabyte[size]:.2f}'] for size in sizes],
        command, plot='performance-growth.svg'))
    return {'install': list(per_megabyte.items())}


def _wine_install(files, wine, program):
    image = WORK / program
    output_of(pack_command(files, image, stub=wine.build / program))
    name = 'silent install' if program == 'MorivSetup.exe' else 'polling install'
    return Run(wine.command(image, '/s', f'/d:C:\\{name}'), makes=wine.drive() / name, success=1)


def _nsis_install(files, wine):
    installer = WORK / 'nsis_peer.exe'
    output_of(['makensis', '-V1', f'-DOUTPUT={installer}', f'-DFOLDER={files[0].parent}',
               NSIS_SCRIPT])
    return Run(wine.command(installer, '/S'), makes=wine.drive() / 'Peer')


def _install_table(title, text, seconds, command, peaks=None):
    own = seconds['silent install']
    rows = [[name, f'{time:.3f}', f'{own / time:.2f}'] for name, time in seconds.items()]
    heads = ['Program', 'Seconds', 'Silent install / it']
    if peaks:
        heads.append('Peak memory, MB')
        for row, peak in zip(rows, peaks.values()):
            row.append(f'{peak / 1e6:.1f}')
    return Table(title, text, heads, rows, command)
