# -*- coding: utf-8 -*-
"""Converts the files named on the command line and prints each result."""
import sys

import PyOrvXml


def main(paths):
    for path in paths:
        if '*' in path:  # a pattern the shell found nothing for
            continue
        upath = path.decode('utf-8')
        lower = upath.lower()
        if lower.endswith(u'.orvopt') or lower.endswith(u'.luopt'):
            result = PyOrvXml.getOrvoptXml(upath)
        else:
            result = PyOrvXml.getOrvmatXml(upath)
        sys.stdout.write('==== %s (%d characters)\n' % (path, len(result)))
        sys.stdout.write(result.encode('utf-8'))
        if result and not result.endswith(u'\n'):
            sys.stdout.write('\n')


if __name__ == '__main__':
    main(sys.argv[1:])
