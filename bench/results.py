"""What the bench has found, in the order in which it is told."""

from dataclasses import dataclass, field


@dataclass
class Table:
    title: str
    text: str        # what is seen in it, before the table
    heads: list
    rows: list       # of texts
    commands: list   # that gave the figures, as texts
    plots: dict = field(default_factory=dict)  # under it: SVG text by file name


@dataclass
class Results:
    figures: dict = field(default_factory=dict)  # Figure by Goal.key
    tables: list = field(default_factory=list)
