# -*- coding: utf-8 -*-
"""Installing the module as a user would, offline, and converting the bundled
examples with what was installed; the text must be that of the build folder's
module. Run one case at a time (python install.py Install.test_...): each
builds the project once more."""
import base64
import hashlib
import os
import subprocess
import sys
import unittest
import zipfile

import sysconfig

from support import BUILD, SOURCE, ScratchTest, convert_elsewhere, convert_here, examples, read

WHEELS = '/usr/share/python-wheels'   # Debian's pip and setuptools, for --find-links
STUB = os.path.join(SOURCE, 'src', 'module', 'python', 'PyOrvXml.pyi')
# The module file and the wheel's tag for the interpreter that runs the tests:
# a manylinux tag for Python 3, from what the files need of the system.
if sys.version_info[0] < 3:
    MODULE, TAG = 'PyOrvXml.so', 'cp27-cp27mu-linux_x86_64'
else:
    MODULE = 'PyOrvXml' + sysconfig.get_config_var('EXT_SUFFIX')
    TAG = 'cp%d%d-cp%d%d-manylinux_2_34_x86_64' % (sys.version_info[:2] * 2)


def build_has_command():
    """Whether the project builds the command-line program for wheels."""
    with open(os.path.join(BUILD, 'wheel-contents.txt')) as f:
        return any(line.startswith('script ') for line in f)


class Install(ScratchTest):
    def setUp(self):
        ScratchTest.setUp(self)
        # pip keeps its cache and its messages to itself.
        self.env = dict(os.environ, PIP_CACHE_DIR=os.path.join(self.dir, 'cache'),
                        PIP_DISABLE_PIP_VERSION_CHECK='1')
        self.env.pop('PYTHONPATH', None)

    def run_quietly(self, command, cwd=None):
        proc = subprocess.Popen(command, cwd=cwd, env=self.env, stdout=subprocess.PIPE,
                                stderr=subprocess.STDOUT)
        out = proc.communicate()[0]
        self.assertEqual(proc.returncode, 0, out.decode('utf-8', 'replace'))
        return out.decode('utf-8', 'replace')

    def venv(self, python, name):
        self.run_quietly([python, '-m', 'venv', os.path.join(self.dir, name)])
        return os.path.join(self.dir, name, 'bin', 'python')

    def check_converts_like_the_build(self, python, env, module_name):
        paths = examples()
        results = convert_elsewhere(python, paths, env)
        for path, (xml, module) in zip(paths, results):
            self.assertEqual(os.path.basename(module), module_name)
            self.assertFalse(module.startswith(os.path.abspath(BUILD)), module)
            self.assertEqual(xml, convert_here(path), path)
        self.assertEqual(len(results), len(paths))

    def check_wheel(self, path, tag, module_name):
        """File name, tags, RECORD and contents of a wheel."""
        name = os.path.basename(path)
        self.assertTrue(name.startswith('pyorvxml-') and name.endswith('-%s.whl' % tag), name)
        version = name.split('-')[1]
        info = 'pyorvxml-%s.dist-info/' % version
        with zipfile.ZipFile(path) as wheel:
            names = set(wheel.namelist())
            expected = {module_name, 'PyOrvXml.pyi', info + 'METADATA', info + 'WHEEL',
                        info + 'RECORD'}
            if build_has_command():
                expected.add('pyorvxml-%s.data/scripts/orvxml' % version)
            self.assertEqual(names, expected)
            record = wheel.read(info + 'RECORD').decode('utf-8').splitlines()
            self.assertEqual(sorted(line.split(',')[0] for line in record), sorted(names))
            for line in record:
                file_name, digest, size = line.split(',')
                if file_name == info + 'RECORD':
                    self.assertEqual((digest, size), ('', ''))
                    continue
                data = wheel.read(file_name)
                want = base64.urlsafe_b64encode(hashlib.sha256(data).digest()).rstrip(b'=')
                self.assertEqual(digest, 'sha256=' + want.decode('ascii'), file_name)
                self.assertEqual(int(size), len(data))
            meta = wheel.read(info + 'WHEEL').decode('utf-8')
            self.assertIn('\nRoot-Is-Purelib: false\n', meta)
            self.assertIn('\nTag: %s\n' % tag, meta)
            meta = wheel.read(info + 'METADATA').decode('utf-8')
            self.assertIn('\nName: PyOrvXml\n', meta)
            self.assertIn('\nVersion: %s\n' % version, meta)
            self.assertEqual(wheel.getinfo(module_name).external_attr >> 16, 0o100755)
            self.assertEqual(wheel.read('PyOrvXml.pyi'), read(STUB))
            if 'manylinux' in tag:
                self.check_platform(wheel, tag.split('-')[2])

    def check_platform(self, wheel, platform):
        """The wheel's ELF files, as binutils read them, earn its platform tag."""
        from test3_manylinux import manylinux, readelf_needs
        needs = {}
        folder = os.path.join(self.dir, 'elf')
        os.mkdir(folder)
        for name in wheel.namelist():
            data = wheel.read(name)
            if data.startswith(b'\x7fELF'):
                path = os.path.join(folder, os.path.basename(name))
                with open(path, 'wb') as f:
                    f.write(data)
                needs[name] = readelf_needs(path)
                self.assertEqual(manylinux.read_needs(path), needs[name], name)
        self.assertEqual(len(needs), 2 if build_has_command() else 1)
        self.assertEqual(manylinux.platform_tag(needs) + '_x86_64', platform)

    def check_command(self, bin_dir):
        command = os.path.join(bin_dir, 'orvxml')
        if build_has_command():
            self.assertTrue(os.access(command, os.X_OK), command)
        else:
            self.assertFalse(os.path.exists(command))

    def test_pip_install_into_a_fresh_venv(self):
        python = self.venv(sys.executable, 'venv')
        self.run_quietly([python, '-m', 'pip', 'install', '--no-index', '--find-links', WHEELS,
                          '.'], cwd=SOURCE)
        self.check_converts_like_the_build(python, self.env, MODULE)
        site = subprocess.check_output(
            [python, '-c', 'import sysconfig; print(sysconfig.get_paths()["platlib"])'])
        self.assertEqual(read(os.path.join(site.decode().strip(), 'PyOrvXml.pyi')), read(STUB))
        self.check_command(os.path.dirname(python))

    def test_pip_wheel_installs_elsewhere(self):
        # Built in one venv, installed from the wheel file alone into another.
        python = self.venv(sys.executable, 'build-venv')
        out = os.path.join(self.dir, 'wheels')
        self.run_quietly([python, '-m', 'pip', 'wheel', '--no-index', '--find-links', WHEELS,
                          '-w', out, '.'], cwd=SOURCE)
        wheels = os.listdir(out)
        self.assertEqual(len(wheels), 1, wheels)
        wheel = os.path.join(out, wheels[0])
        self.check_wheel(wheel, TAG, MODULE)
        other = self.venv(sys.executable, 'other-venv')
        self.run_quietly([other, '-m', 'pip', 'install', '--no-index', wheel])
        self.check_converts_like_the_build(other, self.env, MODULE)
        self.check_command(os.path.dirname(other))

    def test_wheel_script_and_pip_target(self):
        out = os.path.join(self.dir, 'wheels')
        printed = self.run_quietly([os.path.join(SOURCE, 'tools', 'wheel.sh'), sys.executable,
                                    out])
        wheels = os.listdir(out)
        self.assertEqual(printed.strip(), os.path.join(out, wheels[0]))
        wheel = os.path.join(out, wheels[0])
        self.check_wheel(wheel, TAG, MODULE)
        target = os.path.join(self.dir, 'target')
        self.run_quietly([sys.executable, '-m', 'pip', 'install', '--no-index', '--target',
                          target, wheel])
        self.check_converts_like_the_build(sys.executable, dict(self.env, PYTHONPATH=target),
                                           MODULE)
        self.assertTrue(os.path.exists(os.path.join(target, 'PyOrvXml.pyi')))
        self.check_command(os.path.join(target, 'bin'))


if __name__ == '__main__':
    unittest.main()
