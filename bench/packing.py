"""Packing: size against plain greedy, and speed."""

from corpora import BUILD, pack_command, packed_streams
from goals import Figure
from results import Table
from timed_runs import Run, output_of, run_once

GREEDY = BUILD / 'greedy_packer'


def measure_packing(corpora, results):
    rows, ratios, commands = [], {}, {}
    seconds_of_default = 0
    for corpus in corpora:
        greedy = int(output_of([GREEDY, *corpus.files]))
        rows.append(['plain greedy', corpus.name, f'{greedy:,}', '1.000', ''])
        for kind, options in (('default', ()), ('best', ('--best',))):
            image = corpus.image if kind == 'default' else corpus.image.with_suffix('.best')
            run = Run(pack_command(corpus.files, image, options=options))
            seconds = run_once(run).cpu
            packed = sum(len(stream) for stream in packed_streams(image))
            ratios[kind, corpus.name] = packed / greedy
            commands[kind] = run.text()
            if kind == 'default':
                seconds_of_default += seconds
            rows.append([' '.join(['`pack', *options]) + '`', corpus.name, f'{packed:,}',
                         f'{packed / greedy:.3f}', f'{corpus.size / seconds / 1e6:.1f}'])
    for corpus in corpora:
        results.figures[f'pack-best-{corpus.name}'] = Figure(ratios['best', corpus.name],
                                                             commands['best'])
    results.figures['pack-default'] = Figure(
        sum(ratios['default', corpus.name] for corpus in corpora) / len(corpora),
        commands['default'])
    results.figures['pack-speed'] = Figure(
        sum(corpus.size for corpus in corpora) / seconds_of_default / 1e6, commands['default'])
    results.tables.append(Table(
        'Packing', 'Bytes of the streams alone; speed by the processor time of the whole tool.',
        ['Packer', 'Corpus', 'Bytes', '/ plain greedy', 'MB/s a core'], rows, commands['best']))
