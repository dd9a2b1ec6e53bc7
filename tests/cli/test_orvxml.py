# -*- coding: utf-8 -*-
"""The orvxml command end to end: output modes, folder trees, exit status,
explanations, the report, and results that don't depend on order or --jobs.

Standard library only; ORVXML names the binary, ORVXML_SOURCE_DIR the tree.
"""
import json
import os
import shutil
import signal
import struct
import subprocess
import sys
import tempfile
import time
import unittest

ORVXML = os.path.abspath(os.environ.get('ORVXML', 'build/orvxml'))
EXAMPLES = os.path.join(os.environ.get('ORVXML_SOURCE_DIR', '.'), 'examples')
# Files in the trees whose runs must last a while (progress, interruptions):
# fewer where each file takes longer, as under the sanitizers.
LONG_TREE = int(os.environ.get('ORVXML_LONG_TREE', '3000'))


def run(*args, **kwargs):
    p = subprocess.Popen([ORVXML] + list(args), stdout=subprocess.PIPE,
                         stderr=kwargs.pop('stderr', subprocess.PIPE), **kwargs)
    out, err = p.communicate()
    return p.returncode, out, (err or b'').decode('utf-8')


def u32(*values):
    return b''.join(struct.pack('<I', v) for v in values)


def v2(count, stream):
    """A material file of container version 2: header, then the stream."""
    return u32(0x20000, count) + stream


# A MaterialSingleBRDF (tag 0) record of version 2 up to its BRDF member's tag.
SINGLE_HEAD = u32(0, 0x20000, 7, 8)
# One MaterialMulti (tag 2) of version 2 that holds one member.
MULTI_LEVEL = u32(2, 0x20000, 1)

# Damaged files, one for each rule, and the start of the explanation.
DAMAGED = [
    ('header.orvmat', u32(0x40000, 1) + bytes(8),
     'text: bad header at byte 0: unknown container version tag 0x00040000'),
    ('tag.orvmat', v2(1, SINGLE_HEAD + u32(3) + bytes(8)),
     'text: unknown type tag at byte 24, reading MaterialSingleBRDF (type tag 0, version 2) '
     'from byte 12: Base_BRDF tag 3 has no class'),
    ('version.orvmat', v2(1, SINGLE_HEAD + u32(2, 0x630000) + bytes(8)),
     'text: record version not read at byte 28, reading Diffuse_BRDF (type tag 2) from byte 28: '
     'version tag 0x00630000'),
    ('count.orvmat', v2(1, u32(2, 0x20000, 5000) + bytes(8)),
     'text: count larger than the bytes left at byte 16, reading MaterialMulti '
     '(type tag 2, version 2) from byte 12: count 5000'),
    ('nesting.orvmat', v2(1, MULTI_LEVEL * 258 + bytes(16)),
     'text: nesting deeper than 256 at byte 3096, reading MaterialMulti (type tag 2, version 2) '
     'from byte 3084: MaterialMulti at depth 257'),
    ('short.orvmat', v2(1, SINGLE_HEAD)[:18],
     'text: data ends early at byte 18, reading MaterialSingleBRDF (type tag 0, version 2) '
     'from byte 12'),
    ('options.luopt', u32(0x7F0001) + bytes(60),
     'text: record version not read at byte 0, reading AllOptions from byte 0: '
     'version tag 0x007f0001'),
    ('missing.orvopt', None, 'unreadable: can\'t be opened: No such file or directory'),
    ('pipe.orvmat', 'fifo', 'unreadable: not a regular file'),
]


class Tree(unittest.TestCase):
    def setUp(self):
        self.tmp = tempfile.mkdtemp(prefix='orvxml-cli-')

    def tearDown(self):
        shutil.rmtree(self.tmp)

    def path(self, *parts):
        return os.path.join(self.tmp, *parts)

    def put(self, rel, data):
        path = self.path(rel)
        if not os.path.isdir(os.path.dirname(path)):
            os.makedirs(os.path.dirname(path))
        if data == 'fifo':
            os.mkfifo(path)
        elif data is not None:
            with open(path, 'wb') as f:
                f.write(data)
        return path

    def copy(self, example, rel):
        return self.put(rel, self.read(os.path.join(EXAMPLES, example)))

    def files_under(self, root):
        found = []
        for folder, _, names in os.walk(root):
            found += [os.path.relpath(os.path.join(folder, n), root) for n in names]
        return sorted(found)

    def read(self, path):
        with open(path, 'rb') as f:
            return f.read()


class CommandLine(Tree):
    def test_usage_errors_exit_2_with_a_message(self):
        self.copy('notes.luopt', 'a.luopt')
        os.mkdir(self.path('folder'))
        for args in ([], ['--jobs', '0'], ['-j', 'x'], ['--bogus', 'a.orvmat'], ['-o'],
                     ['--quiet=yes', 'a.orvmat'], [self.path('a.luopt'), self.path('a.luopt')],
                     [self.path('folder')]):
            code, out, err = run(*args)
            self.assertEqual(code, 2, args)
            self.assertEqual(out, b'', args)
            self.assertTrue(err.startswith('orvxml: '), (args, err))

    def test_help_and_version(self):
        code, out, _ = run('--help')
        self.assertEqual(code, 0)
        self.assertTrue(out.startswith(b'Usage: orvxml '))
        for option in (b'--output', b'--jobs', b'--update', b'--explain', b'--report', b'--fallbacks',
                       b'--quiet', b'--version'):
            self.assertIn(option, out)
        code, out, _ = run('--version')
        self.assertEqual(code, 0)
        self.assertRegex(out.decode(), r'^orvxml \d+\.\d+')

    def test_standard_output_is_the_text_alone(self):
        code, out, err = run(os.path.join(EXAMPLES, 'materials_all_layers.orvmat'))
        self.assertEqual(code, 0)
        self.assertTrue(out.startswith(b'<orvmat>\n'))
        self.assertTrue(out.endswith(b'</orvmat>\n'))
        self.assertEqual(err, 'orvxml: 1 converted, 0 fell back to text, 0 unreadable' +
                         err[err.index(' ('):])
        # A text file comes back as its text, and the status says so.
        text = self.put('note.orvopt', u'Render \u00e9t\u00e9\r\n'.encode('utf-8') + b'\0rest')
        code, out, _ = run('-q', text)
        self.assertEqual((code, out), (1, u'Render \u00e9t\u00e9\r\n'.encode('utf-8')))

    def test_quiet_leaves_only_errors(self):
        good = self.copy('render_settings.orvopt', 'good.orvopt')
        self.assertEqual(run('-q', '-o', self.path('out'), good)[2], '')
        code, _, err = run('-q', '-o', self.path('out'), good, self.path('gone.orvmat'))
        self.assertEqual(code, 3)
        self.assertEqual(err.splitlines(), [
            'orvxml: %s: can\'t be opened: No such file or directory' % self.path('gone.orvmat')])

    def on_terminal(self, columns, *args):
        """Runs with standard error on a pseudo terminal of `columns` columns;
        the status and what the terminal was sent."""
        try:
            import fcntl
            import pty
            import termios
            master, slave = pty.openpty()
        except (ImportError, OSError):
            self.skipTest('no pseudo terminal')
        fcntl.ioctl(slave, termios.TIOCSWINSZ, struct.pack('HHHH', 24, columns, 0, 0))
        code = run(*args, stderr=slave)[0]
        os.close(slave)
        shown = b''
        try:
            for chunk in iter(lambda: os.read(master, 4096), b''):
                shown += chunk
        except OSError:
            pass
        os.close(master)
        return code, shown

    def test_progress_only_on_a_terminal_and_within_its_width(self):
        first = self.copy('materials_all_layers.orvmat', 'tree/0000.orvmat')
        for i in range(1, LONG_TREE):
            shutil.copyfile(first, self.path('tree', '%04d.orvmat' % i))
        code, _, err = run('-o', self.path('out'), self.path('tree'))
        self.assertEqual(code, 0)
        self.assertEqual(len(err.splitlines()), 1)
        self.assertNotIn(' of ', err)
        for columns in (30, 160):
            code, shown = self.on_terminal(columns, '-j1', '-o', self.path('out%d' % columns),
                                           self.path('tree'))
            self.assertEqual(code, 0)
            # The summary starts on a clean line, the progress line erased.
            end = shown.rindex(b'\r\x1b[Korvxml: %d converted, 0 fell back to text, 0 unreadable (' % LONG_TREE)
            # Each draw replaces the line; none reaches the last column, so none wraps.
            draws = [d.replace(b'\x1b[K', b'') for d in shown[:end].split(b'\r') if d]
            self.assertEqual([d for d in draws if len(d) >= columns], [], columns)
            # The count while the tree is walked, then done of found, the rate, the time left.
            self.assertRegex(draws[0], br'^(orvxml: )?finding files, \d+ found$')
            self.assertRegex(draws[1], br'^(orvxml: )?1 of %d files$' % LONG_TREE)
            timed = [d for d in draws if d.endswith(b' left')]
            self.assertTrue(timed, draws)
            if columns == 160:
                self.assertRegex(timed[0], br'^orvxml: \d+ of %d files, \d+ files/s, \d+:\d\d left$' % LONG_TREE)
            else:
                self.assertRegex(timed[0], br'^\d+/%d, \d+/s, \d+:\d\d left$' % LONG_TREE)


class Trees(Tree):
    def test_folders_are_mirrored_and_other_files_skipped(self):
        self.copy('materials_old_records_v2.orvmat', 'lib/a.orvmat')
        self.copy('render_settings.orvopt', 'lib/sub/b.LUOPT')
        self.copy('materials_old_records_v1.lumat', 'lib/sub/deeper/c.LuMat')
        self.copy('notes.luopt', 'lib/notes.txt')
        self.put('lib/sub/old.orvmat.xml', b'<x/>')
        single = self.copy('old_settings_v4.luopt', 'single.luopt')
        code, _, err = run('-o', self.path('out'), self.path('lib'), single)
        self.assertEqual(code, 0, err)
        self.assertEqual(self.files_under(self.path('out')), [
            'a.orvmat.xml', 'single.luopt.xml', 'sub/b.LUOPT.xml', 'sub/deeper/c.LuMat.xml'])
        _, alone, _ = run(self.path('lib/sub/b.LUOPT'))
        self.assertEqual(self.read(self.path('out/sub/b.LUOPT.xml')), alone)

    def test_several_folders_go_under_their_own_names(self):
        for lib in ('a/lib', 'b/lib2'):
            self.copy('materials_old_records_v2.orvmat', lib + '/x.orvmat')
            self.copy('render_settings.orvopt', lib + '/sub/y.orvopt')
        single = self.copy('old_settings_v4.luopt', 'single.luopt')
        code, _, err = run('-o', self.path('out'), self.path('a', 'lib'), self.path('b', 'lib2') + os.sep,
                           single)
        self.assertEqual(code, 0, err)
        self.assertEqual(self.files_under(self.path('out')), [
            'lib/sub/y.orvopt.xml', 'lib/x.orvmat.xml', 'lib2/sub/y.orvopt.xml', 'lib2/x.orvmat.xml',
            'single.luopt.xml'])
        # "." and ".." go under the names that the folders really have.
        code, _, err = run('-o', self.path('dots'), '.', '..', cwd=self.path('a', 'lib'))
        self.assertEqual(code, 0, err)
        self.assertEqual(self.files_under(self.path('dots')), [
            'a/lib/sub/y.orvopt.xml', 'a/lib/x.orvmat.xml', 'lib/sub/y.orvopt.xml', 'lib/x.orvmat.xml'])
        # Inputs that still meet in one output: a usage error that names both,
        # before anything is written.
        self.copy('render_settings.orvopt', 'c/lib/x.orvmat')
        clash = self.path('clash')
        for args, first, second, output in (
                ([self.path('a', 'lib'), self.path('c', 'lib')], self.path('a', 'lib', 'x.orvmat'),
                 self.path('c', 'lib', 'x.orvmat'), os.path.join(clash, 'lib', 'x.orvmat.xml')),
                ([self.path('c', 'lib'), self.path('a', 'lib', 'x.orvmat')], self.path('c', 'lib', 'x.orvmat'),
                 self.path('a', 'lib', 'x.orvmat'), os.path.join(clash, 'x.orvmat.xml'))):
            code, out, err = run('-o', clash, *args)
            self.assertEqual((code, out), (2, b''))
            self.assertEqual(err.splitlines()[0],
                             'orvxml: %s and %s would both be written to %s' % (first, second, output))
            self.assertFalse(os.path.exists(clash))
        # The same path twice is one file, converted once.
        code, _, err = run('-o', clash, single, single)
        self.assertEqual(code, 0)
        self.assertIn('orvxml: 1 converted, ', err)

    def test_exit_status_follows_the_worst_file(self):
        good = self.copy('materials_old_records_v2.orvmat', 'good.orvmat')
        text = self.copy('text_export.orvmat', 'text.orvmat')
        other = self.copy('notes.luopt', 'notes.txt')
        out = self.path('out')
        self.assertEqual(run('-o', out, good)[0], 0)
        code, _, err = run('-o', out, good, text)
        self.assertEqual(code, 1)
        self.assertIn('1 converted, 1 fell back to text, 0 unreadable', err)
        # The text is written all the same, as the module returns it.
        self.assertEqual(self.read(os.path.join(out, 'text.orvmat.xml')),
                         self.read(text).split(b'\0')[0])
        code, _, err = run('-o', out, good, other)
        self.assertEqual(code, 3)
        self.assertIn('notes.txt: not a .orvmat, .lumat, .orvopt or .luopt file', err)
        self.assertIn('1 converted, 0 fell back to text, 1 unreadable', err)
        self.assertFalse(os.path.exists(os.path.join(out, 'notes.txt.xml')))

    def test_results_do_not_depend_on_order_or_jobs(self):
        # The document sun examples change process-wide state; interleave them
        # with other files so that each follows files of every kind.
        names = ['textures_sky_document_sun_1.orvmat', 'textures_sky_document_sun_2.orvmat',
                 'textures_sky_versions.orvmat', 'materials_folded_wrappers.orvmat',
                 'render_settings.orvopt', 'text_export.orvmat']
        inputs = []
        for i in range(24):
            name = names[i % len(names)]
            inputs.append(self.copy(name, os.path.join('in', 'f%02d_%s' % (i, name))))
        code, _, _ = run('-q', '--jobs', '2', '-o', self.path('two'), self.path('in'))
        self.assertEqual(code, 1)  # text_export falls back to text
        code, _, _ = run('-q', '--jobs', '1', '-o', self.path('one'), *reversed(inputs))
        self.assertEqual(code, 1)
        for path in inputs:
            name = os.path.basename(path) + '.xml'
            _, alone, _ = run(path)
            self.assertEqual(self.read(self.path('two', name)), alone, name)
            self.assertEqual(self.read(self.path('one', name)), alone, name)


class Update(Tree):
    def summary(self, err):
        line = err.splitlines()[-1]
        return line[:line.rindex(' (')]

    def test_only_missing_and_older_outputs_are_made_again(self):
        a = self.copy('materials_old_records_v2.orvmat', 'in/a.orvmat')
        b = self.copy('render_settings.orvopt', 'in/sub/b.orvopt')
        t = self.copy('text_export.orvmat', 'in/t.orvmat')
        out, report = self.path('out'), self.path('report.jsonl')
        code, _, err = run('--update', '-o', out, self.path('in'))
        self.assertEqual((code, self.summary(err)),
                         (1, 'orvxml: 2 converted, 1 fell back to text, 0 unreadable, 0 up to date'))
        fresh = dict((n, self.read(os.path.join(out, n))) for n in self.files_under(out))
        code, explain, err = run('--update', '--explain', '--report', report, '-o', out, self.path('in'))
        self.assertEqual((code, self.summary(err)),
                         (0, 'orvxml: 0 converted, 0 fell back to text, 0 unreadable, 3 up to date'))
        self.assertEqual(explain.decode('utf-8').splitlines(),
                         ['%s: up to date' % p for p in (a, b, t)])
        with open(report) as f:
            self.assertEqual([(r['path'], r['status']) for r in map(json.loads, f)],
                             [(a, 'up to date'), (b, 'up to date'), (t, 'up to date')])
        # An output that is gone, one older than its input, one of the same time.
        os.remove(os.path.join(out, 'sub', 'b.orvopt.xml'))
        made = os.stat(os.path.join(out, 'a.orvmat.xml')).st_mtime_ns
        os.utime(a, ns=(made + 10**9, made + 10**9))
        os.utime(os.path.join(out, 't.orvmat.xml'), ns=(os.stat(t).st_mtime_ns,) * 2)
        code, _, err = run('--update', '-o', out, self.path('in'))
        self.assertEqual((code, self.summary(err)),
                         (0, 'orvxml: 2 converted, 0 fell back to text, 0 unreadable, 1 up to date'))
        self.assertEqual(dict((n, self.read(os.path.join(out, n))) for n in self.files_under(out)), fresh)
        self.assertEqual(run('--update', a)[0], 2)


class Explanations(Tree):
    def test_each_rule_is_explained(self):
        paths = [self.put(os.path.join('bad', name), data) for name, data, _ in DAMAGED]
        good = self.copy('materials_folded_wrappers.orvmat', 'good.orvmat')
        code, out, _ = run('-q', '--explain', good, *paths)
        self.assertEqual(code, 3)  # a missing file and a FIFO among them
        lines = out.decode('utf-8').splitlines()
        self.assertEqual(lines[0], good + ': document, 3 materials, 4108 bytes')
        self.assertEqual(len(lines), 1 + len(DAMAGED))
        for path, line, (_, _, expected) in zip(paths, lines[1:], DAMAGED):
            self.assertEqual(line, path + ': ' + expected)

    def test_explanations_of_a_walk_come_in_its_order(self):
        for name, data, _ in DAMAGED[:6]:
            self.put(os.path.join('bad', name), data)
        one = run('-q', '-j', '1', '--explain', self.path('bad'))[1]
        two = run('-q', '-j', '2', '--explain', self.path('bad'))[1]
        self.assertEqual(one, two)
        self.assertEqual(len(one.splitlines()), 6)


class Report(Tree):
    def test_one_json_object_per_file(self):
        good = self.copy('render_settings.orvopt', 'in/good.orvopt')
        text = self.copy('text_export.orvmat', 'in/text.orvmat')
        version = self.put('in/version.orvmat', DAMAGED[2][1])
        report = self.path('report.jsonl')
        code, _, _ = run('-q', '-j', '2', '--report', report, '-o', self.path('out'),
                         self.path('in'), self.path('in/missing.lumat'))
        self.assertEqual(code, 3)
        with open(report) as f:
            rows = [json.loads(line) for line in f]
        self.assertEqual([r['path'] for r in rows],
                         [good, text, version, self.path('in/missing.lumat')])
        for r in rows:
            self.assertEqual(sorted(r), ['characters', 'kind', 'milliseconds', 'path', 'reason',
                                         'status'])
            self.assertGreaterEqual(r['milliseconds'], 0)
        self.assertEqual([(r['kind'], r['status']) for r in rows],
                         [('options', 'document'), ('materials', 'text'), ('materials', 'text'),
                          ('materials', 'unreadable')])
        self.assertIsNone(rows[0]['reason'])
        self.assertTrue(rows[2]['reason'].startswith('record version not read at byte 28'))
        self.assertEqual(rows[3]['reason'], 'can\'t be opened: No such file or directory')
        for r, name in zip(rows[:2], ('good.orvopt.xml', 'text.orvmat.xml')):
            written = self.read(self.path('out', name)).decode('utf-8')
            self.assertEqual(r['characters'], len(written))
        self.assertEqual(rows[2]['characters'], 0)


class ExitStatus(Tree):
    """Each outcome has its own status: 0 documents, 1 text, 2 usage, 3 a
    file that can't be read or an output that can't be written."""

    def run_to(self, stdout, *args):
        with open(stdout, 'wb') as out:
            p = subprocess.run([ORVXML] + list(args), stdout=out, stderr=subprocess.PIPE)
        return p.returncode, p.stderr.decode('utf-8')

    def summary(self, err):
        """The summary line without its time."""
        line = [l for l in err.splitlines() if ' converted, ' in l][-1]
        return line[:line.rindex(' (')]

    def test_each_outcome(self):
        good = self.copy('materials_old_records_v2.orvmat', 'in/good.orvmat')
        self.assertEqual(run('-o', self.path('out'), good)[0], 0)
        self.copy('text_export.orvmat', 'in/sub/text.orvmat')
        code, _, err = run('-o', self.path('out'), self.path('in'))
        self.assertEqual((code, self.summary(err)),
                         (1, 'orvxml: 1 converted, 1 fell back to text, 0 unreadable'))
        self.assertEqual(run('-o', self.path('out'), '--bogus', good)[0], 2)
        fifo = self.put('pipe.orvmat', 'fifo')
        for unreadable in (self.path('missing.orvmat'), fifo):
            code, _, err = run('-o', self.path('out'), self.path('in'), unreadable)
            self.assertEqual((code, self.summary(err)),
                             (3, 'orvxml: 1 converted, 1 fell back to text, 1 unreadable'), unreadable)
            self.assertEqual(run(unreadable)[0], 3)
            self.assertEqual(run('--explain', unreadable)[0], 3)

    def test_standard_output_that_cant_be_written(self):
        good = self.copy('materials_all_layers.orvmat', 'good.orvmat')
        code, err = self.run_to('/dev/full', good)
        self.assertEqual(code, 3)
        self.assertIn('orvxml: can\'t write standard output: No space left on device\n', err)
        self.assertEqual(self.summary(err),
                         'orvxml: 0 converted, 0 fell back to text, 0 unreadable, 1 not written')
        code, err = self.run_to('/dev/full', '-q', '--explain', good)
        self.assertEqual((code, err), (3, 'orvxml: can\'t write standard output: No space left on device\n'))
        # A line too long for the stream's buffer fails before the end of the run.
        many = [self.copy('materials_all_layers.orvmat', 'in/%s.orvmat' % ('x' * 200 + str(i)))
                for i in range(40)]
        code, err = self.run_to('/dev/full', '-q', '--explain', *many)
        self.assertEqual(code, 3)
        self.assertIn('orvxml: can\'t write standard output: No space left on device\n', err)

    def test_an_output_folder_or_report_that_cant_be_made(self):
        good = self.copy('materials_old_records_v2.orvmat', 'good.orvmat')
        blocker = self.put('file', b'a file where a folder would go')
        for out, why in ((blocker, 'File exists'), (os.path.join(blocker, 'out'), 'Not a directory')):
            code, out_text, err = run('-o', out, good)
            self.assertEqual((code, out_text), (3, b''))
            self.assertEqual(err, 'orvxml: can\'t create the folder %s: %s\n' % (out, why))
        report = os.path.join(blocker, 'report.jsonl')
        code, _, err = run('--report', report, '-o', self.path('out'), good)
        self.assertEqual(code, 3)
        self.assertEqual(err, 'orvxml: can\'t write the report %s: Not a directory\n' % report)
        self.assertFalse(os.path.exists(self.path('out', 'good.orvmat.xml')))

    def test_outputs_that_cant_be_written_are_counted_apart(self):
        self.copy('materials_old_records_v2.orvmat', 'in/a.orvmat')
        self.copy('render_settings.orvopt', 'in/sub/b.orvopt')
        self.copy('text_export.orvmat', 'in/c.orvmat')
        # Running as root ignores permissions: a file where a folder must go,
        # and a folder where a file must go, can't be written over all the same.
        self.put('out/sub', b'not a folder')
        os.makedirs(self.path('out', 'c.orvmat.xml'))
        for jobs in ('1', '2'):
            report = self.path('report%s.jsonl' % jobs)
            code, _, err = run('-j', jobs, '--report', report, '-o', self.path('out'), self.path('in'))
            self.assertEqual(code, 3, err)
            self.assertIn('orvxml: can\'t write %s: Not a directory\n'
                          % self.path('out', 'sub', 'b.orvopt.xml'), err)
            self.assertIn('orvxml: can\'t write %s: Is a directory\n'
                          % self.path('out', 'c.orvmat.xml'), err)
            self.assertEqual(self.summary(err),
                             'orvxml: 1 converted, 0 fell back to text, 0 unreadable, 2 not written')
            with open(report) as f:
                rows = [json.loads(line) for line in f]
            reasons = [r['reason'] for r in rows]
            self.assertIsNone(reasons[0])
            self.assertTrue(reasons[1].endswith('; not written: %s: Is a directory'
                                                % self.path('out', 'c.orvmat.xml')), reasons)
            self.assertEqual(reasons[2],
                             'not written: %s: Not a directory' % self.path('out', 'sub', 'b.orvopt.xml'))
        self.assertEqual(self.files_under(self.path('out')), ['a.orvmat.xml', 'sub'])


    def test_unreadable_inputs_get_no_output(self):
        self.copy('materials_old_records_v2.orvmat', 'in/good.orvmat')
        self.put('in/pipe.orvmat', 'fifo')
        os.symlink(self.path('nowhere.orvmat'), self.path('in', 'dangling.lumat'))
        for jobs in ('1', '2'):
            out = self.path('out' + jobs)
            code, _, err = run('-j', jobs, '-o', out, self.path('in'), self.path('missing.orvopt'))
            self.assertEqual(code, 3, err)
            self.assertEqual(self.summary(err), 'orvxml: 1 converted, 0 fell back to text, 3 unreadable')
            self.assertEqual(self.files_under(out), ['good.orvmat.xml'])
        # A FIFO named on its own: the output folder is made and stays empty.
        code, _, _ = run('-o', self.path('out3'), self.path('in', 'pipe.orvmat'))
        self.assertEqual((code, os.listdir(self.path('out3'))), (3, []))


    def test_fallbacks_can_be_skipped(self):
        good = self.copy('materials_old_records_v2.orvmat', 'in/good.orvmat')
        text = self.copy('text_export.orvmat', 'in/sub/text.orvmat')
        for jobs in ('1', '2'):
            out, report = self.path('out' + jobs), self.path('report%s.jsonl' % jobs)
            code, explain, err = run('-j', jobs, '--fallbacks', 'skip', '--explain', '--report', report,
                                     '-o', out, self.path('in'))
            self.assertEqual(code, 1, err)
            self.assertEqual(self.files_under(out), ['good.orvmat.xml'])
            self.assertFalse(os.path.exists(os.path.join(out, 'sub')))  # no empty folder either
            self.assertEqual(self.summary(err), 'orvxml: 1 converted, 1 fell back to text, 0 unreadable')
            lines = explain.decode('utf-8').splitlines()
            self.assertEqual(len(lines), 2, lines)
            self.assertTrue(lines[0].startswith(good + ': document, '), lines)
            self.assertTrue(lines[1].startswith(text + ': text: '), lines)
            with open(report) as f:
                rows = [json.loads(line) for line in f]
            self.assertEqual([(r['status'], r['characters'] > 0) for r in rows],
                             [('document', True), ('text', True)])
        code, _, _ = run('--fallbacks=write', '-o', self.path('out'), self.path('in'))
        self.assertEqual(code, 1)
        self.assertEqual(self.files_under(self.path('out')), ['good.orvmat.xml', 'sub/text.orvmat.xml'])
        for bad in (['--fallbacks', 'maybe', good], ['--fallbacks'], ['--fallbacks=', good]):
            code, _, err = run(*bad)
            self.assertEqual(code, 2, bad)
            self.assertIn('Try \'orvxml --help\'', err)


class FullDisk(Tree):
    """The first output that finds no space stops the run; what is written
    is whole and no part file stays."""
    COPIES = 60

    def setUp(self):
        Tree.setUp(self)
        self.disk = tempfile.mkdtemp(prefix='orvxml-full-')
        self.addCleanup(os.rmdir, self.disk)
        mounted = subprocess.run(['mount', '-t', 'tmpfs', '-o', 'size=64k', 'tmpfs', self.disk],
                                 stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL)
        if mounted.returncode != 0:
            self.skipTest('a small tmpfs can\'t be mounted here')
        self.addCleanup(subprocess.run, ['umount', self.disk], check=True)

    def test_the_run_stops_at_the_first_full_write(self):
        source = self.copy('materials_all_layers.orvmat', 'in/000.orvmat')
        for i in range(1, self.COPIES):
            shutil.copyfile(source, self.path('in', '%03d.orvmat' % i))
        expected = run(source)[1]  # each output takes a page at least: 60 don't fit in 64 KiB
        for jobs in (1, 2):
            out = os.path.join(self.disk, 'out%d' % jobs)
            code, _, err = run('-j', str(jobs), '-o', out, self.path('in'))
            self.assertEqual(code, 3, err)
            lines = err.splitlines()
            self.assertRegex(lines[-1], r'^orvxml: stopped: no space for the outputs '
                             r'\(No space left on device\), \d+ of %d files not converted$' % self.COPIES)
            left = int(lines[-1].split()[-6])
            failed = [l for l in lines if l.startswith('orvxml: can\'t write ')]
            self.assertTrue(failed and all(l.endswith(': No space left on device') for l in failed), err)
            # Only the files under way when the disk filled were tried.
            self.assertLessEqual(len(failed), jobs)
            written = os.listdir(out)
            self.assertEqual(len(written) + len(failed) + left, self.COPIES, err)
            self.assertGreater(left, 0)
            for name in written:
                self.assertTrue(name.endswith('.orvmat.xml'), name)
                self.assertEqual(self.read(os.path.join(out, name)), expected, name)
            shutil.rmtree(out)


class Interrupts(Tree):
    """An interrupted run stops between files: every output is whole, no part
    file is left, and the status says which signal stopped it."""
    COPIES = LONG_TREE

    def interrupt(self, sig, jobs, whole_group):
        source = self.copy('materials_all_layers.orvmat', 'in/0000.orvmat')
        for i in range(1, self.COPIES):
            shutil.copyfile(source, self.path('in', '%04d.orvmat' % i))
        out, report = self.path('out'), self.path('report.jsonl')
        p = subprocess.Popen([ORVXML, '-j', str(jobs), '--report', report, '-o', out,
                              self.path('in')], stdout=subprocess.PIPE, stderr=subprocess.PIPE,
                             start_new_session=True)
        # The signal comes once the first file is written, long before the last.
        deadline = time.time() + 30
        while not (os.path.isdir(out) and os.listdir(out)) and time.time() < deadline:
            time.sleep(0.002)
        if whole_group:  # as a terminal's Ctrl-C reaches every process of the job
            os.killpg(p.pid, sig)
        else:
            p.send_signal(sig)
        _, err = p.communicate(timeout=60)
        self.assertEqual(p.returncode, 128 + sig, err)
        last = err.decode('utf-8').splitlines()[-1]
        self.assertRegex(last, r'^orvxml: interrupted, \d+ of %d files not converted$' % self.COPIES)
        missing = int(last.split()[2])
        self.assertGreater(missing, 0)
        written = os.listdir(out)
        self.assertEqual(len(written), self.COPIES - missing)
        self.assertEqual([n for n in written if not n.endswith('.orvmat.xml')], [])
        expected = run(source)[1]
        for name in written:
            self.assertEqual(self.read(os.path.join(out, name)), expected, name)
        with open(report) as f:
            rows = [json.loads(line) for line in f]  # every line whole
        self.assertEqual(sorted(os.path.basename(r['path']) + '.xml' for r in rows), sorted(written))
        # A run killed outright leaves part files: the next run removes ours
        # and no one else's.
        left = os.path.join(out, '0000.orvmat.xml.part4242')
        self.put(left, b'<orvmat>')
        self.put(os.path.join(out, 'notes.part12'), b'kept')
        code, _, err = run('--update', '-o', out, self.path('in'))
        self.assertEqual(code, 0, err)
        self.assertIn('orvxml: %d converted, 0 fell back to text, 0 unreadable, %d up to date ('
                      % (missing, len(written)), err)
        self.assertFalse(os.path.exists(left))
        self.assertEqual(self.read(os.path.join(out, 'notes.part12')), b'kept')
        for name in os.listdir(out):
            if name != 'notes.part12':
                self.assertEqual(self.read(os.path.join(out, name)), expected, name)
        self.assertEqual(len(os.listdir(out)), self.COPIES + 1)
        code, _, err = run('--update', '-o', out, self.path('in'))
        self.assertIn('orvxml: 0 converted, 0 fell back to text, 0 unreadable, %d up to date ('
                      % self.COPIES, err)

    def test_ctrl_c_reaches_every_process(self):
        self.interrupt(signal.SIGINT, 2, True)

    def test_sigterm_to_the_parent_is_passed_to_the_workers(self):
        self.interrupt(signal.SIGTERM, 2, False)

    def test_sighup_without_workers(self):
        self.interrupt(signal.SIGHUP, 1, False)


if __name__ == '__main__':
    unittest.main()
