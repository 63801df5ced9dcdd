"""A plot of lines over a logarithmic axis, as SVG text."""

import math
from html import escape

WIDTH, HEIGHT = 640, 360
LEFT, RIGHT, TOP, BOTTOM = 64, 24, 44, 52
COLOURS = ('#1f6fb4', '#c4541c', '#2e8b45', '#7d4fa3')


def line_plot(title, x_title, y_title, lines, by_decades=False):
    """lines: [(x, y), ...] by name; every x above 0. The y axis begins at 0, or it is logarithmic
    too: then what grows in proportion is a straight line."""
    xs = sorted({x for points in lines.values() for x, _ in points})
    ys = [y for points in lines.values() for _, y in points]
    ticks = _decades(ys) if by_decades else _even_ticks(max(ys))
    measure = math.log if by_decades else float
    span = math.log(xs[-1] / xs[0])
    height = measure(ticks[-1]) - measure(ticks[0])

    def place(x, y):
        return (LEFT + (WIDTH - LEFT - RIGHT) * math.log(x / xs[0]) / span,
                HEIGHT - BOTTOM
                - (HEIGHT - TOP - BOTTOM) * (measure(y) - measure(ticks[0])) / height)

    parts = [f'<svg xmlns="http://www.w3.org/2000/svg" width="{WIDTH}" height="{HEIGHT}" '
             f'viewBox="0 0 {WIDTH} {HEIGHT}" font-family="sans-serif" font-size="12">',
             f'<rect width="{WIDTH}" height="{HEIGHT}" fill="#ffffff"/>',
             _text(WIDTH / 2, 20, title, 'middle', ' font-size="14" font-weight="bold"'),
             _text(WIDTH / 2, HEIGHT - 12, x_title, 'middle'),
             _text(16, HEIGHT / 2, y_title, 'middle',
                   f' transform="rotate(-90 16 {HEIGHT / 2:.0f})"')]
    for tick in ticks:
        _, y = place(xs[0], tick)
        parts.append(f'<path d="M{LEFT} {y:.1f}H{WIDTH - RIGHT}" stroke="#dddddd"/>')
        parts.append(_text(LEFT - 8, y + 4, f'{tick:g}', 'end'))
    for x in xs:
        parts.append(_text(place(x, ticks[0])[0], HEIGHT - BOTTOM + 18, f'{x:g}', 'middle'))
    for number, (name, points) in enumerate(lines.items()):
        colour = COLOURS[number % len(COLOURS)]
        places = [place(x, y) for x, y in points]
        path = ' '.join(f'{x:.1f},{y:.1f}' for x, y in places)
        parts.append(f'<polyline points="{path}" fill="none" stroke="{colour}" stroke-width="2"/>')
        parts += [f'<circle cx="{x:.1f}" cy="{y:.1f}" r="3.5" fill="{colour}"/>' for x, y in places]
        parts.append(_text(LEFT + 12, TOP + 4 + 16 * number, name, 'start',
                           f' fill="{colour}" font-weight="bold"'))
    return '\n'.join([*parts, '</svg>', ''])


def _even_ticks(largest):
    """From 0, in steps of 1, 2 or 5 times a power of ten: four to ten steps."""
    power = 10 ** math.floor(math.log10(largest / 4))
    step = max(factor * power for factor in (1, 2, 5) if factor * power * 4 <= largest)
    return [step * number for number in range(math.floor(largest / step) + 2)]


def _decades(ys):
    first, last = math.floor(math.log10(min(ys))), math.floor(math.log10(max(ys))) + 1
    return [10 ** power for power in range(first, last + 1)]


def _text(x, y, text, anchor, attributes=''):
    return f'<text x="{x:.1f}" y="{y:.1f}" text-anchor="{anchor}"{attributes}>{escape(text)}</text>'
