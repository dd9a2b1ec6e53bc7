# -*- coding: utf-8 -*-
"""getXmlWithOutcome(path, wellFormed=True): documents whose names, urls, list
entries and file paths hold every awkward character parse with expat, and each
parsed value is the file's text (characters XML 1.0 doesn't allow as U+FFFD);
a document without such characters is the same in both modes. Under Python
2.7 and 3."""
import os
import struct
import unittest
import xml.dom.minidom
import xml.etree.ElementTree as ElementTree

from support import EXAMPLES, ScratchTest, example, examples, read, text, PyOrvXml

# Text of a material or layer name: the model takes control characters out of
# names, so these have none.
NAME = u'A&B <c> "d" \'e\' &amp; &lt;x&gt; caf\xe9 \u6750 \U0001F600 \ufffe'
LAYER = u'G&l<a>s"s\'&#38;\uffff'
# A file path keeps every character.
PATH = (u'C:\\maps\\a&b <c> "d" \'e\' &amp;\x01\t\r\n\x1f\x7f \ufffe\uffff '
        u'\xe9\U0001F600.png')
ALLOWED_CONTROLS = u'\t\n\r'


def allowed(value):
    """The text as a well-formed document carries it: U+FFFD for what XML 1.0 doesn't allow."""
    return u''.join(u'\ufffd' if (ord(c) < 0x20 and c not in ALLOWED_CONTROLS) or c in u'\ufffe\uffff'
                    else c for c in value)


def respell(data, old, new):
    """The archive bytes with each stored text `old` (its length and UTF-8) made `new`."""
    old_bytes, new_bytes = old.encode('utf-8'), new.encode('utf-8')
    stored = struct.pack('<I', len(old_bytes)) + old_bytes
    assert data.count(stored) == 1, old
    return data.replace(stored, struct.pack('<I', len(new_bytes)) + new_bytes)


def plain_stream(data):
    """A version 3 library as version 2: the same records, the stream without its blocks."""
    tag, count = struct.unpack('<II', data[:8])
    assert tag == 0x30000
    return struct.pack('<II', 0x20000, count) + data[12:]


def library(spellings):
    data = plain_stream(read(os.path.join(EXAMPLES, 'materials_all_layers.orvmat')))
    for old, new in (('AllLayers', spellings[0]), ('Glass', spellings[1]), ('textures/wood.png', spellings[2])):
        data = respell(data, old, new)
    return data


def options(spellings):
    data = read(os.path.join(EXAMPLES, 'render_settings.orvopt'))
    for old, new in ((u'C:\\renders\\kitchen & hall.png', spellings[0]),
                     (u'\\\\farm\\assets', spellings[1])):
        data = respell(data, old, new)
    return data


def tree_items(root, replace=lambda value: value):
    """Every element in document order: its tag, attributes, text and tail."""
    return [(e.tag, sorted((k, replace(v)) for k, v in e.attrib.items()),
             replace(e.text or u''), replace(e.tail or u'')) for e in root.iter()]


def parse(document):
    return ElementTree.fromstring(document.encode('utf-8'))


class AwkwardTexts(ScratchTest):
    def outcome(self, path, wellFormed):
        return PyOrvXml.getXmlWithOutcome(path, freshSun=True, wellFormed=wellFormed)

    def check(self, name, make, awkward):
        """The file with awkward texts, against the same file with placeholders
        where they stand, parsed: the same tree, the placeholders put back."""
        placeholders = [u'PLACEHOLDER%d' % i for i in range(len(awkward))]

        def put_back(value):
            for placeholder, model in zip(placeholders, awkward):
                value = value.replace(placeholder, allowed(model))
            return value
        clean = self.write('clean_' + name, make(placeholders))
        strange = self.write(name, make(awkward))
        reference = self.outcome(clean, False)
        self.assertEqual(reference.status, 'document')
        expected = tree_items(parse(reference.text), put_back)

        result = self.outcome(strange, True)
        self.assertEqual((result.status, result.count), ('document', reference.count))
        self.assertEqual(tree_items(parse(result.text)), expected)
        # minidom, over the same expat, reads the same document.
        dom = xml.dom.minidom.parseString(result.text.encode('utf-8'))
        self.assertEqual(len(dom.getElementsByTagName('Asset')), len(parse(result.text).findall('.//Asset')))
        # Without the mode the document is not XML at all.
        plain = self.outcome(strange, False)
        self.assertEqual(plain.status, 'document')
        self.assertRaises(ElementTree.ParseError, parse, plain.text)
        return result.text, dom

    def test_material_names_layer_names_and_file_paths(self):
        document, dom = self.check('awkward.orvmat', library, (NAME, LAYER, PATH))
        urls = [a.getAttribute('url') for a in dom.getElementsByTagName('Asset')]
        self.assertIn(u'/' + allowed(NAME), urls)
        self.assertIn(u'/' + allowed(NAME) + u'/' + allowed(LAYER), urls)
        entries = [e.firstChild.data for e in dom.getElementsByTagName('entry')]
        self.assertIn(u'/' + allowed(NAME) + u'/' + allowed(LAYER), entries)
        files = [p for p in dom.getElementsByTagName('parameter') if p.getAttribute('handler') == 'FileBrowserHandler']
        self.assertEqual([f.getElementsByTagName('value')[0].firstChild.data for f in files], [allowed(PATH)])
        self.assertNotIn(u'\ufffe', document)
        self.assertNotIn(u'\x01', document)

    def test_options_paths(self):
        unc = u'\\\\Farm & Co\\<share>\\"x"\\\x02\x1e\ufffe'
        document, dom = self.check('awkward.orvopt', options, (PATH, unc))
        values = dict((p.getAttribute('name'), p.getElementsByTagName('value')[0].firstChild.data)
                      for p in dom.getElementsByTagName('parameter')
                      if p.getAttribute('name') in ('img_file', 'folder'))
        self.assertEqual(values, {u'img_file': allowed(PATH), u'folder': allowed(unc)})

    def test_documents_without_awkward_texts_are_the_same(self):
        documents = 0
        for path in examples():
            path = text(path)
            plain, strict = self.outcome(path, False), self.outcome(path, True)
            self.assertEqual(strict, plain, path)
            if plain.status == 'document':
                documents += 1
                parse(strict.text)
        self.assertGreater(documents, 10)

    def test_text_road_is_never_escaped(self):
        path = self.write('export.orvmat', b'<a b="&amp;">\x01 & \xc3\xa9</a>')
        self.assertEqual(self.outcome(path, True), self.outcome(path, False))
        self.assertEqual(self.outcome(path, True).text, u'<a b="&amp;">\x01 & \xe9</a>')


class Keyword(ScratchTest):
    def test_keyword_only_and_its_truth(self):
        path = self.write('a.orvmat', b'<a/>')
        get = PyOrvXml.getXmlWithOutcome
        self.assertEqual(get(path, wellFormed=True).text, u'<a/>')
        self.assertEqual(get(path=path, freshSun=True, wellFormed=0).status, 'text')
        self.assertRaises(TypeError, get, path, False, True)
        self.assertRaises(TypeError, get, path, wellformed=True)

        class Untrue(object):
            def __bool__(self):
                raise ZeroDivisionError('no truth')
            __nonzero__ = __bool__
        self.assertRaises(ZeroDivisionError, get, path, wellFormed=Untrue())
        self.assertIn('wellFormed', get.__doc__)
        self.assertIn('wellFormed', PyOrvXml.__doc__)

    def test_the_two_functions_take_no_option(self):
        path = example('materials_all_layers.orvmat')
        for function in (PyOrvXml.getOrvmatXml, PyOrvXml.getOrvoptXml):
            self.assertRaises(TypeError, function, path, wellFormed=True)


if __name__ == '__main__':
    unittest.main()
