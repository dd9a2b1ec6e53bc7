# -*- coding: utf-8 -*-
"""orvxml --list, --files and --search, and the two ways a conversion can
differ from the module's exact text: --well-formed and --remap.

Standard library only; ORVXML names the binary, ORVXML_SOURCE_DIR the tree.
"""
import json
import os
import unittest
import xml.etree.ElementTree as ElementTree

from test_orvxml import EXAMPLES, Tree, run

# A name and a path with every character that the exact text leaves raw.
AWKWARD_NAME = b'A&<l"y>s\''
AWKWARD_PATH = b'C:\\Maps\\w&o<d.png'


class Listing(Tree):
    def example(self, name):
        return os.path.join(EXAMPLES, name)

    def test_list_shows_materials_and_options(self):
        trees, options = self.example('materials_wrapped_trees.orvmat'), self.example('render_settings.orvopt')
        text, missing = self.example('text_export.orvmat'), self.path('gone.orvmat')
        report = self.path('list.jsonl')
        code, out, err = run('--list', '--report', report, trees, options, text, missing)
        self.assertEqual(code, 3)
        self.assertEqual(out.decode('utf-8').splitlines(), [
            trees + ': Wall\tMaterialBump\t\t1 texture\tMaterialBump[Material2Sided[MaterialLayeredBRDF'
            '[Diffuse_BRDF], MaterialLayeredBRDF[Diffuse_BRDF]]]',
            trees + ': Ref\tMaterialReference\t\t0 textures\tMaterialReference[MaterialLayeredBRDF[Diffuse_BRDF]]',
            trees + ': Ink\tMaterialToon\t\t1 texture\tMaterialToon[MaterialLayeredBRDF[Diffuse_BRDF]]',
            trees + ': Outer\tMaterialAngleBlend\t\t0 textures\tMaterialAngleBlend[MaterialAngleBlend['
            'MaterialLayeredBRDF[Diffuse_BRDF], MaterialLayeredBRDF[Diffuse_BRDF]], MaterialLayeredBRDF[Diffuse_BRDF]]',
            options + ': version 23\tcamera type 0\tphysical camera on, type 0',
            text + ': text: bad header at byte 0: version tag with a low half 0x746f6e3c',
            missing + ': unreadable: can\'t be opened: No such file or directory'])
        self.assertEqual(err.splitlines(), [
            'orvxml: %s: can\'t be opened: No such file or directory' % missing,
            'orvxml: 2 files listed, 4 materials, 1 fell back to text, 1 unreadable'])
        with open(report) as f:
            rows = [json.loads(line) for line in f]
        self.assertEqual([(r['path'], r['status'], r.get('name'), r.get('version')) for r in rows], [
            (trees, 'document', 'Wall', None), (trees, 'document', 'Ref', None),
            (trees, 'document', 'Ink', None), (trees, 'document', 'Outer', None),
            (options, 'document', None, 23), (text, 'text', None, None), (missing, 'unreadable', None, None)])
        self.assertEqual(rows[2]['class'], 'MaterialToon')
        self.assertEqual(rows[2]['textures'], 1)
        # Nothing but documents: 0; a folder is walked.
        self.copy('materials_wrapped_trees.orvmat', 'lib/a.orvmat')
        self.copy('old_settings_v4.luopt', 'lib/sub/b.luopt')
        code, out, err = run('--list', self.path('lib'))
        self.assertEqual(code, 0, err)
        self.assertEqual(len(out.splitlines()), 5)
        self.assertEqual(out.splitlines()[-1].decode('utf-8'),
                         self.path('lib', 'sub', 'b.luopt') + ': version 4\tcamera type 0\tphysical camera off, type 0')

    def test_files_are_looked_for_beside_the_library_and_in_search_folders(self):
        lib = self.copy('materials_old_records_v1.lumat', 'lib/old.lumat')
        self.put('lib/textures/stone.png', b'png')
        self.put('search/textures/glass_tint.png', b'png')
        self.put('later/textures/glass_tint.png', b'png')
        self.put('later/textures/mirror_mask.png', b'png')
        report = self.path('files.jsonl')
        code, out, err = run('--files', '--report', report, '--search', self.path('search'),
                             '--search=' + self.path('later'), lib)
        self.assertEqual(code, 0, err)
        where = 'MaterialLayeredBRDF > %s_BRDF > BitmapTexture > BitmapBuffer'
        self.assertEqual(out.decode('utf-8').splitlines(), [
            lib + ': OldLayered\ttextures/glass_tint.png\t%s\t%s'
            % (self.path('search', 'textures', 'glass_tint.png'), where % 'Glass'),
            lib + ': OldLayered\ttextures/mirror_mask.png\t%s\t%s'
            % (self.path('later', 'textures', 'mirror_mask.png'), where % 'Mirror'),
            lib + ': OldSingle\ttextures/stone.png\t%s\t%s'
            % (self.path('lib', 'textures', 'stone.png'), 'MaterialSingleBRDF > Diffuse_BRDF > BitmapTexture '
               '> BitmapBuffer')])
        self.assertEqual(err, 'orvxml: 3 references in 1 files, 0 missing, 0 fell back to text, 0 unreadable\n')
        with open(report) as f:
            self.assertEqual([(r['material'], r['status']) for r in map(json.loads, f)],
                             [('OldLayered', 'found'), ('OldLayered', 'found'), ('OldSingle', 'found')])
        # Without the search folders two are missing: exit 1.
        code, out, err = run('--files', lib)
        self.assertEqual(code, 1)
        self.assertEqual([l.split(b'\t')[2] for l in out.splitlines()],
                         [b'missing', b'missing', self.path('lib', 'textures', 'stone.png').encode()])
        # A Windows path is found by its file name in the library's folder.
        self.put('win/w&o<d.png', b'png')
        awkward = self.awkward('win/awkward.orvmat')
        code, out, _ = run('--files', awkward)
        self.assertEqual(code, 0)
        self.assertEqual(out.split(b'\t')[1:3], [AWKWARD_PATH, self.path('win', 'w&o<d.png').encode()])

    def awkward(self, rel):
        """The all-layers example with a name and a bitmap path that the exact
        text leaves unescaped, both of the same length as before."""
        data = self.read(os.path.join(EXAMPLES, 'materials_all_layers.orvmat'))
        return self.put(rel, data.replace(b'AllLayers', AWKWARD_NAME).replace(b'textures/wood.png', AWKWARD_PATH))

    def test_well_formed_documents_parse_to_the_models_text(self):
        awkward = self.awkward('awkward.orvmat')
        code, exact, _ = run(awkward)
        self.assertEqual(code, 0)
        self.assertRaises(ElementTree.ParseError, ElementTree.fromstring, exact)
        code, out, _ = run('--well-formed', awkward)
        self.assertEqual(code, 0)
        root = ElementTree.fromstring(out)
        name = AWKWARD_NAME.decode('ascii')
        urls = [e.get('url') for e in root.iter('Asset')]
        self.assertIn('/' + name, urls)
        self.assertTrue(all((u + '/').startswith('/' + name + '/') for u in urls), urls)
        self.assertIn(AWKWARD_PATH.decode('ascii'), [e.text for e in root.iter('value')])
        # The same through -o and workers.
        code, _, _ = run('--well-formed', '-j2', '-o', self.path('out'), awkward, awkward + '.copy')
        self.assertEqual(self.read(self.path('out', 'awkward.orvmat.xml')), out)
        # A document without such characters is the same in both modes.
        for name in sorted(os.listdir(EXAMPLES)):
            path = os.path.join(EXAMPLES, name)
            if name.endswith(('.orvmat', '.lumat', '.orvopt', '.luopt')):
                self.assertEqual(run('--well-formed', path)[:2], run(path)[:2], name)

    def test_remap_rewrites_stored_paths_and_nothing_else(self):
        settings = os.path.join(EXAMPLES, 'render_settings.orvopt')
        os.makedirs(self.path('assets'))
        rules = ['--remap', 'c:/RENDERS/kitchen & hall.png=/out/hall.png',  # overlaps the next: first wins
                 '--remap', 'C:\\Renders=/out', '--remap', '\\\\FARM\\assets=' + self.path('assets'),
                 '--remap', 'C:\\render=/never']  # not a whole step of C:\renders
        report = self.path('report.jsonl')
        code, out, err = run('--report', report, '-o', self.path('out'), *(rules + [settings]))
        self.assertEqual(code, 0, err)
        exact = run(settings)[1].splitlines()
        remapped = self.read(self.path('out', 'render_settings.orvopt.xml')).splitlines()
        self.assertEqual(len(exact), len(remapped))
        changed = [(a.strip(), b.strip()) for a, b in zip(exact, remapped) if a != b]
        self.assertEqual(changed, [
            (b'<value>C:\\renders\\kitchen.vrmap</value>', b'<value>/out\\kitchen.vrmap</value>'),
            (b'<value>C:\\renders\\kitchen &amp; hall.png</value>', b'<value>/out/hall.png</value>'),
            (b'<value>\\\\farm\\assets</value>', ('<value>%s</value>' % self.path('assets')).encode())])
        with open(report) as f:
            row = json.loads(f.read())
        self.assertEqual(row['remapped'], [
            {'from': 'C:\\renders\\kitchen.vrmap', 'to': '/out\\kitchen.vrmap'},
            {'from': 'C:\\renders\\kitchen & hall.png', 'to': '/out/hall.png'},
            {'from': '\\\\farm\\assets', 'to': self.path('assets')}])
        # --files shows each path as rewritten, and looks for it there.
        code, out, _ = run('--files', *(rules + [settings]))
        self.assertEqual(code, 0)
        self.assertEqual(out.decode('utf-8').splitlines()[-1], '%s: SettingsDR.folder\t%s\t%s\tremapped from %s'
                         % (settings, self.path('assets'), self.path('assets'), '\\\\farm\\assets'))
        code, out, _ = run('--files', settings)
        self.assertEqual(code, 1)
        self.assertEqual(out.decode('utf-8').splitlines()[-1],
                         '%s: SettingsDR.folder\t\\\\farm\\assets\tmissing' % settings)

    def test_usage_errors(self):
        good = os.path.join(EXAMPLES, 'render_settings.orvopt')
        for args in (['--list', '--files', good], ['--list', '-o', self.path('out'), good],
                     ['--files', '--explain', good], ['--list', '--update', good],
                     ['--list', '--remap', 'a=b', good], ['--search', self.path(), good],
                     ['--remap', 'nothing', good], ['--remap', '=b', good], ['--files', '--well-formed', good]):
            code, out, err = run(*args)
            self.assertEqual((code, out), (2, b''), args)
            self.assertIn('Try \'orvxml --help\'', err)
        self.assertFalse(os.path.exists(self.path('out')))


if __name__ == '__main__':
    unittest.main()
