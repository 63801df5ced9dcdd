"""A display without a screen, for programs with windows."""

import os
import subprocess
from contextlib import contextmanager

from timed_runs import BenchError


@contextmanager
def own_display():
    """All that is started meanwhile has its windows there."""
    before = os.environ.get('DISPLAY')
    server = subprocess.Popen(['Xvfb', '-displayfd', '1', '-screen', '0', '1024x768x24'],
                              stdout=subprocess.PIPE, stderr=subprocess.DEVNULL, text=True)
    try:
        number = server.stdout.readline().strip()
        if not number:
            raise BenchError('Xvfb gives no display')
        os.environ['DISPLAY'] = f':{number}'
        yield
    finally:
        if before is None:
            os.environ.pop('DISPLAY', None)
        else:
            os.environ['DISPLAY'] = before
        server.terminate()
        server.wait()
