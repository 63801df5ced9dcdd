"""Files of installed Debian packages."""

import subprocess
from pathlib import Path

from timed_runs import output_of


def version_of(package):
    """Name and version as one text."""
    answer = subprocess.run(['dpkg-query', '-W', '-f', '${Version}', package],
                            capture_output=True, text=True).stdout
    return f'{package} {answer or "(not installed)"}'


def text_files_of(package, endings):
    """The package's plain text files with these endings, by name; none where it isn't installed."""
    if version_of(package).endswith(')'):
        return []
    lines = output_of(['dpkg-query', '-L', package]).splitlines()
    paths = [Path(line) for line in sorted(lines) if line.endswith(endings)]
    return [path for path in paths if path.is_file() and not path.is_symlink()
            and b'\0' not in path.read_bytes()]
