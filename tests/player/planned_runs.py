"""What "moriv-image plan" says of a run on a stand-in machine, held against what the run then did."""

import json
import subprocess

import file_tree
from registry_text import ROOT

SIGNS = {'added': '+', 'changed': '~', 'removed': '-'}


def ask(image_tool, machine, program, arguments):
    """The plan; None for a run that is not silent."""
    done = subprocess.run([image_tool, 'plan', machine.files.host(program), '--machine', machine.folder,
                           f'--options={arguments}', '--json'], capture_output=True, text=True)
    if done.returncode == 2:
        raise ValueError(done.stderr)
    plan = json.loads(done.stdout)
    return plan if plan['arguments'] == arguments else None


def disagreements(plan, machine, outcome, files, registry):
    """Lines that tell what the run did in another way. files, registry: of the machine before it."""
    said = [plan['exitCode'], *((SIGNS[file['change']], file['path'], file['size']) for file in plan['files'])]
    said += [(SIGNS[one['change']], one['key'].lower(), one.get('value', '[key]').lower(), one.get('data'))
             for one in plan['registry']]
    now, was, is_now = machine.files.snapshot(), _facts(registry), _facts(machine.registry())
    done = [outcome.exit_code, *((sign, path, ((files | now)[path] or (0, 0))[1])
                                 for path, sign in file_tree.changes(files, now).items())]
    done += [(sign, *place, (was | is_now)[place]) for place, sign in file_tree.changes(was, is_now).items()
             if sign != '-' or place[1] == '[key]' or (place[0], '[key]') in is_now]
    return [f'{who} alone: {what}' for who, these, others in (('the plan', said, done), ('the run', done, said))
            for what in these if what not in others]


def _facts(registry):
    """The bytes of a value, None for a key, by names in lower case."""
    return {(f'{ROOT}\\{low}'.lower(), name): data and data[2].hex() for low, key in registry.keys.items()
            for name, data in {'[key]': None, **key.values}.items()}
