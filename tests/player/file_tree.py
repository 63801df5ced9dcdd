"""The files of a machine's drives, and what a run changed among them.

A machine's folder has one folder a drive, drive_c and so on. Paths are the machine's own
(C:\\a\\b); a directory's ends with a backslash. Some folders may bear another name for the machine's
programs than on the host.
"""

import os
import shutil
import stat
from pathlib import Path


class FileTree:
    def __init__(self, machine_folder, renamed=()):
        """renamed: pairs of a folder's path as programs name it and as it lies here."""
        self.folder, self.renamed = Path(machine_folder), renamed

    def host(self, path):
        """Host path of one of the machine's, which need not exist."""
        drive, _, rest = _rename(path, self.renamed).partition(':')
        return self.folder / f'drive_{drive.lower()}' / rest.strip('\\').replace('\\', '/')

    def read(self, path):
        return self.host(path).read_bytes()

    def write(self, path, content, read_only=False):
        """Makes a file and the directories that lead to it."""
        host = self.host(path)
        host.parent.mkdir(parents=True, exist_ok=True)
        if host.exists():
            host.chmod(0o644)
        host.write_bytes(content)
        host.chmod(0o444 if read_only else 0o755 if host.suffix.lower() == '.exe' else 0o644)

    def delete(self, path):
        host = self.host(path)
        if host.is_dir() and not host.is_symlink():
            shutil.rmtree(host)
        else:
            host.unlink(missing_ok=True)

    def snapshot(self):
        """Every path with a stamp that differs when the file was written or made anew; a directory's is
        None."""
        stamps = {}
        for drive in sorted(self.folder.glob('drive_?')):
            _walk(drive, f'{drive.name[-1].upper()}:\\', stamps)
        back = [(here, named) for named, here in self.renamed]
        return {_rename(path, back): stamp for path, stamp in stamps.items()} if back else stamps


def _rename(path, pairs):
    for old, new in pairs:
        if f'{path}\\'.lower().startswith(f'{old}\\'.lower()):
            return new + path[len(old):]
    return path


def _walk(folder, path, stamps):
    for entry in os.scandir(folder):
        if entry.is_dir(follow_symlinks=False):
            stamps[f'{path}{entry.name}\\'] = None
            _walk(entry.path, f'{path}{entry.name}\\', stamps)
        else:
            status = entry.stat(follow_symlinks=False)
            stamps[path + entry.name] = status.st_mode, status.st_size, status.st_ino, status.st_ctime_ns


def changes(before, after):
    """What differs between two snapshots: a sign by path; '+' new, '-' gone, '~' written anew."""
    return {path: '+' if path not in before else '-' if path not in after else '~'
            for path in sorted(before | after)
            if path not in before or path not in after or before[path] != after[path]}


def is_writable(stamp):
    """Whether the file of a snapshot can be deleted."""
    return stamp[0] & stat.S_IWUSR != 0
