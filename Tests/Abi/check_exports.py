#!/usr/bin/env python3
"""Fails unless a shared library exports just the names that are given.

    check_exports.py NM LIBRARY NAME...
"""

import subprocess
import sys


def exported(nm, library):
    lines = subprocess.run([nm, "-D", "--defined-only", "--format=posix", library], check=True,
                           stdout=subprocess.PIPE, text=True).stdout.splitlines()
    return {line.split()[0] for line in lines}


def main(nm, library, *names):
    found = exported(nm, library)
    for name in sorted(found - set(names)):
        print(f"exported, and should not be: {name}")
    for name in sorted(set(names) - found):
        print(f"not exported: {name}")
    return found != set(names)


sys.exit(main(*sys.argv[1:]))
