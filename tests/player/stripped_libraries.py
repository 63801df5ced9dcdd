"""Real programs to pack: Wine's own libraries, which every host with Wine has, without their debug
information. The largest ones, one of a family (msvcp70, msvcp71 and so on are nearly the same file)."""

import os
import re
import subprocess
from pathlib import Path

SOURCE = Path('/usr/lib/x86_64-linux-gnu/wine/x86_64-windows')
STRIP = 'x86_64-w64-mingw32-strip'


def strip_libraries(folder, count, largest=None):
    """Makes so many files in the folder, unless they are there, none of more bytes than the largest may
    have; gives their paths in the order of their names, or [] where there are not so many."""
    files = sorted(folder.glob('*.dll'))
    if len(files) == count:
        return files
    folder.mkdir(parents=True, exist_ok=True)
    families = {}
    for source in sorted(SOURCE.glob('*.dll'), key=lambda file: (-file.stat().st_size, file.name)):
        family = re.match('[a-z]*', source.name)[0]
        if family in families or len(families) == count:
            continue
        stripped = folder / source.name
        # It writes the time into a library, unless it is told one.
        subprocess.run([STRIP, '-o', stripped, source], check=True,
                       env=os.environ | {'SOURCE_DATE_EPOCH': '0'})
        if largest and stripped.stat().st_size > largest:
            stripped.unlink()
        else:
            families[family] = stripped
    return sorted(families.values()) if len(families) == count else []
