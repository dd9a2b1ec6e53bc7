# -*- coding: utf-8 -*-
"""Converts the files named on the command line and prints each result.
Runs under Python 2.7 and 3."""
import os
import sys

import PyOrvXml

PY3 = sys.version_info[0] >= 3
# Where the UTF-8 bytes go: the byte stream behind standard output on 3, the
# stream itself on 2.7.
OUT = sys.stdout.buffer if PY3 else sys.stdout
# A text may hold lone surrogates; 2.7 writes them as three bytes each, and so
# does 3 with this handler.
ERRORS = 'surrogatepass' if PY3 else 'strict'


def main(paths):
    for path in paths:
        if '*' in path:  # a pattern the shell found nothing for
            continue
        # 2.7 hands over the argument's bytes, 3 a str already.
        upath = path.decode('utf-8') if isinstance(path, bytes) else path
        lower = upath.lower()
        if lower.endswith(u'.orvopt') or lower.endswith(u'.luopt'):
            result = PyOrvXml.getOrvoptXml(upath)
        else:
            result = PyOrvXml.getOrvmatXml(upath)
        raw = os.fsencode(path) if PY3 else path  # the name as it was given
        OUT.write(b'==== ' + raw + (' (%d characters)\n' % len(result)).encode('ascii'))
        OUT.write(result.encode('utf-8', ERRORS))
        if result and not result.endswith(u'\n'):
            OUT.write(b'\n')
    OUT.flush()


if __name__ == '__main__':
    main(sys.argv[1:])
