# -*- coding: utf-8 -*-
"""The module's surface, the same under Python 2.7 and 3."""
import os
import struct
import sys
import unittest

from support import PY3, ScratchTest, text, PyOrvXml


class ModuleSurface(ScratchTest):
    def test_attributes_and_documents(self):
        for function, ext in ((PyOrvXml.getOrvmatXml, ('.orvmat', '.lumat')),
                              (PyOrvXml.getOrvoptXml, ('.orvopt', '.luopt'))):
            kind = ext[0][1:]
            self.assertTrue(function.__doc__.startswith('Gets the xml from a %s file.\n' % kind))
            for word in ext + ('Returns', 'SystemError', 'TypeError', 'MemoryError',
                               'PyOrvXml.error', 'unicode' if not PY3 else 'os.PathLike',
                               'document sun carries'):
                self.assertIn(word, function.__doc__)
        for word in ('.orvmat', '.luopt', 'freshSun', 'document sun', 'SystemError', 'TypeError',
                     'MemoryError', '(text, status, reason, kind, count)', '--explain'):
            self.assertIn(word, PyOrvXml.getXmlWithOutcome.__doc__)
        for word in ('getOrvmatXml', 'getOrvoptXml', 'getXmlWithOutcome', 'document sun carries'):
            self.assertIn(word, PyOrvXml.__doc__)
        # A struct sequence, as os.stat_result: a tuple subclass on 3 only.
        self.assertEqual(issubclass(PyOrvXml.Outcome, tuple), PY3)
        self.assertEqual(PyOrvXml.Outcome.__name__, 'Outcome')
        self.assertEqual(PyOrvXml.Outcome.__module__, 'PyOrvXml')
        self.assertTrue(issubclass(PyOrvXml.error, Exception))
        self.assertEqual(PyOrvXml.error.__name__, 'error')
        self.assertEqual(PyOrvXml.error.__module__, 'PyOrvXml')
        self.assertIn('MemoryError', PyOrvXml.error.__doc__)
        self.assertEqual(sorted(n for n in dir(PyOrvXml) if not n.startswith('_')),
                         ['Outcome', 'error', 'getOrvmatXml', 'getOrvoptXml', 'getXmlWithOutcome'])

    def test_extensions_in_any_case_pass_their_own_function_only(self):
        for name in ('a.orvmat', 'b.ORVMAT', 'c.LuMat', 'd.lumat'):
            path = self.write(name, b'<a/>\n')
            self.assertEqual(PyOrvXml.getOrvmatXml(path), u'<a/>\n')
            self.assertRaises(SystemError, PyOrvXml.getOrvoptXml, path)
        for name in ('a.orvopt', 'b.OrvOpt', 'c.LUOPT', 'd.luopt'):
            path = self.write(name, b'<b/>')
            self.assertEqual(PyOrvXml.getOrvoptXml(path), u'<b/>')
            self.assertRaises(SystemError, PyOrvXml.getOrvmatXml, path)

    def test_refused_paths(self):
        # 2.7: the module returns NULL without an exception and the interpreter
        # raises its own SystemError. 3: a SystemError that names the extensions.
        for path in (u'', u'noext', u'/tmp/x.orvmat/', u'/tmp/x.', u'/tmp/x.orvmat ',
                     u'/tmp/dir.orvmat/file'):
            for function, named in ((PyOrvXml.getOrvmatXml, '.orvmat or .lumat'),
                                    (PyOrvXml.getOrvoptXml, '.orvopt or .luopt')):
                try:
                    function(path)
                except SystemError as e:
                    if PY3:
                        self.assertIn(named, str(e))
                    else:
                        self.assertEqual(str(e), 'error return without exception set')
                else:
                    self.fail(path)

    def test_dot_in_directory_name_only(self):
        os.mkdir(os.path.join(self.dir, 'lib.orvmat'))
        self.assertRaises(SystemError, PyOrvXml.getOrvmatXml, self.write('lib.orvmat/file', b'x'))

    def test_missing_file_gives_empty_string(self):
        self.assertEqual(PyOrvXml.getOrvmatXml(u'/no/such/file.orvmat'), u'')
        self.assertEqual(PyOrvXml.getOrvoptXml(u'/no/such/file.luopt'), u'')

    def test_arguments_are_parsed_as_one_text_object(self):
        path = self.write('a.orvmat', b'x')
        self.assertRaises(TypeError, PyOrvXml.getOrvmatXml, path.encode('utf-8'))
        self.assertRaises(TypeError, PyOrvXml.getOrvmatXml)
        self.assertRaises(TypeError, PyOrvXml.getOrvmatXml, path, path)
        self.assertRaises(TypeError, PyOrvXml.getOrvoptXml, 3)
        self.assertRaises(TypeError, PyOrvXml.getOrvoptXml, None)

    def test_text_road(self):
        cases = [
            (b'<a/>\r\n', u'<a/>\r\n'),                   # line ending kept
            (b'caf\xc3\xa9', u'caf\xe9'),                 # UTF-8
            (b'caf\xe9 \x80', u'caf\xe9 \u20ac'),         # Windows-1252
            (b'\xef\xbb\xbfbom', u'\ufeffbom'),           # byte-order mark kept
            (b'a\x00b\x00', u'a'),                        # UTF-16: up to the first zero byte
            (b'', u''),                                   # empty file
            (b'\x00abc', u''),
            (b'\xf0\x9f\x98\x80!', u'\U0001F600!'),       # beyond the 16-bit plane
        ]
        for data, expected in cases:
            self.assertEqual(PyOrvXml.getOrvmatXml(self.write('t.orvmat', data)), expected)
            self.assertEqual(PyOrvXml.getOrvoptXml(self.write('t.orvopt', data)), expected)

    def test_binary_file_that_does_not_load_takes_the_text_road(self):
        # Header of a version 3 library with one material of an unknown type.
        data = struct.pack('<III', 0x30000, 1, 1) + struct.pack('<I', 15) + b'\x00' * 4092
        self.assertEqual(PyOrvXml.getOrvmatXml(self.write('bad.orvmat', data)), u'')
        data = struct.pack('<II', 0x10000, 1) + b'text'
        self.assertEqual(PyOrvXml.getOrvmatXml(self.write('v1.lumat', data)), u'')

    def test_non_ascii_paths(self):
        name = u'\xe9t\xe9 \U0001F600.orvmat'
        path = os.path.join(text(self.dir), name)
        with open(path.encode('utf-8'), 'wb') as f:
            f.write(b'ok')
        self.assertEqual(PyOrvXml.getOrvmatXml(path), u'ok')

    def test_large_damaged_file_does_not_hang(self):
        data = (struct.pack('<II', 0x30000, 0xFFFFFFFF) + struct.pack('<I', 0xFFFFFFFF) +
                b'\xff' * 100000)
        self.assertEqual(PyOrvXml.getOrvmatXml(self.write('big.orvmat', data)), u'')


if __name__ == '__main__':
    unittest.main()
