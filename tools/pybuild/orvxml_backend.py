# -*- coding: utf-8 -*-
"""Builds the PyOrvXml wheel through the project's own CMake build.

A PEP 517 build backend (pyproject.toml names it, with backend-path) that
needs nothing beyond the interpreter and CMake: it configures the project in a
temporary folder for the interpreter that runs it, builds only the model
library, that interpreter's module and the command-line program (when the
project has one), and writes the wheel itself, for Python 3 tagged with the
manylinux policy that its ELF files satisfy (manylinux.py reads them). It runs
under CPython 2.7 too, where tools/wheel.sh calls it directly:

    python orvxml_backend.py OUTDIR     # prints the path of the wheel
"""
from __future__ import print_function

import base64
import hashlib
import os
import re
import shutil
import subprocess
import sys
import sysconfig
import tempfile
import zipfile

import manylinux

ROOT = os.path.dirname(os.path.dirname(os.path.dirname(os.path.abspath(__file__))))
STUB = os.path.join('src', 'module', 'python', 'PyOrvXml.pyi')
# The oldest Python 3 the module is built for.
OLDEST_PYTHON3 = (3, 8)


def project():
    """The [project] strings of pyproject.toml (name, version, ...)."""
    fields = {}
    section = None
    with open(os.path.join(ROOT, 'pyproject.toml')) as f:
        for line in f:
            line = line.strip()
            if line.startswith('['):
                section = line
                continue
            m = re.match(r'([\w-]+)\s*=\s*"([^"]*)"\s*$', line)
            if section == '[project]' and m:
                fields[m.group(1)] = m.group(2)
    return fields


def normalized(name):
    """The distribution name as wheel and dist-info file names spell it."""
    return re.sub(r'[-_.]+', '_', name).lower()


def tags(platform):
    """(python, abi, platform) of the wheel for the running interpreter."""
    if getattr(sys, 'implementation', None) is not None and sys.implementation.name != 'cpython':
        raise RuntimeError('PyOrvXml builds for CPython only')
    if sys.version_info[0] >= 3:
        if sys.version_info[:2] < OLDEST_PYTHON3:
            raise RuntimeError('PyOrvXml needs Python 2.7 or %d.%d and later' % OLDEST_PYTHON3)
        python = 'cp%d%d' % sys.version_info[:2]
        return python, python + ('d' if sysconfig.get_config_var('Py_DEBUG') else ''), platform
    flag = sysconfig.get_config_var
    abi = 'cp27' + ('d' if flag('Py_DEBUG') else '') + \
        ('m' if flag('WITH_PYMALLOC') in (None, 1) else '') + \
        ('u' if sys.maxunicode == 0x10FFFF else '')
    return 'cp27', abi, platform


def platform_tag(paths):
    """The wheel's platform tag. For Python 3 on x86-64 Linux, the oldest
    manylinux policy that the ELF files among paths satisfy, so that pip
    installs the wheel on other distributions too, and only where it loads;
    else, and for 2.7 (whose pip 19 knows no manylinux_2_NN tag), the
    interpreter's own platform."""
    platform = re.sub(r'[-.]', '_', sysconfig.get_platform())
    if sys.version_info[0] < 3 or platform != 'linux_x86_64':
        return platform
    needs = dict((os.path.basename(path), manylinux.read_needs(path))
                 for path in paths if manylinux.is_elf(path))
    try:
        return manylinux.platform_tag(needs) + '_x86_64'
    except manylinux.PolicyError as e:
        raise RuntimeError('the wheel fits no manylinux tag:\n%s' % e)


def wheel_name(platform):
    meta = project()
    return '%s-%s-%s.whl' % (normalized(meta['name']), meta['version'], '-'.join(tags(platform)))


def metadata():
    """The content of METADATA."""
    meta = project()
    metadata = ['Metadata-Version: 2.1',
                'Name: ' + meta['name'],
                'Version: ' + meta['version']]
    for key, field in (('description', 'Summary'), ('requires-python', 'Requires-Python'),
                       ('license', 'License')):
        if key in meta:
            metadata.append('%s: %s' % (field, meta[key]))
    return '\n'.join(metadata) + '\n'


def wheel_file(platform):
    """The content of WHEEL, with the wheel's tag."""
    wheel = ['Wheel-Version: 1.0',
             'Generator: orvxml_backend (%s)' % project()['version'],
             'Root-Is-Purelib: false',
             'Tag: ' + '-'.join(tags(platform))]
    return '\n'.join(wheel) + '\n'


def dist_info():
    meta = project()
    return '%s-%s.dist-info' % (normalized(meta['name']), meta['version'])


def run(command, log):
    """Runs a build step with its output into the log; shows the log if it fails."""
    log.write(('$ ' + ' '.join(command) + '\n').encode('utf-8'))
    log.flush()
    try:
        status = subprocess.call(command, stdout=log, stderr=subprocess.STDOUT)
    except OSError as e:
        raise RuntimeError('%s: %s (is it installed and on the PATH?)' % (command[0], e))
    if status != 0:
        log.seek(0)
        sys.stderr.write(log.read().decode('utf-8', 'replace'))
        raise RuntimeError('the build failed: ' + ' '.join(command))


def cpu_count():
    try:
        return len(os.sched_getaffinity(0))
    except AttributeError:
        import multiprocessing
        return multiprocessing.cpu_count()


def build(folder, log):
    """Configures and builds into folder; gives [(role, file)] for the wheel."""
    major = 'python%d' % sys.version_info[0]
    include = sysconfig.get_paths()['include']
    # The optimisation of the tested build folder (RelWithDebInfo), so the
    # code is the same, but without the debug information, which the wheel
    # wouldn't keep. A unity build, as the Windows and sanitizer builds: it
    # compiles in about half the time.
    configure = ['cmake', '-S', ROOT, '-B', folder, '-DCMAKE_BUILD_TYPE=RelWithDebInfo',
                 '-DCMAKE_CXX_FLAGS_RELWITHDEBINFO=-O2 -DNDEBUG', '-DCMAKE_UNITY_BUILD=ON',
                 '-DCMAKE_MODULE_LINKER_FLAGS=-s', '-DCMAKE_EXE_LINKER_FLAGS=-s',
                 '-DORVXML_BUILD_TESTS=OFF', '-DORVXML_BUILD_BENCH=OFF']
    if sys.version_info[0] >= 3:
        configure += ['-DORVXML_BUILD_MODULE=OFF', '-DORVXML_BUILD_MODULE3=ON',
                      '-DPYTHON3_EXECUTABLE=' + sys.executable]
    else:
        configure += ['-DORVXML_BUILD_MODULE=ON', '-DORVXML_BUILD_MODULE3=OFF',
                      '-DPYTHON27_PREFIX=' + sys.prefix,
                      '-DPYTHON27_EXECUTABLE=' + sys.executable,
                      '-DPYTHON27_INCLUDE_DIR=' + include]
    run(configure, log)
    contents = []
    with open(os.path.join(folder, 'wheel-contents.txt')) as f:
        for line in f:
            if line.strip():
                role, target, path = line.split(' ', 2)
                if role in (major, 'script'):
                    contents.append((role, target, path.rstrip('\n')))
    if not any(role == major for role, _, _ in contents):
        raise RuntimeError('the build has no module for ' + major)
    targets = [target for _, target, _ in contents]
    run(['cmake', '--build', folder, '--parallel', str(cpu_count()), '--target'] + targets, log)
    return [(role, path) for role, _, path in contents]


def record_line(name, data):
    digest = base64.urlsafe_b64encode(hashlib.sha256(data).digest()).rstrip(b'=')
    return '%s,sha256=%s,%d' % (name, digest.decode('ascii'), len(data))


def write_wheel(path, files, platform):
    """Writes the wheel: files is [(name in the wheel, bytes, executable)]."""
    info = dist_info()
    files = list(files) + [(info + '/' + name, text.encode('utf-8'), False)
                           for name, text in (('METADATA', metadata()),
                                              ('WHEEL', wheel_file(platform)))]
    record = [record_line(name, data) for name, data, _ in files]
    record.append(info + '/RECORD,,')
    files.append((info + '/RECORD', ('\n'.join(record) + '\n').encode('utf-8'), False))
    with zipfile.ZipFile(path, 'w', zipfile.ZIP_DEFLATED) as wheel:
        for name, data, executable in files:
            entry = zipfile.ZipInfo(name, date_time=(1980, 1, 1, 0, 0, 0))
            entry.external_attr = (0o100755 if executable else 0o100644) << 16  # regular file
            entry.compress_type = zipfile.ZIP_DEFLATED
            wheel.writestr(entry, data)


def read(path):
    with open(path, 'rb') as f:
        return f.read()


# PEP 517 hooks.

def get_requires_for_build_wheel(config_settings=None):
    return []


def prepare_metadata_for_build_wheel(metadata_directory, config_settings=None):
    # METADATA alone: the WHEEL file's tag comes from the built files, so it
    # is written only into the wheel.
    folder = os.path.join(metadata_directory, dist_info())
    if not os.path.isdir(folder):
        os.makedirs(folder)
    with open(os.path.join(folder, 'METADATA'), 'wb') as f:
        f.write(metadata().encode('utf-8'))
    return dist_info()


def build_wheel(wheel_directory, config_settings=None, metadata_directory=None):
    folder = tempfile.mkdtemp(prefix='orvxml-wheel-')
    try:
        with tempfile.TemporaryFile() as log:
            built = build(os.path.join(folder, 'build'), log)
        scripts = '%s-%s.data/scripts/' % (normalized(project()['name']), project()['version'])
        files = [('PyOrvXml.pyi', read(os.path.join(ROOT, STUB)), False)]
        for role, path in built:
            name = os.path.basename(path)
            if role == 'script':
                files.append((scripts + name, read(path), True))
            else:
                files.append((name, read(path), True))
        platform = platform_tag([path for _, path in built])
        name = wheel_name(platform)
        if not os.path.isdir(wheel_directory):
            os.makedirs(wheel_directory)
        write_wheel(os.path.join(wheel_directory, name), files, platform)
        return name
    finally:
        shutil.rmtree(folder, ignore_errors=True)


if __name__ == '__main__':
    if len(sys.argv) != 2:
        sys.exit('usage: %s OUTDIR' % sys.argv[0])
    out = os.path.abspath(sys.argv[1])
    print(os.path.join(out, build_wheel(out)))
