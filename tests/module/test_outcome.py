# -*- coding: utf-8 -*-
"""getXmlWithOutcome: the text of getOrvmatXml/getOrvoptXml with its status,
the reason that orvxml --explain gives, the kind and the count; freshSun; and
the arguments it refuses. Under Python 2.7 and 3."""
import json
import os
import struct
import subprocess
import sys
import unittest

from support import BUILD, COMMAND, EXAMPLES, PY3, ScratchTest, example, explain, read, text, PyOrvXml

NATIVE = type('')


class Outcomes(ScratchTest):
    def check(self, path, status, kind, function):
        """The outcome of path against the command's line and the plain function's text."""
        outcome = PyOrvXml.getXmlWithOutcome(path)
        self.assertIsInstance(outcome, PyOrvXml.Outcome)
        self.assertEqual(isinstance(outcome, tuple), PY3)  # 2.7: tuple-like, as os.stat_result
        self.assertEqual(len(outcome), 5)
        xml, got_status, reason, got_kind, count = outcome
        self.assertEqual((outcome.text, outcome.status, outcome.reason, outcome.kind, outcome.count),
                         tuple(outcome))
        self.assertEqual(got_status, status)
        self.assertEqual(got_kind, kind)
        self.assertIs(type(xml), type(u''))
        self.assertEqual(xml, function(path))
        line = explain(path, self.dir)
        if status == 'document':
            self.assertIsNone(reason)
            words = line.split(', ')
            self.assertEqual(words[0], 'document')
            self.assertEqual(words[1], '%d %s' % (count, {'materials': 'material', 'options': 'block'}[kind] +
                                                   ('' if count == 1 else 's')))
            self.assertEqual(words[2], '%d bytes' % os.path.getsize(path))
            self.assertGreater(count, 0)
        else:
            self.assertIs(type(reason), NATIVE)
            self.assertEqual(line, status + ': ' + reason)
            self.assertEqual(count, 0)
        return outcome

    def test_documents(self):
        for name in ('materials_all_layers.orvmat', 'materials_old_records_v2.orvmat',
                     'materials_old_records_v1.lumat', 'materials_wrapped_trees.orvmat'):
            self.check(example(name), 'document', 'materials', PyOrvXml.getOrvmatXml)
        for name in ('render_settings.orvopt', 'old_settings_v4.luopt'):
            outcome = self.check(example(name), 'document', 'options', PyOrvXml.getOrvoptXml)
            self.assertEqual(outcome.count, 22)

    def test_text_road(self):
        data = read(os.path.join(EXAMPLES, 'materials_all_layers.orvmat'))
        # The first material's version tag broken (behind header, block count, type tag).
        bad = self.write('bad.orvmat', data[:18] + b'\x07\x00' + data[20:])
        outcome = self.check(bad, 'text', 'materials', PyOrvXml.getOrvmatXml)
        self.assertIn('record version not read', outcome.reason)
        data = read(os.path.join(EXAMPLES, 'render_settings.orvopt'))
        bad = self.write('badversion.OrvOpt', b'\x01\x00\x0f\x00' + data[4:])
        outcome = self.check(bad, 'text', 'options', PyOrvXml.getOrvoptXml)
        self.assertEqual(outcome.text, u'\x01')
        tag = self.write('tag.lumat', struct.pack('<III', 0x30000, 1, 1) + struct.pack('<I', 15) +
                         b'\x00' * 64)
        self.assertIn('unknown type tag', self.check(tag, 'text', 'materials',
                                                     PyOrvXml.getOrvmatXml).reason)
        exported = self.write('export.luopt', b'caf\xc3\xa9 <a/>\n')
        self.assertEqual(self.check(exported, 'text', 'options', PyOrvXml.getOrvoptXml).text,
                         u'caf\xe9 <a/>\n')

    def test_unreadable(self):
        missing = text(os.path.join(self.dir, 'missing.orvmat'))
        outcome = self.check(missing, 'unreadable', 'materials', PyOrvXml.getOrvmatXml)
        self.assertEqual(outcome.text, u'')
        self.assertIn("can't be opened", outcome.reason)
        folder = text(os.path.join(self.dir, 'folder.luopt'))
        os.mkdir(folder)
        self.assertEqual(PyOrvXml.getXmlWithOutcome(folder),
                         (u'', 'unreadable', 'not a regular file', 'options', 0))


# Converts the two sun examples in one fresh interpreter and prints the texts as JSON.
SUN_ORDER = """
import json, sys
import PyOrvXml
one, two = [p if sys.version_info[0] >= 3 else p.decode('utf-8') for p in sys.argv[1:3]]
get = PyOrvXml.getXmlWithOutcome
first = get(two).text
get(one)
carried = get(two).text
get(one)
plain = PyOrvXml.getOrvmatXml(two)
get(one)
fresh = get(two, freshSun=True).text
fresh_again = get(two, freshSun=1).text
sys.stdout.write(json.dumps([first, carried, plain, fresh, fresh_again]))
"""


class FreshSun(ScratchTest):
    def test_fresh_sun_makes_the_result_independent_of_call_order(self):
        one = example('textures_sky_document_sun_1.orvmat')
        two = example('textures_sky_document_sun_2.orvmat')
        out = subprocess.check_output([sys.executable, '-c', SUN_ORDER, one.encode('utf-8'),
                                       two.encode('utf-8')],
                                      env=dict(os.environ, PYTHONPATH=BUILD))
        first, carried, plain, fresh, fresh_again = json.loads(out.decode('ascii'))
        self.assertNotEqual(carried, first)  # the sun of the first file carried over
        self.assertEqual(plain, carried)     # as it does in getOrvmatXml
        self.assertEqual(fresh, first)
        self.assertEqual(fresh_again, first)
        # The command converts every file from a fresh sun.
        subprocess.check_call([COMMAND, '--jobs', '1', '-o', self.dir, two.encode('utf-8')])
        with open(os.path.join(self.dir, 'textures_sky_document_sun_2.orvmat.xml'), 'rb') as f:
            self.assertEqual(f.read().decode('utf-8'), fresh)


class Truthy(object):
    def __init__(self, value):
        self.value = value

    def __bool__(self):
        if self.value is None:
            raise ZeroDivisionError('no truth')
        return self.value
    __nonzero__ = __bool__


class Arguments(ScratchTest):
    def test_refused_extensions_as_in_the_two(self):
        for path in (u'', u'noext', u'/tmp/x.orvmat/', u'/tmp/x.xml', u'/tmp/x.orvopt '):
            try:
                PyOrvXml.getXmlWithOutcome(path)
            except SystemError as e:
                if PY3:
                    self.assertEqual(str(e), 'getXmlWithOutcome() takes a path ending in '
                                             '.orvmat, .lumat, .orvopt or .luopt (any case)')
            else:
                self.fail(path)

    def test_extension_picks_the_kind_in_any_case(self):
        for name, kind in (('a.ORVMAT', 'materials'), ('b.LuMat', 'materials'),
                           ('c.orvOPT', 'options'), ('d.luopt', 'options')):
            self.assertEqual(PyOrvXml.getXmlWithOutcome(self.write(name, b'x')).kind, kind)

    def test_refused_arguments(self):
        path = self.write('a.orvmat', b'<a/>')
        get = PyOrvXml.getXmlWithOutcome
        self.assertEqual(get(path=path, freshSun=True).text, u'<a/>')
        for args, kwargs in (((), {}), ((path.encode('utf-8'),), {}), ((3,), {}), ((None,), {}),
                             ((path, True), {}), ((path, path), {}),
                             ((path,), {'wellformed': True}), ((path,), {'fresh': True}),
                             ((path,), {'path': path})):
            self.assertRaises(TypeError, get, *args, **kwargs)
        self.assertRaises(ZeroDivisionError, get, path, freshSun=Truthy(None))
        self.assertEqual(get(path, freshSun=Truthy(True)).status, 'text')

    def test_zero_character_in_path(self):
        # ValueError on 3; on 2.7 the argument parser refuses it with TypeError.
        error = ValueError if PY3 else TypeError
        path = text(os.path.join(self.dir, 'a\0b.orvmat'))
        for function in (PyOrvXml.getXmlWithOutcome, PyOrvXml.getOrvmatXml):
            self.assertRaises(error, function, path)


if __name__ == '__main__':
    unittest.main()
