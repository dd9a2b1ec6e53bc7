# -*- coding: utf-8 -*-
"""The module's surface, exercised through the Python 2.7 interpreter."""
import os
import shutil
import struct
import sys
import tempfile
import unittest

sys.path.insert(0, os.environ.get('ORVXML_BUILD_DIR', 'build'))
import PyOrvXml  # noqa: E402


class ModuleSurface(unittest.TestCase):
    def setUp(self):
        self.dir = tempfile.mkdtemp()

    def tearDown(self):
        shutil.rmtree(self.dir)

    def write(self, name, data):
        path = os.path.join(self.dir, name)
        with open(path, 'wb') as f:
            f.write(data)
        return path.decode('utf-8') if isinstance(path, str) else path

    def test_attributes_and_documents(self):
        self.assertEqual(PyOrvXml.getOrvmatXml.__doc__, 'Gets the xml from a orvmat file.')
        self.assertEqual(PyOrvXml.getOrvoptXml.__doc__, 'Gets the xml from a orvopt file.')
        self.assertTrue(issubclass(PyOrvXml.error, Exception))
        self.assertEqual(PyOrvXml.error.__name__, 'error')
        self.assertEqual(PyOrvXml.error.__module__, 'PyOrvXml')

    def test_extensions_in_any_case_pass_their_own_function_only(self):
        for name in ('a.orvmat', 'b.ORVMAT', 'c.LuMat', 'd.lumat'):
            path = self.write(name, '<a/>\n')
            self.assertEqual(PyOrvXml.getOrvmatXml(path), u'<a/>\n')
            self.assertRaises(SystemError, PyOrvXml.getOrvoptXml, path)
        for name in ('a.orvopt', 'b.OrvOpt', 'c.LUOPT', 'd.luopt'):
            path = self.write(name, '<b/>')
            self.assertEqual(PyOrvXml.getOrvoptXml(path), u'<b/>')
            self.assertRaises(SystemError, PyOrvXml.getOrvmatXml, path)

    def test_refused_paths_set_no_exception_of_their_own(self):
        # The module returns NULL without an exception; the interpreter then
        # raises its own SystemError.
        for path in (u'', u'noext', u'/tmp/x.orvmat/', u'/tmp/x.', u'/tmp/x.orvmat ',
                     u'/tmp/dir.orvmat/file'):
            self.assertRaises(SystemError, PyOrvXml.getOrvmatXml, path)

    def test_dot_in_directory_name_only(self):
        sub = os.path.join(self.dir, 'lib.orvmat')
        os.mkdir(sub)
        with open(os.path.join(sub, 'file'), 'wb') as f:
            f.write('x')
        self.assertRaises(SystemError, PyOrvXml.getOrvmatXml, sub.decode('utf-8') + u'/file')

    def test_missing_file_gives_empty_string(self):
        self.assertEqual(PyOrvXml.getOrvmatXml(u'/no/such/file.orvmat'), u'')
        self.assertEqual(PyOrvXml.getOrvoptXml(u'/no/such/file.luopt'), u'')

    def test_arguments_are_parsed_as_one_unicode_object(self):
        path = self.write('a.orvmat', 'x')
        self.assertRaises(TypeError, PyOrvXml.getOrvmatXml, path.encode('utf-8'))
        self.assertRaises(TypeError, PyOrvXml.getOrvmatXml)
        self.assertRaises(TypeError, PyOrvXml.getOrvmatXml, path, path)
        self.assertRaises(TypeError, PyOrvXml.getOrvoptXml, 3)

    def test_text_road(self):
        cases = [
            ('<a/>\r\n', u'<a/>\r\n'),                    # line ending kept
            ('caf\xc3\xa9', u'caf\xe9'),                  # UTF-8
            ('caf\xe9 \x80', u'caf\xe9 \u20ac'),          # Windows-1252
            ('\xef\xbb\xbfbom', u'\ufeffbom'),            # byte-order mark kept
            ('a\x00b\x00', u'a'),                         # UTF-16: up to the first zero byte
            ('', u''),                                    # empty file
            ('\x00abc', u''),
            ('\xf0\x9f\x98\x80!', u'\U0001F600!'),        # beyond the 16-bit plane
        ]
        for data, expected in cases:
            self.assertEqual(PyOrvXml.getOrvmatXml(self.write('t.orvmat', data)), expected)
            self.assertEqual(PyOrvXml.getOrvoptXml(self.write('t.orvopt', data)), expected)

    def test_binary_file_that_does_not_load_takes_the_text_road(self):
        # Header of a version 3 library with one material of an unknown type.
        data = struct.pack('<III', 0x30000, 1, 1) + struct.pack('<I', 15) + '\x00' * 4092
        self.assertEqual(PyOrvXml.getOrvmatXml(self.write('bad.orvmat', data)), u'')
        data = struct.pack('<II', 0x10000, 1) + 'text'
        self.assertEqual(PyOrvXml.getOrvmatXml(self.write('v1.lumat', data)), u'')

    def test_non_ascii_paths(self):
        name = u'\xe9t\xe9 \U0001F600.orvmat'
        path = os.path.join(self.dir.decode('utf-8'), name)
        with open(path.encode('utf-8'), 'wb') as f:
            f.write('ok')
        self.assertEqual(PyOrvXml.getOrvmatXml(path), u'ok')

    def test_large_damaged_file_does_not_hang(self):
        data = struct.pack('<II', 0x30000, 0xFFFFFFFF) + struct.pack('<I', 0xFFFFFFFF) + '\xff' * 100000
        self.assertEqual(PyOrvXml.getOrvmatXml(self.write('big.orvmat', data)), u'')


if __name__ == '__main__':
    unittest.main()
