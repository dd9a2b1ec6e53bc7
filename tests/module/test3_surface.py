# -*- coding: utf-8 -*-
"""What Python 3 adds to the module's surface: path-like objects, messages,
and text that matches Python 2.7's to the code point."""
import os
import pathlib
import sys
import unittest

from support import (BUILD, SOURCE, ScratchTest, PyOrvXml, convert_elsewhere, convert_here,
                     examples)


class PathLike(object):
    def __init__(self, path):
        self.path = path

    def __fspath__(self):
        return self.path


class Arguments(ScratchTest):
    def test_str_and_path_likes_giving_str(self):
        path = self.write('a.orvmat', b'<a/>')
        for arg in (path, pathlib.Path(path), pathlib.PurePosixPath(path), PathLike(path)):
            self.assertEqual(PyOrvXml.getOrvmatXml(arg), '<a/>')
            self.assertIs(type(PyOrvXml.getOrvmatXml(arg)), str)

    def test_outcome_takes_the_same_paths(self):
        path = self.write('a.luopt', b'<a/>')
        for arg in (path, pathlib.Path(path), PathLike(path)):
            self.assertEqual(PyOrvXml.getXmlWithOutcome(arg),
                             ('<a/>', 'text', PyOrvXml.getXmlWithOutcome(path).reason, 'options', 0))
        for arg in (path.encode(), PathLike(path.encode()), PathLike(3)):
            self.assertRaises(TypeError, PyOrvXml.getXmlWithOutcome, arg)
        with self.assertRaises(TypeError) as caught:
            PyOrvXml.getXmlWithOutcome(path, True)  # the options are keywords only
        self.assertIn('positional', str(caught.exception))

    def test_no_reference_to_the_path_is_kept(self):
        path = self.write('a.orvmat', b'<a/>')
        for arg, function in ((path, PyOrvXml.getOrvmatXml), (path.encode(), PyOrvXml.getOrvmatXml),
                              (path, PyOrvXml.getOrvoptXml), (path + '\0', PyOrvXml.getOrvmatXml),
                              (path, PyOrvXml.getXmlWithOutcome),
                              (path + '\0', PyOrvXml.getXmlWithOutcome)):
            before = sys.getrefcount(arg)
            for _ in range(100):
                try:
                    function(PathLike(arg))
                except (TypeError, SystemError, ValueError):
                    pass
            self.assertEqual(sys.getrefcount(arg), before, repr(arg))

    def test_bytes_are_refused(self):
        path = self.write('a.orvopt', b'<a/>')
        for arg in (path.encode(), PathLike(path.encode()), bytearray(path.encode())):
            with self.assertRaises(TypeError) as caught:
                PyOrvXml.getOrvoptXml(arg)
            if not isinstance(arg, bytearray):  # not path-like at all
                self.assertIn('not bytes', str(caught.exception))

    def test_other_objects_are_refused(self):
        for args in ((), (1,), (None,), ('a.orvmat', 'b.orvmat'), (PathLike(3),)):
            self.assertRaises(TypeError, PyOrvXml.getOrvmatXml, *args)
        with self.assertRaises(TypeError) as caught:
            PyOrvXml.getOrvoptXml()
        self.assertIn('getOrvoptXml', str(caught.exception))

    def test_refused_extension_names_the_accepted_ones(self):
        for function, other, message in (
                (PyOrvXml.getOrvmatXml, 'x.orvopt',
                 'getOrvmatXml() takes a path ending in .orvmat or .lumat (any case)'),
                (PyOrvXml.getOrvoptXml, 'x.lumat',
                 'getOrvoptXml() takes a path ending in .orvopt or .luopt (any case)')):
            with self.assertRaises(SystemError) as caught:
                function(pathlib.Path(other))
            self.assertEqual(str(caught.exception), message)

    def test_embedded_null_is_a_value_error(self):
        self.assertRaises(ValueError, PyOrvXml.getOrvmatXml, self.dir + '/a\0b.orvmat')

    def test_lone_surrogates_in_paths(self):
        # The library gets the UTF-16 units as they are, as from 2.7. A name
        # that os.fsdecode made of undecodable bytes is not the name the
        # library opens, so the file counts as missing.
        with open(os.path.join(self.dir.encode(), b'\xff.orvmat'), 'wb') as f:
            f.write(b'x')
        for name in ('\udcff.orvmat', '\ud800.orvmat', 'a\udc00\ud800.lumat'):
            self.assertEqual(PyOrvXml.getOrvmatXml(os.path.join(self.dir, name)), '')
        self.assertRaises(SystemError, PyOrvXml.getOrvmatXml, self.dir + '/a.orvmat\udcff')


@unittest.skipUnless(os.environ.get('ORVXML_PYTHON27'), 'no CPython 2.7 module built')
class SameTextAsPython27(ScratchTest):
    TEXTS = [
        b'\xf0\x9f\x98\x80 \xf0\x90\x80\x80',   # code points beyond 16 bits
        b'\xed\xa0\xbd\xed\xb8\x80',            # a surrogate pair spelled as two UTF-8 triples
        b'a\xed\xa0\x80b',                      # a lone high surrogate spelled in UTF-8
        b'\xed\xb0\x80',                        # a lone low surrogate spelled in UTF-8
        b'\xef\xbb\xbf\xe2\x82\xac\x80\x81',    # not UTF-8: Windows-1252
        b'\xef\xbb\xbf<a>\xc3\xa9</a>',         # byte-order mark, UTF-8
    ]

    def test_every_example_and_text_gives_the_same_code_points(self):
        paths = examples()
        for i, data in enumerate(self.TEXTS):
            paths.append(self.write('t%d.orvmat' % i, data))
            paths.append(self.write('t%d.luopt' % i, data))
        expected = convert_elsewhere(os.environ['ORVXML_PYTHON27'], paths,
                                     dict(os.environ, PYTHONPATH=BUILD))
        self.assertEqual(len(expected), len(paths))
        documents = 0
        for path, (want, module) in zip(paths, expected):
            self.assertTrue(module.endswith('PyOrvXml.so'), module)
            self.assertEqual(convert_here(path), want, path)
            documents += want.startswith(('<orvmat>', '<orvopt>'))
        self.assertGreater(documents, 10)
        self.assertEqual(PyOrvXml.getOrvmatXml(paths[-12]), '\U0001F600 \U00010000')


class TypeStub(unittest.TestCase):
    def test_stub_names_what_the_module_has(self):
        import ast
        path = os.path.join(SOURCE, 'src', 'module', 'python', 'PyOrvXml.pyi')
        with open(path) as f:
            tree = ast.parse(f.read())
        names = {node.name for node in tree.body
                 if isinstance(node, (ast.FunctionDef, ast.ClassDef))}
        self.assertEqual(names, {n for n in dir(PyOrvXml) if not n.startswith('_')})
        for node in tree.body:
            if isinstance(node, (ast.FunctionDef, ast.ClassDef)):
                self.assertTrue(ast.get_docstring(node), node.name)


if __name__ == '__main__':
    unittest.main()
