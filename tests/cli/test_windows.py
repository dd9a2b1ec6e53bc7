# -*- coding: utf-8 -*-
"""orvxml.exe under Wine against the Linux command: the same files, the same
--explain lines, the same report, byte for byte, with and without workers;
then what only Windows has: names outside the ANSI code page, devices, paths
beyond 260 characters, files held open by another process, Ctrl-C, a worker
that dies.

Standard library only. ORVXML_LINUX and ORVXML_WINDOWS name the two
commands, ORVXML_SAMPLES the Linux sample writer, ORVXML_SOURCE_DIR the tree;
WINEPREFIX defaults to build-windows/wineprefix. Wine gets a UTF-8 locale
(C.UTF-8), so that names outside ASCII reach the program as they are. A
missing command or Wine is a failure, not a skipped test.
"""
import json
import os
import re
import shutil
import signal
import subprocess
import tempfile
import time
import unittest

SOURCE_DIR = os.path.abspath(os.environ.get('ORVXML_SOURCE_DIR', '.'))
LINUX = os.path.abspath(os.environ.get('ORVXML_LINUX', os.path.join(SOURCE_DIR, 'build/orvxml')))
WINDOWS = os.path.abspath(os.environ.get('ORVXML_WINDOWS',
                                         os.path.join(SOURCE_DIR, 'build-windows/orvxml.exe')))
SAMPLES = os.path.abspath(os.environ.get('ORVXML_SAMPLES',
                                         os.path.join(SOURCE_DIR, 'build/orvxml-samples')))
EXAMPLES = os.path.join(SOURCE_DIR, 'examples')

WINE_ENV = dict(os.environ, WINEDEBUG='-all', LC_ALL='C.UTF-8')
WINE_ENV.setdefault('WINEPREFIX', os.path.join(os.path.dirname(WINDOWS), 'wineprefix'))

# A name of Greek and CJK letters: no ANSI code page has both.
FOREIGN = u'\u03a9\u03bc\u03ad\u03b3\u03b1'
FOREIGN_FILE = u'\u6750\u6599_\u03a9.orvopt'


KEEPER = None


def setUpModule():
    global KEEPER
    for path in (LINUX, WINDOWS, SAMPLES):
        if not os.path.isfile(path):
            raise AssertionError('%s is missing: build it first' % path)
    if not shutil.which('wine'):
        raise AssertionError('wine is not installed')
    # The first start may make the prefix and say so on standard error.
    subprocess.run(['wine', WINDOWS, '--version'], env=WINE_ENV, stdout=subprocess.DEVNULL,
                   stderr=subprocess.DEVNULL, timeout=300, check=True)
    # Wine's server lives on while a Windows process of the prefix does. One
    # that a run started would hold that run's output pipes open until it
    # ends, seconds later: a cmd waiting on its input keeps one server,
    # started without those pipes, for the whole module.
    KEEPER = subprocess.Popen(['wine', 'cmd'], env=WINE_ENV, stdin=subprocess.PIPE,
                              stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL)


def tearDownModule():
    if KEEPER:
        KEEPER.stdin.close()
        KEEPER.wait(timeout=60)


def run(command, args, cwd):
    program = ['wine', WINDOWS] if command == 'windows' else [LINUX]
    p = subprocess.run(program + list(args), cwd=cwd, env=WINE_ENV, stdout=subprocess.PIPE,
                       stderr=subprocess.PIPE, timeout=300)
    return p.returncode, p.stdout, p.stderr.decode('utf-8')


def read(path):
    with open(path, 'rb') as f:
        return f.read()


def write(path, data):
    os.makedirs(os.path.dirname(path), exist_ok=True)
    with open(path, 'wb') as f:
        f.write(data)


def files_under(root):
    """Every file under `root`, by its path relative to it, with its bytes."""
    found = {}
    for folder, _, names in os.walk(root):
        for name in names:
            path = os.path.join(folder, name)
            found[os.path.relpath(path, root)] = read(path)
    return found


def masked_report(path):
    with open(path, encoding='utf-8') as f:
        rows = [json.loads(line) for line in f]
    for row in rows:
        row['milliseconds'] = None
    return rows


def masked_errors(text):
    return re.sub(r'\(\d+\.\d\d s\)', '(s)', text)


def flip(data, at):
    if at >= len(data):
        return data + b'\x5a'
    return data[:at] + bytes([data[at] ^ 0x5A]) + data[at + 1:]


def long_folder(root):
    return os.path.join(root, 'deep', *['folder_of_a_rather_long_name_%02d' % i for i in range(9)])


def build_tree(root, corpus):
    """A few hundred files in nested folders: each example and sample as it
    is, cut short, with a byte changed in its body or its header, and with
    bytes after it; some extensions in capitals. Around them: files a walk
    skips, a folder named like a library, names outside any ANSI code page,
    a path beyond 260 characters."""
    sources = sorted(os.path.join(EXAMPLES, n) for n in os.listdir(EXAMPLES)
                     if not n.endswith('.py'))
    for folder in ('orvmat', 'orvopt'):
        sources += sorted(os.path.join(corpus, folder, n)
                          for n in os.listdir(os.path.join(corpus, folder)))
    for k, source in enumerate(sources):
        data = read(source)
        stem, ext = os.path.splitext(os.path.basename(source))
        folder = os.path.join(root, 'set%d' % (k % 5))
        if k % 2:
            folder = os.path.join(folder, 'sub%d' % (k % 3))
        variants = [data, data[:len(data) * 2 // 3], flip(data, len(data) // 3), flip(data, 8),
                    data + b'\0tail']
        for v, variant in enumerate(variants):
            write(os.path.join(folder, '%02d_%d_%s%s' % (k, v, stem, ext.upper() if v == 3 else ext)),
                  variant)
    write(os.path.join(root, 'skip', 'readme.txt'), b'not a library\n')
    write(os.path.join(root, 'skip', 'no_extension'), read(sources[0]))
    write(os.path.join(root, 'x.orvmat', 'inner.orvmat'),
          read(os.path.join(EXAMPLES, 'materials_all_layers.orvmat')))
    write(os.path.join(root, 'x.orvmat', 'inner.luopt'), read(os.path.join(EXAMPLES, 'notes.luopt')))
    write(os.path.join(root, FOREIGN, FOREIGN_FILE),
          read(os.path.join(EXAMPLES, 'render_settings.orvopt')))
    write(os.path.join(long_folder(root), 'deep.orvmat'),
          read(os.path.join(EXAMPLES, 'textures_procedural.orvmat')))
    os.makedirs(os.path.join(root, 'empty'))
    return len(sources) * len(variants) + 4


class Scratch(unittest.TestCase):
    def setUp(self):
        self.tmp = tempfile.mkdtemp(prefix='orvxml-windows-')
        self.addCleanup(shutil.rmtree, self.tmp)

    def path(self, *parts):
        return os.path.join(self.tmp, *parts)

    def convert(self, command, jobs, source, name, options=()):
        """Converts `source` into a folder of its own with every output on;
        returns the status and all that the run gave."""
        out, report = self.path(name), self.path(name + '.jsonl')
        code, stdout, stderr = run(command, list(options) + ['-j', str(jobs), '--explain', '--report',
                                                             report, '-o', out, source], self.tmp)
        return {'status': code, 'explain': stdout, 'errors': masked_errors(stderr),
                'report': masked_report(report), 'files': files_under(out)}

    def assertSameRuns(self, linux, windows, what):
        for key in ('status', 'explain', 'errors', 'report'):
            self.assertEqual(windows[key], linux[key], '%s: %s' % (what, key))
        self.assertEqual(sorted(windows['files']), sorted(linux['files']), what)
        for name, data in linux['files'].items():
            self.assertEqual(windows['files'][name], data, '%s: %s' % (what, name))


class SameAsLinux(Scratch):
    def test_a_generated_tree(self):
        corpus = self.path('corpus')
        subprocess.run([SAMPLES, '--corpus', corpus], stdout=subprocess.DEVNULL, check=True)
        tree = self.path('tree')
        inputs = build_tree(tree, corpus)
        linux = self.convert('linux', 2, tree, 'linux')
        self.assertEqual(linux['status'], 1)  # damaged files fall back to text
        self.assertEqual(len(linux['report']), inputs)
        self.assertGreater(len(linux['files']), 300)
        for name in ('x.orvmat/inner.orvmat.xml', FOREIGN + '/' + FOREIGN_FILE + '.xml',
                     os.path.relpath(long_folder(tree), tree) + '/deep.orvmat.xml'):
            self.assertIn(name, linux['files'])
        self.assertGreater(len(os.path.join(long_folder(self.path('linux')), 'deep.orvmat.xml')), 260)
        for jobs in (1, 3):
            windows = self.convert('windows', jobs, tree, 'windows%d' % jobs)
            self.assertSameRuns(linux, windows, 'tree, --jobs %d' % jobs)

    def test_the_examples(self):
        linux = self.convert('linux', 1, EXAMPLES, 'linux')
        self.assertEqual(len(linux['files']), len(linux['report']))
        for jobs in (1, 3):
            self.assertSameRuns(linux, self.convert('windows', jobs, EXAMPLES, 'windows%d' % jobs),
                                'examples, --jobs %d' % jobs)

    def test_well_formed_remapped_and_listed(self):
        # The run's XML options reach the workers, which are programs of their own here.
        options = ['--well-formed', '--remap', 'c:/RENDERS=D:\\r', '--remap', 'textures=maps']
        linux = self.convert('linux', 1, EXAMPLES, 'linux', options)
        self.assertIn([{'from': 'textures/wood.png', 'to': 'maps/wood.png'}],
                      [row.get('remapped') for row in linux['report']])
        self.assertSameRuns(linux, self.convert('windows', 3, EXAMPLES, 'windows', options), 'options')
        os.makedirs(self.path('search', 'textures'))
        write(self.path('search', 'textures', 'stone.png'), b'png')
        for args in (['--list', EXAMPLES],
                     ['--files', '--search', self.path('search'),
                      os.path.join(EXAMPLES, 'materials_old_records_v1.lumat')]):
            linux, windows = run('linux', args, self.tmp), run('windows', args, self.tmp)
            self.assertEqual(windows[:2], linux[:2], args)
            self.assertEqual(windows[2], linux[2], args)

    def test_standard_output_is_the_same_bytes(self):
        # Documents of both kinds, and texts whose line ends must pass as they are.
        crlf = self.path('crlf.luopt')
        write(crlf, b'line one\r\nline two\nline three\r\0rest')
        paths = [os.path.join(EXAMPLES, n) for n in ('materials_all_layers.orvmat',
                                                     'render_settings.orvopt', 'text_export.orvmat')]
        for path in paths + [crlf]:
            linux, windows = run('linux', [path], self.tmp), run('windows', [path], self.tmp)
            self.assertEqual(windows[:2], linux[:2], path)
            self.assertEqual(masked_errors(windows[2]), masked_errors(linux[2]), path)
        self.assertEqual(windows[1], b'line one\r\nline two\nline three\r')

    def test_usage_errors_help_and_version(self):
        os.mkdir(self.path('folder'))
        for args in ([], ['--jobs', '0'], ['--bogus', 'a.orvmat'], ['-o'], [self.path('folder')],
                     ['--help'], ['--version']):
            self.assertEqual(run('windows', args, self.tmp), run('linux', args, self.tmp), args)


    def test_what_cant_be_read_or_written(self):
        # The status and the lines of each, but for the system's words for why.
        good = os.path.join(EXAMPLES, 'materials_old_records_v2.orvmat')
        write(self.path('in', 'a.orvmat'), read(good))
        write(self.path('in', 'sub', 'b.orvmat'), read(good))
        write(self.path('in', 'c.orvmat'), read(os.path.join(EXAMPLES, 'text_export.orvmat')))
        write(self.path('blocker'), b'a file where a folder would go')
        for args in (['-o', 'blocker', good], ['-o', os.path.join('blocker', 'out'), good],
                     ['--report', os.path.join('blocker', 'r.jsonl'), good],
                     ['missing.orvmat'], ['--explain', 'in', 'missing.lumat']):
            linux, windows = run('linux', args, self.tmp), run('windows', args, self.tmp)
            self.assertEqual(linux[0], 3, args)
            self.assertEqual(windows[0], 3, args)
            self.assertEqual(windows[1], linux[1], args)
            why = r': [A-Z][a-z ]+$'
            self.assertEqual([re.sub(why, '', l) for l in masked_errors(windows[2]).splitlines()],
                             [re.sub(why, '', l) for l in masked_errors(linux[2]).splitlines()], args)
        # Outputs in the way: a file where a folder goes, and a folder where a file goes.
        for command in ('linux', 'windows'):
            write(self.path(command, 'sub'), b'not a folder')
            os.makedirs(self.path(command, 'c.orvmat.xml'))
            code, _, err = run(command, ['-o', command, 'in'], self.tmp)
            self.assertEqual(code, 3, command)
            self.assertIn('1 converted, 0 fell back to text, 0 unreadable, 2 not written', err)
            self.assertEqual(sorted(files_under(self.path(command))), ['a.orvmat.xml', 'sub'])


    def test_fallbacks_skipped(self):
        for command in ('linux', 'windows'):
            code, _, err = run(command, ['-q', '-j', '2', '--fallbacks', 'skip', '-o', command, EXAMPLES],
                               self.tmp)
            self.assertEqual((code, err), (1, ''), command)
        self.assertEqual(files_under(self.path('windows')), files_under(self.path('linux')))
        self.assertIn('render_settings.orvopt.xml', os.listdir(self.path('linux')))
        self.assertNotIn('text_export.orvmat.xml', os.listdir(self.path('linux')))


class WindowsCases(Scratch):
    def copy(self, example, *parts):
        path = self.path(*parts)
        write(path, read(os.path.join(EXAMPLES, example)))
        return path

    def test_name_outside_the_ansi_code_page(self):
        path = self.copy('render_settings.orvopt', FOREIGN, FOREIGN_FILE)
        expected = run('linux', [path], self.tmp)
        self.assertEqual(expected[0], 0)
        self.assertEqual(run('windows', [path], self.tmp)[:2], expected[:2])
        # Relative, with Windows' separator.
        relative = FOREIGN + '\\' + FOREIGN_FILE
        code, out, _ = run('windows', ['--explain', relative], self.tmp)
        self.assertEqual((code, out.decode('utf-8')),
                         (0, relative + ': document, 22 blocks, 4096 bytes\n'))
        code, _, err = run('windows', ['-o', self.path('out'), path], self.tmp)
        self.assertEqual(code, 0, err)
        self.assertEqual(read(self.path('out', FOREIGN_FILE + '.xml')), expected[1])

    def test_folder_named_like_a_library(self):
        folder = self.path('lib', 'x.orvmat')
        self.copy('materials_all_layers.orvmat', 'lib', 'x.orvmat', 'inner.orvmat')
        code, out, err = run('windows', [folder], self.tmp)
        self.assertEqual((code, out), (2, b''))
        self.assertTrue(err.startswith('orvxml: %s is a folder: give -o DIR' % folder), err)
        for tree in (folder, self.path('lib')):
            self.assertEqual(run('windows', ['-q', '-o', self.path('w'), tree], self.tmp)[0], 0)
            self.assertEqual(run('linux', ['-q', '-o', self.path('l'), tree], self.tmp)[0], 0)
            self.assertEqual(files_under(self.path('w')), files_under(self.path('l')))
        self.assertEqual(sorted(files_under(self.path('w'))),
                         ['inner.orvmat.xml', 'x.orvmat/inner.orvmat.xml'])

    def test_outputs_whose_names_differ_only_in_case(self):
        first = self.copy('render_settings.orvopt', 'x', 'a.orvopt')
        second = self.copy('old_settings_v4.luopt', 'y', 'A.ORVOPT')
        code, out, _ = run('linux', ['-q', '-o', self.path('linux'), first, second], self.tmp)
        self.assertEqual(sorted(os.listdir(self.path('linux'))), ['A.ORVOPT.xml', 'a.orvopt.xml'])
        # One file on Windows: a usage error that names both, before anything is written.
        code, out, err = run('windows', ['-q', '--explain', '-o', self.path('out'), first, second],
                             self.tmp)
        self.assertEqual((code, out), (2, b''))
        self.assertTrue(err.startswith('orvxml: %s and %s would both be written to %s\n'
                                       % (first, second, self.path('out', 'A.ORVOPT.xml'))), err)
        self.assertFalse(os.path.exists(self.path('out')))

    def test_the_nul_device(self):
        code, out, _ = run('windows', ['--explain', 'NUL'], self.tmp)
        self.assertEqual((code, out), (3, b'NUL: unreadable: not a .orvmat, .lumat, .orvopt or .luopt file\n'))
        code, out, _ = run('windows', ['--explain', 'NUL.orvmat'], self.tmp)
        self.assertEqual((code, out), (3, b'NUL.orvmat: unreadable: not a regular file\n'))
        code, out, err = run('windows', ['NUL.orvmat'], self.tmp)
        self.assertEqual((code, out), (3, b''))
        self.assertIn('orvxml: NUL.orvmat: not a regular file', err)
        # A device is never read, and gets no output: nothing is left behind.
        code, _, err = run('windows', ['-o', self.path('out'), 'nul.luopt'], self.tmp)
        self.assertEqual(code, 3)
        self.assertIn('orvxml: nul.luopt: not a regular file', err)
        self.assertEqual(os.listdir(self.path('out')), [])

    def test_paths_beyond_260_characters(self):
        source = self.copy('textures_procedural.orvmat', long_folder('in'), 'deep.orvmat')
        self.assertGreater(len(source), 260)
        expected = run('linux', [source], self.tmp)
        self.assertEqual(run('windows', [source], self.tmp)[:2], expected[:2])
        out = long_folder(self.path('out'))
        code, _, err = run('windows', ['-o', out, source], self.tmp)
        self.assertEqual(code, 0, err)
        self.assertEqual(read(os.path.join(out, 'deep.orvmat.xml')), expected[1])
        report = os.path.join(out, 'report.jsonl')
        code, explain, _ = run('windows', ['--explain', '--report', report, self.path('in')], self.tmp)
        self.assertEqual((code, explain), run('linux', ['--explain', source], self.tmp)[:2])
        self.assertEqual([r['path'] for r in masked_report(report)], [source])

    def test_files_held_open_by_another_process(self):
        # cmd holds the file open for writing, as its standard error, while
        # orvxml reads it; -q leaves nothing to write there.
        held = self.copy('materials_all_layers.orvmat', 'held.orvmat')
        code, _, err = run('windows', ['-q', '-o', self.path('expected'), held], self.tmp)
        self.assertEqual(code, 0, err)
        line = '%s -q -o out held.orvmat 2>>held.orvmat' % windows_path(WINDOWS)
        p = subprocess.run(['wine', 'cmd', '/c', line], cwd=self.tmp, env=WINE_ENV,
                           stdout=subprocess.PIPE, stderr=subprocess.PIPE, timeout=120)
        self.assertEqual(p.returncode, 0, p.stderr)
        self.assertEqual(read(self.path('out', 'held.orvmat.xml')),
                         read(self.path('expected', 'held.orvmat.xml')))
        # An output that another process holds open isn't replaced, and no
        # part file stays beside it.
        target = self.path('out', 'held.orvmat.xml')
        write(target, b'old\n')
        line = '%s -o out held.orvmat 2>>out\\held.orvmat.xml' % windows_path(WINDOWS)
        p = subprocess.run(['wine', 'cmd', '/c', line], cwd=self.tmp, env=WINE_ENV,
                           stdout=subprocess.PIPE, stderr=subprocess.PIPE, timeout=120)
        self.assertEqual(p.returncode, 3)
        self.assertEqual(os.listdir(self.path('out')), ['held.orvmat.xml'])
        lines = read(target).decode('utf-8').splitlines()
        self.assertEqual(lines[:2], ['old', 'orvxml: can\'t write out/held.orvmat.xml: Permission denied'])


def windows_path(path):
    return 'Z:' + path.replace('/', '\\')


class Processes(Scratch):
    """Ctrl-C and workers that die: whole outputs only, never a part file."""
    COPIES = 400

    def start(self, jobs):
        source = os.path.join(EXAMPLES, 'materials_all_layers.orvmat')
        os.mkdir(self.path('in'))
        for i in range(self.COPIES):
            shutil.copyfile(source, self.path('in', '%04d.orvmat' % i))
        self.out = self.path('out')
        # The workers inherit the environment: the marker tells them.
        env = dict(WINE_ENV, ORVXML_TEST_RUN=self.tmp)
        p = subprocess.Popen(['wine', WINDOWS, '-q', '-j', str(jobs), '--report', self.path('r.jsonl'),
                              '-o', self.out, self.path('in')], cwd=self.tmp, env=env,
                             stdout=subprocess.PIPE, stderr=subprocess.PIPE)
        self.addCleanup(self.stop, p)
        # Each of the first jobs went to a worker of its own: once all are
        # written, every worker runs and has its handlers in place.
        first = [os.path.join(self.out, '%04d.orvmat.xml' % i) for i in range(jobs)]
        deadline = time.time() + 60
        while not all(map(os.path.exists, first)) and time.time() < deadline:
            time.sleep(0.005)
        self.expected = run('linux', [source], self.tmp)[1]
        return p

    def workers(self):
        """The worker processes of this test's run: those whose command line
        holds the hidden worker argument and whose environment the marker."""
        marker = ('ORVXML_TEST_RUN=%s' % self.tmp).encode()
        found = []
        for pid in filter(str.isdigit, os.listdir('/proc')):
            try:
                if (b'--orvxml-worker' in read('/proc/%s/cmdline' % pid) and
                        marker in read('/proc/%s/environ' % pid).split(b'\0')):
                    found.append(int(pid))
            except OSError:
                pass
        return found

    def stop(self, p):
        """After a failure: nothing of the run goes on writing."""
        for pid in [p.pid] + self.workers():
            try:
                os.kill(pid, signal.SIGKILL)
            except OSError:
                pass
        p.communicate()

    def finish(self, p):
        _, err = p.communicate(timeout=120)
        written = os.listdir(self.out)
        self.assertEqual([n for n in written if not n.endswith('.orvmat.xml')], [])
        for name in written:
            self.assertEqual(read(os.path.join(self.out, name)), self.expected, name)
        return p.returncode, err.decode('utf-8'), written

    def interrupt(self, jobs, every_process):
        p = self.start(jobs)
        workers = self.workers()
        self.assertEqual(len(workers), jobs if jobs > 1 else 0)
        # Wine turns SIGINT into the console's Ctrl-C event; a console gives
        # it to every process attached to it.
        for pid in [p.pid] + (workers if every_process else []):
            os.kill(pid, signal.SIGINT)
        code, err, written = self.finish(p)
        self.assertEqual(code, 130, err)
        match = re.match(r'^orvxml: interrupted, (\d+) of %d files not converted$' % self.COPIES,
                         err.splitlines()[-1])
        self.assertTrue(match, err)
        self.assertGreater(int(match.group(1)), 0)
        self.assertEqual(len(written), self.COPIES - int(match.group(1)))
        self.assertEqual(len(masked_report(self.path('r.jsonl'))), len(written))

    def test_ctrl_c_without_workers(self):
        self.interrupt(1, False)

    def test_ctrl_c_to_every_process(self):
        self.interrupt(3, True)

    def test_ctrl_c_to_the_parent_alone(self):
        self.interrupt(3, False)

    def test_a_worker_that_dies_leaves_its_file_unreadable(self):
        p = self.start(2)
        os.kill(self.workers()[0], signal.SIGKILL)
        code, err, written = self.finish(p)
        self.assertEqual(code, 3, err)
        rows = masked_report(self.path('r.jsonl'))
        self.assertEqual(len(rows), self.COPIES)
        lost = [r for r in rows if r['status'] != 'document']
        self.assertEqual(len(lost), 1, lost)
        self.assertEqual(lost[0]['status'], 'unreadable')
        self.assertTrue(lost[0]['reason'].startswith('the conversion stopped with status '), lost)
        # The worker may die after its output was renamed into place but
        # before it said so: then that output is there, and whole.
        lost_output = os.path.basename(lost[0]['path']) + '.xml'
        self.assertEqual(sorted(set(written) | {lost_output}),
                         sorted('%04d.orvmat.xml' % i for i in range(self.COPIES)))
        self.assertIn('orvxml: %s: the conversion stopped with status ' % lost[0]['path'], err)


if __name__ == '__main__':
    unittest.main()
