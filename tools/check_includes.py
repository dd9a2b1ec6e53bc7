#!/usr/bin/env python3
"""Fails when a folder under src/ includes a folder it may not.

    tools/check_includes.py [--src DIR] [--doc FILE]
    tools/check_includes.py --self-test

Reads every `#include "..."` line of every file under DIR (this repository's
src/ unless given) and prints one line per include that ALLOWED below does
not permit: the file, the line and the arrow, such as

    src/xml/Writer.cpp:9: xml -> materials ("materials/BaseMaterial.h")

A file belongs to the longest folder of the table that holds it (a file of
src/module/cli/ to module/cli, not module); an include names its folder the
same way. A folder may always include itself. An include that names no folder
of the table, and a file in a folder the table lacks, fail too: a new folder
needs its row here and in ARCHITECTURE.md. The table of FILE (ARCHITECTURE.md
unless given) must say what ALLOWED says. Exit status 0 when all is well, 1
otherwise. --self-test plants a forbidden include in a tree of its own and
checks that the script fails on it.
"""
import argparse
import os
import re
import subprocess
import sys
import tempfile

BASE = ['xml', 'persistence', 'values', 'platform']

# Each folder and the folders it may include; ARCHITECTURE.md says why.
ALLOWED = {
    'platform': [],
    'values': [],
    'persistence': ['values', 'platform'],
    'xml': ['persistence', 'values', 'platform'],
    'animation': BASE,
    'lights': ['animation'] + BASE,
    'textures': ['lights', 'animation'] + BASE,
    'materials': ['textures'] + BASE,
    'options': ['textures', 'animation'] + BASE,
    'module': ['materials', 'options', 'textures', 'lights', 'animation'] + BASE,
    'module/cli': ['module', 'xml', 'platform'],
    'module/python': ['module', 'xml'],
}

INCLUDE = re.compile(r'^\s*#\s*include\s*"([^"]+)"')
SOURCE = ('.h', '.hpp', '.cpp', '.cc', '.c', '.inl')


def folder_of(path, table):
    """The longest folder of the table that holds `path` ('a/b/c.h'), or None."""
    parts = path.split('/')[:-1]
    for n in range(len(parts), 0, -1):
        name = '/'.join(parts[:n])
        if name in table:
            return name
    return None


def problems(src, table):
    """One line for each include under `src` that the table forbids."""
    found = []
    for root, dirs, names in os.walk(src):
        dirs.sort()
        for name in sorted(names):
            if not name.endswith(SOURCE):
                continue
            path = os.path.join(root, name)
            rel = os.path.relpath(path, src).replace(os.sep, '/')
            shown = os.path.basename(os.path.normpath(src)) + '/' + rel
            here = folder_of(rel, table)
            if here is None:
                found.append('%s: in a folder that the table lacks' % shown)
                continue
            with open(path, encoding='utf-8', errors='replace') as f:
                for number, line in enumerate(f, 1):
                    match = INCLUDE.match(line)
                    if not match:
                        continue
                    target = match.group(1)
                    there = folder_of(target, table)
                    if there is None:
                        found.append('%s:%d: %s -> ? ("%s" names no folder of the table)'
                                     % (shown, number, here, target))
                    elif there != here and there not in table[here]:
                        found.append('%s:%d: %s -> %s ("%s")' % (shown, number, here, there, target))
    return found


def documented(doc):
    """The table of ARCHITECTURE.md: rows '| `folder/` | a, b | why |'."""
    table = {}
    with open(doc, encoding='utf-8') as f:
        for line in f:
            cells = [c.strip() for c in line.strip().strip('|').split('|')]
            match = re.fullmatch(r'`([a-z/]+)/`', cells[0]) if len(cells) >= 3 else None
            if match:
                table[match.group(1)] = sorted(w for w in re.split(r'[,\s]+', cells[1])
                                               if re.fullmatch(r'[a-z/]+', w))
    return table


def disagreements(doc, table):
    written = documented(doc)
    lines = []
    for name in sorted(set(written) | set(table)):
        if name not in written:
            lines.append('%s: no row for %s/' % (doc, name))
        elif name not in table:
            lines.append('%s: %s/ is not in the table of %s' % (doc, name, __file__))
        elif written[name] != sorted(table[name]):
            lines.append('%s: %s/ may include %s, but the script says %s'
                         % (doc, name, ', '.join(written[name]) or 'nothing',
                            ', '.join(sorted(table[name])) or 'nothing'))
    return lines


def self_test():
    """Runs the script on planted trees: a clean one passes, each fault fails."""
    failures = []

    def run(files, expect):
        with tempfile.TemporaryDirectory() as tree:
            src = os.path.join(tree, 'src')
            for rel, text in files.items():
                os.makedirs(os.path.dirname(os.path.join(src, rel)), exist_ok=True)
                with open(os.path.join(src, rel), 'w') as f:
                    f.write(text)
            doc = os.path.join(tree, 'ARCHITECTURE.md')
            with open(doc, 'w') as f:
                f.write('| folder | may include | why |\n|---|---|---|\n')
                for name, allowed in ALLOWED.items():
                    f.write('| `%s/` | %s | - |\n' % (name, ', '.join(allowed) or '-'))
            p = subprocess.run([sys.executable, os.path.abspath(__file__), '--src', src, '--doc', doc],
                               stdout=subprocess.PIPE, stderr=subprocess.STDOUT, universal_newlines=True)
            if expect is None and p.returncode != 0:
                failures.append('a clean tree failed:\n' + p.stdout)
            if expect is not None and (p.returncode == 0 or expect not in p.stdout):
                failures.append('expected a failure naming %r, got status %d:\n%s'
                                % (expect, p.returncode, p.stdout))

    clean = {'xml/Writer.cpp': '#include "xml/Writer.h"\n#include "platform/Text.h"\n',
             'xml/Writer.h': '#include <string>\n', 'platform/Text.h': '',
             'module/cli/main.cpp': '#include "module/Drivers.h"\n', 'module/Drivers.h': ''}
    run(clean, None)
    run(dict(clean, **{'xml/Writer.cpp': '#include "xml/Writer.h"\n  #  include "materials/Base.h"\n',
                       'materials/Base.h': ''}),
        'src/xml/Writer.cpp:2: xml -> materials ("materials/Base.h")')
    run(dict(clean, **{'module/Drivers.h': '#include "module/cli/Args.h"\n'}),
        'src/module/Drivers.h:1: module -> module/cli')
    run(dict(clean, **{'platform/Text.h': '#include "Windows.h"\n'}), 'names no folder')
    run(dict(clean, **{'gui/Window.cpp': ''}), 'src/gui/Window.cpp: in a folder that the table lacks')
    for line in failures:
        print(line)
    print('self-test: %d of 5 cases as expected' % (5 - len(failures)))
    return 1 if failures else 0


def main():
    here = os.path.dirname(os.path.abspath(__file__))
    parser = argparse.ArgumentParser(description=__doc__.split('\n')[0])
    parser.add_argument('--src', default=os.path.join(here, '..', 'src'))
    parser.add_argument('--doc', default=os.path.join(here, '..', 'ARCHITECTURE.md'))
    parser.add_argument('--self-test', action='store_true')
    args = parser.parse_args()
    if args.self_test:
        return self_test()
    lines = problems(args.src, ALLOWED) + disagreements(args.doc, ALLOWED)
    for line in lines:
        print(line)
    if lines:
        print('%d include(s) or table row(s) against ARCHITECTURE.md' % len(lines))
        return 1
    print('every include of %s follows ARCHITECTURE.md' % os.path.relpath(args.src))
    return 0


if __name__ == '__main__':
    sys.exit(main())
