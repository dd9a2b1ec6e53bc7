# -*- coding: utf-8 -*-
"""Whole conversions through the interpreter (2.7 or 3), on the bundled sample files."""
import os
import re
import subprocess
import sys
import unittest

from support import EXAMPLES, ScratchTest, example, read, PyOrvXml


class MaterialDocuments(ScratchTest):
    def check_document(self, xml, groups):
        self.assertTrue(xml.startswith(u'<orvmat>\n'), xml[:40])
        self.assertTrue(xml.endswith(u'</orvmat>\n'))
        self.assertEqual(xml.count(u'\n  <Assets>\n'), groups)
        self.assertEqual(xml.count(u'<Asset '), xml.count(u'</Asset>'))

    def test_each_container_generation(self):
        # Version 3 (blocks), version 2 (plain stream) and version 1 (text-mode
        # stream with CR LF pairs) all load rather than falling to the text road.
        for name in ('materials_all_layers.orvmat', 'materials_old_records_v2.orvmat',
                     'materials_old_records_v1.lumat'):
            xml = PyOrvXml.getOrvmatXml(example(name))
            self.assertTrue(xml.startswith(u'<orvmat>\n'), name)
            self.check_document(xml, xml.count(u'\n  <Assets>\n'))
            self.assertGreater(xml.count(u'\n  <Assets>\n'), 0)

    def test_same_file_under_both_extensions(self):
        dst = self.write('copy.LUMAT', read(os.path.join(EXAMPLES, 'materials_all_layers.orvmat')))
        self.assertEqual(PyOrvXml.getOrvmatXml(dst), PyOrvXml.getOrvmatXml(example('materials_all_layers.orvmat')))

    def test_damaged_record_takes_the_text_road(self):
        data = read(os.path.join(EXAMPLES, 'materials_all_layers.orvmat'))
        # Break the first material's version tag (behind header, block count, type tag).
        bad = self.write('bad.orvmat', data[:18] + b'\x07\x00' + data[20:])
        self.assertEqual(PyOrvXml.getOrvmatXml(bad), u'')


class DocumentSun(unittest.TestCase):
    SCRIPT = """
import PyOrvXml, re, sys
def sun(name):
    path = sys.argv[1] + '/' + name
    xml = PyOrvXml.getOrvmatXml(path if sys.version_info[0] >= 3 else path.decode('utf-8'))
    return re.search(r'name="sun"[^\\n]*\\n *<value>([^<]*)<', xml).group(1)
first = sun('textures_sky_document_sun_2.orvmat')
sun('textures_sky_document_sun_1.orvmat')
sys.stdout.write(first + '|' + sun('textures_sky_document_sun_2.orvmat'))
"""

    def test_a_version_3_sky_replaces_the_document_sun_for_later_calls(self):
        # A fresh interpreter: the document sun lives as long as the process.
        out = subprocess.check_output([sys.executable, '-c', self.SCRIPT, EXAMPLES],
                                      env=dict(os.environ, PYTHONPATH=sys.path[0]))
        before, after = out.decode('utf-8').split('|')
        self.assertEqual(before, '/Rhino Document Sun')
        self.assertNotEqual(after, before)
        self.assertTrue(after.startswith('/{'), after)


class WrappedTrees(unittest.TestCase):
    def test_wrapped_libraries_load(self):
        for name in ('materials_wrapped_trees.orvmat', 'materials_folded_wrappers.orvmat',
                     'materials_old_wrapper_records.orvmat', 'textures_procedural.orvmat',
                     'textures_procedural_old.orvmat', 'textures_sky_versions.orvmat'):
            xml = PyOrvXml.getOrvmatXml(example(name))
            self.assertTrue(xml.startswith(u'<orvmat>\n'), name)
            self.assertEqual(xml.count(u'<Asset '), xml.count(u'</Asset>'))


class OptionsDocuments(ScratchTest):
    def test_saved_and_old_files_give_22_blocks(self):
        for name in ('render_settings.orvopt', 'old_settings_v4.luopt'):
            xml = PyOrvXml.getOrvoptXml(example(name))
            self.assertTrue(xml.startswith(u'<orvopt>\n'), name)
            self.assertTrue(xml.endswith(u'</orvopt>\n'))
            self.assertEqual(xml.count(u'\n  <Assets>\n'), 22)
            self.assertEqual(len(re.findall(u'<Asset layout="" renderer="lumo" type="settings"', xml)) >= 22, True)

    def test_damaged_options_file_gives_its_first_character(self):
        data = read(os.path.join(EXAMPLES, 'render_settings.orvopt'))
        # The tag's low half stays 1; the version (15) is one no file has.
        bad_version = self.write('badversion.orvopt', b'\x01\x00\x0f\x00' + data[4:])
        self.assertEqual(PyOrvXml.getOrvoptXml(bad_version), u'\x01')


if __name__ == '__main__':
    unittest.main()
