# -*- coding: utf-8 -*-
"""The platform tag of the Python 3 wheels: the build backend's ELF reader
against readelf and objdump on the built files, and the policy check that
picks the manylinux tag or fails the build."""
import os
import re
import subprocess
import sys
import sysconfig
import unittest

from support import BUILD, SOURCE, ScratchTest, read

sys.path.insert(0, os.path.join(SOURCE, 'tools', 'pybuild'))
import manylinux  # noqa: E402
import orvxml_backend  # noqa: E402

MODULE = os.path.join(BUILD, 'PyOrvXml' + sysconfig.get_config_var('EXT_SUFFIX'))


def tool(*command):
    return subprocess.check_output(command, env=dict(os.environ, LC_ALL='C')).decode('utf-8')


def readelf_needs(path):
    """The Needs of a file as binutils see them: the NEEDED entries of the
    dynamic section, the names of .gnu.version_r and the undefined dynamic
    symbols bound to each."""
    libraries = re.findall(r'\(NEEDED\)\s+Shared library: \[([^\]]+)\]',
                           tool('readelf', '--wide', '--dynamic', path))
    info = tool('readelf', '--wide', '--version-info', path)
    needed = info[info.index("'.gnu.version_r'"):]
    versions = dict((name, set()) for name in re.findall(r'Name: (\S+)\s+Flags', needed))
    for version, symbol in re.findall(r'\*UND\*\s+[0-9a-f]+\s+\(([^)]+)\)\s+(\S+)\n',
                                      tool('objdump', '--dynamic-syms', path)):
        versions[version].add(symbol)
    return manylinux.Needs(libraries, dict((v, sorted(s)) for v, s in versions.items()))


def built_files():
    """The module for this interpreter and, when the project has one, the
    command-line program: the ELF files of this interpreter's wheel."""
    files = [MODULE]
    with open(os.path.join(BUILD, 'wheel-contents.txt')) as f:
        files += [line.split(' ', 2)[2].strip() for line in f if line.startswith('script ')]
    return files


class BuiltFiles(ScratchTest):
    def test_reader_agrees_with_readelf_and_objdump(self):
        for path in built_files():
            needs = manylinux.read_needs(path)
            self.assertEqual(needs, readelf_needs(path), path)
            self.assertIn('libc.so.6', needs.libraries)
            self.assertTrue(any(v.startswith('GLIBC_2.') for v in needs.versions), path)

    def test_files_earn_manylinux_2_34(self):
        files = built_files()
        self.assertEqual(orvxml_backend.platform_tag(files + [os.path.join(
            SOURCE, 'src', 'module', 'python', 'PyOrvXml.pyi')]), 'manylinux_2_34_x86_64')
        module = manylinux.read_needs(MODULE)
        self.assertEqual([lib for lib in module.libraries if lib.startswith('libpython')], [])
        # The C++ runtime stays a shared library.
        self.assertIn('libstdc++.so.6', module.libraries)

    def test_a_file_beyond_the_newest_policy_fails_the_build(self):
        # The module with its newest glibc version renamed to one no policy allows.
        needs = manylinux.read_needs(MODULE)
        newest = max((v for v in needs.versions if re.match(r'GLIBC_2\.\d\d$', v)),
                     key=lambda v: int(v[8:]))
        path = self.write(os.path.basename(MODULE),
                         read(MODULE).replace(newest.encode('ascii'), b'GLIBC_2.99'))
        with self.assertRaises(RuntimeError) as caught:
            orvxml_backend.platform_tag([path])
        self.assertIn('%s needs GLIBC_2.99 (%s' % (os.path.basename(MODULE),
                                                   needs.versions[newest][0]),
                      str(caught.exception))


class Reader(ScratchTest):
    def refused(self, data, reason):
        path = self.write('file', data)
        with self.assertRaises(manylinux.ElfError) as caught:
            manylinux.read_needs(path)
        self.assertIn(reason, str(caught.exception))

    def test_files_it_cannot_read_are_refused(self):
        module = read(MODULE)
        self.assertFalse(manylinux.is_elf(self.write('stub', b'def f(): ...\n')))
        self.refused(b'def f(): ...\n', 'not an ELF file')
        self.refused(module[:4] + b'\x01' + module[5:], '64-bit little-endian')
        self.refused(module[:5] + b'\x02' + module[6:], '64-bit little-endian')
        self.refused(module[:18] + b'\xb7\x00' + module[20:], 'not an x86-64 file (machine 183)')
        self.refused(module[:40] + b'\0' * 8 + module[48:], 'no section headers')
        # Cut short: the section headers are at the end.
        self.refused(module[:64], 'damaged ELF data')
        self.refused(module[:len(module) - 100], 'damaged ELF data')


def needs(libraries=('libc.so.6',), versions=(), symbols=()):
    return manylinux.Needs(list(libraries), dict((v, list(symbols)) for v in versions))


class Policy(unittest.TestCase):
    def tag(self, *args, **kwargs):
        return manylinux.platform_tag({'orvxml': needs(*args, **kwargs)})

    def refusal(self, *args, **kwargs):
        with self.assertRaises(manylinux.PolicyError) as caught:
            self.tag(*args, **kwargs)
        return str(caught.exception)

    def test_the_oldest_policy_that_fits(self):
        lib = ['libstdc++.so.6', 'libgcc_s.so.1', 'libm.so.6', 'libc.so.6']
        for versions, tag in [
                (['GLIBC_2.2.5'], 'manylinux_2_28'),
                (['GLIBC_2.28', 'GLIBCXX_3.4.24', 'CXXABI_1.3.11', 'GCC_7.0.0',
                  'CXXABI_TM_1', 'CXXABI_FLOAT128', 'LIBATOMIC_1.2'], 'manylinux_2_28'),
                (['GLIBC_2.29'], 'manylinux_2_31'),
                (['GLIBC_2.17', 'GLIBCXX_3.4.25'], 'manylinux_2_31'),
                (['CXXABI_1.3.12'], 'manylinux_2_31'),
                (['GLIBC_2.31', 'GLIBCXX_3.4.28'], 'manylinux_2_31'),
                (['GLIBC_2.32'], 'manylinux_2_34'),
                (['GLIBC_2.2.5', 'GLIBCXX_3.4.29'], 'manylinux_2_34'),
                (['GLIBC_2.34', 'GLIBC_2.33', 'GLIBCXX_3.4.29', 'CXXABI_1.3.13', 'GCC_7.0.0'],
                 'manylinux_2_34')]:
            self.assertEqual(self.tag(lib, versions), tag, versions)
        # Every file counts: the newest need of any of them sets the tag.
        self.assertEqual(manylinux.platform_tag({'a': needs(versions=['GLIBC_2.17']),
                                                 'b': needs(versions=['GLIBC_2.30'])}),
                         'manylinux_2_31')

    def test_versions_beyond_the_newest_policy_are_named(self):
        self.assertEqual(self.refusal(versions=['GLIBC_2.36', 'GLIBC_2.34'],
                                      symbols=['arc4random']),
                         'orvxml needs GLIBC_2.36 (arc4random), beyond manylinux_2_34')
        self.assertEqual(self.refusal(versions=['GLIBC_2.35']),
                         'orvxml needs GLIBC_2.35, beyond manylinux_2_34')
        self.assertEqual(self.refusal(versions=['GLIBCXX_3.4.30'], symbols='abcd'),
                         'orvxml needs GLIBCXX_3.4.30 (a, b, c, ...), beyond manylinux_2_34')
        for version in ('CXXABI_1.3.14', 'GCC_12.0.0', 'LIBATOMIC_1.3', 'GLIBC_3.0'):
            self.assertEqual(self.refusal(versions=[version]),
                             'orvxml needs %s, beyond manylinux_2_34' % version)
        for version in ('GLIBC_PRIVATE', 'ZLIB_1.2.9', 'CXXABI_LDBL_1.3'):
            self.assertEqual(self.refusal(versions=[version]),
                             'orvxml needs %s, which manylinux_2_34 does not allow' % version)

    def test_only_the_system_libraries_of_the_policy(self):
        self.assertEqual(self.tag(['libc.so.6', 'libpthread.so.0', 'libdl.so.2', 'librt.so.1',
                                   'libmvec.so.1', 'ld-linux-x86-64.so.2']), 'manylinux_2_28')
        for library in ('libpython3.8.so.1.0', 'libcrypto.so.3', 'libz.so.1', 'libc.so.7'):
            self.assertEqual(self.refusal(['libc.so.6', library]),
                             'orvxml needs %s, which manylinux_2_34 does not allow' % library)

    def test_every_problem_of_every_file_is_told(self):
        with self.assertRaises(manylinux.PolicyError) as caught:
            manylinux.platform_tag({
                'orvxml': needs(versions=['GLIBC_2.36', 'GLIBCXX_3.4.29']),
                'PyOrvXml.so': needs(['libpython3.8.so.1.0'], ['GLIBCXX_3.4.31'])})
        self.assertEqual(str(caught.exception).splitlines(), [
            'PyOrvXml.so needs libpython3.8.so.1.0, which manylinux_2_34 does not allow',
            'PyOrvXml.so needs GLIBCXX_3.4.31, beyond manylinux_2_34',
            'orvxml needs GLIBC_2.36, beyond manylinux_2_34'])


class Metadata(ScratchTest):
    def test_prepared_metadata_claims_no_tag(self):
        # The tag is known only once the files are built: the WHEEL file is
        # written with the wheel, never ahead of it with another tag.
        info = orvxml_backend.prepare_metadata_for_build_wheel(self.dir)
        self.assertEqual(os.listdir(os.path.join(self.dir, info)), ['METADATA'])
        self.assertIn(b'\nName: PyOrvXml\n', read(os.path.join(self.dir, info, 'METADATA')))


if __name__ == '__main__':
    unittest.main()
