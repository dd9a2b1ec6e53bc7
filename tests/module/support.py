# -*- coding: utf-8 -*-
"""What the module tests share, under Python 2.7 and 3: the module from the
build folder, the bundled examples, paths as the module takes them, and a
scratch folder."""
import glob
import json
import os
import shutil
import subprocess
import sys
import tempfile
import unittest

BUILD = os.environ.get('ORVXML_BUILD_DIR', 'build')
SOURCE = os.environ.get('ORVXML_SOURCE_DIR', '.')
EXAMPLES = os.path.join(SOURCE, 'examples')
sys.path.insert(0, BUILD)
import PyOrvXml  # noqa: E402,F401

PY3 = sys.version_info[0] >= 3
COMMAND = os.path.join(BUILD, 'orvxml')


def text(path):
    """A path as the module takes it: unicode on 2.7, str on 3."""
    return path if PY3 or isinstance(path, type(u'')) else path.decode('utf-8')


def example(name):
    return text(os.path.join(EXAMPLES, name))


def explain(path, scratch, preexec_fn=None):
    """The --explain line of one file, behind "<path>: ", as the command prints it."""
    args = [COMMAND, '--explain', '--jobs', '1', '-o', scratch, path]
    p = subprocess.Popen([a.encode('utf-8') if not PY3 else a for a in args],
                         stdout=subprocess.PIPE, stderr=subprocess.PIPE, preexec_fn=preexec_fn)
    out, err = p.communicate()
    lines = out.decode('utf-8').splitlines()
    prefix = path + u': '
    found = [line[len(prefix):] for line in lines if line.startswith(prefix)]
    if len(found) != 1:
        raise AssertionError('no --explain line for %r in %r (%r)' % (path, out, err))
    return found[0]


def read(path):
    with open(path, 'rb') as f:
        return f.read()


class ScratchTest(unittest.TestCase):
    """A test with a scratch folder of its own."""

    def setUp(self):
        self.dir = tempfile.mkdtemp()

    def tearDown(self):
        shutil.rmtree(self.dir)

    def write(self, name, data):
        path = os.path.join(self.dir, name)
        with open(path, 'wb') as f:
            f.write(data)
        return text(path)


# Converts each file named on its command line with the PyOrvXml it imports
# and prints the results as JSON (whose \\u escapes carry code points beyond
# 16 bits and lone surrogates from 2.7 to 3 unchanged).
CONVERT = """
import json, sys
import PyOrvXml
out = []
for path in sys.argv[1:]:
    if sys.version_info[0] < 3:
        path = path.decode('utf-8')
    f = PyOrvXml.getOrvoptXml if path.endswith(u'opt') else PyOrvXml.getOrvmatXml
    out.append([f(path), PyOrvXml.__file__])
sys.stdout.write(json.dumps(out))
"""


def examples():
    return sorted(p for p in glob.glob(os.path.join(EXAMPLES, '*.*')) if not p.endswith('.py'))


def convert_elsewhere(python, paths, env):
    """[(text, module file)] of each path, converted by another interpreter."""
    out = subprocess.check_output([python, '-c', CONVERT] + list(paths), env=env)
    return json.loads(out.decode('ascii'))


def convert_here(path):
    f = PyOrvXml.getOrvoptXml if path.endswith('opt') else PyOrvXml.getOrvmatXml
    return f(text(path))
