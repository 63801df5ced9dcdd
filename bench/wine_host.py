"""The Windows builds under Wine: the 32-bit program on a 64-bit Windows where this host can run it,
else the 64-bit one."""

import shutil
import subprocess
from contextlib import ExitStack
from pathlib import Path

from corpora import BUILD
from display import own_display
from timed_runs import Run, output_of

TOOL = Path('tools/wine')


class WineHost:
    """The Wine that the figures are taken with, on a display of its own; `why_not` says why there
    is none."""

    def __init__(self):
        self.world, self.bits, self.why_not = '', 0, ''
        for world, bits in (('wow64', 32), ('wine64', 64)):
            answer = subprocess.run([TOOL, 'can-run', world], capture_output=True, text=True)
            if answer.returncode == 0:
                self.world, self.bits, self.why_not = world, bits, ''
                break
            self.why_not = answer.stdout.strip().removeprefix('no: ')
        self.build = Path(f'build/bench-win{self.bits}')
        self.prefix = BUILD / f'prefix-{self.world}'
        self.held = ExitStack()

    @property
    def why_no_peer(self):
        """NSIS makes 32-bit programs."""
        return self.why_not or ('' if self.bits == 32 else 'no 32-bit Wine here')

    def __enter__(self):
        """A fresh prefix: an installed product would say where the next install goes."""
        if not self.why_not:
            shutil.rmtree(self.prefix, ignore_errors=True)
            self.held.enter_context(own_display())
            output_of([TOOL, 'prefix', self.prefix, self.world])
        return self

    def __exit__(self, *error):
        if not self.why_not:
            output_of([TOOL, 'stop', self.prefix])
        self.held.close()

    def command(self, program, *arguments):
        return [TOOL, 'run', self.prefix, program, *arguments]

    def until_page(self, program):
        """Starts a program with the setup program's dialog, and ends it when a page stands."""
        return Run(self.command(self.build / 'page_watch.exe', program), tells_seconds=True)

    def drive(self):
        return self.prefix / 'drive_c'
