# -*- coding: utf-8 -*-
"""The manylinux platform tag that built files earn, from their ELF data.

A wheel may claim manylinux_2_NN only if every ELF file in it loads on any
x86-64 system with glibc 2.NN and that policy's C++ runtime: it may need only
the policy's system libraries (DT_NEEDED), and no symbol version of them
newer than the policy allows (the version needs of .gnu.version_r). This
reads both from the files themselves, the way the loader sees them, and picks
the oldest policy of the table that the files satisfy. Pure Python, for 2.7
and 3.x alike: the build backend runs under both.
"""
import collections
import re
import struct

# Newest symbol version of each versioned library family that the x86-64
# policies allow, with the few unnumbered names they also allow. Oldest
# first. Versions skipped by x86-64 glibc and GCC never occur, so a ceiling
# allows the same names as the policies' full lists.
POLICIES = [
    ('manylinux_2_28', {'GLIBC': (2, 28), 'GLIBCXX': (3, 4, 24), 'CXXABI': (1, 3, 11),
                        'GCC': (7, 0, 0), 'LIBATOMIC': (1, 2)}),
    ('manylinux_2_31', {'GLIBC': (2, 31), 'GLIBCXX': (3, 4, 28), 'CXXABI': (1, 3, 12),
                        'GCC': (7, 0, 0), 'LIBATOMIC': (1, 2)}),
    ('manylinux_2_34', {'GLIBC': (2, 34), 'GLIBCXX': (3, 4, 29), 'CXXABI': (1, 3, 13),
                        'GCC': (7, 0, 0), 'LIBATOMIC': (1, 2)}),
]
UNNUMBERED = frozenset(['CXXABI_TM_1', 'CXXABI_FLOAT128'])
# The system libraries the policies above allow a file to need (the same for
# all three), and the dynamic loader, which every system has. libz.so.1 is
# allowed too, but not some of its internal symbols, which this does not check.
LIBRARIES = frozenset([
    'libc.so.6', 'libm.so.6', 'libmvec.so.1', 'libstdc++.so.6', 'libgcc_s.so.1',
    'libatomic.so.1', 'libpthread.so.0', 'libdl.so.2', 'librt.so.1', 'libutil.so.1',
    'libanl.so.1', 'libnsl.so.1', 'libresolv.so.2', 'libexpat.so.1', 'libX11.so.6',
    'libXext.so.6', 'libXrender.so.1', 'libICE.so.6', 'libSM.so.6', 'libGL.so.1',
    'libgobject-2.0.so.0', 'libgthread-2.0.so.0', 'libglib-2.0.so.0',
    'ld-linux-x86-64.so.2'])

EM_X86_64 = 62
SHT_DYNSYM, SHT_DYNAMIC = 11, 6
SHT_GNU_VERNEED, SHT_GNU_VERSYM = 0x6ffffffe, 0x6fffffff
DT_NEEDED = 1

# What a file needs: its DT_NEEDED libraries in order, and each symbol
# version it needs with the undefined symbols bound to it (sorted).
Needs = collections.namedtuple('Needs', 'libraries versions')


class ElfError(Exception):
    """The file is not an x86-64 ELF file this can read."""


class PolicyError(Exception):
    """The files need more than the newest policy of the table allows."""


def is_elf(path):
    with open(path, 'rb') as f:
        return f.read(4) == b'\x7fELF'


def read_needs(path):
    """The Needs of an ELF64 little-endian x86-64 file."""
    with open(path, 'rb') as f:
        data = f.read()
    try:
        return _needs(data)
    except (struct.error, ValueError, IndexError) as e:
        raise ElfError('%s: damaged ELF data (%s)' % (path, e))
    except ElfError as e:
        raise ElfError('%s: %s' % (path, e))


def _needs(data):
    if data[:4] != b'\x7fELF':
        raise ElfError('not an ELF file')
    if data[4:6] != b'\x02\x01':
        raise ElfError('not a 64-bit little-endian ELF file')
    machine, = struct.unpack_from('<H', data, 18)
    if machine != EM_X86_64:
        raise ElfError('not an x86-64 file (machine %d)' % machine)
    shoff, = struct.unpack_from('<Q', data, 40)
    shentsize, shnum = struct.unpack_from('<HH', data, 58)
    if shoff == 0 or shnum == 0:
        raise ElfError('no section headers')
    # (type, offset, size, link, info) of each section.
    sections = [struct.unpack_from('<4xI16xQQII', data, shoff + i * shentsize)
                for i in range(shnum)]

    def string(section, offset):
        start = sections[section][1] + offset
        return data[start:data.index(b'\0', start)].decode('ascii')

    libraries, versions, names = [], {}, {}
    for kind, offset, size, link, info in sections:
        if kind == SHT_DYNAMIC:
            for pos in range(offset, offset + size - 15, 16):
                tag, value = struct.unpack_from('<qQ', data, pos)
                if tag == 0:
                    break
                if tag == DT_NEEDED:
                    libraries.append(string(link, value))
        elif kind == SHT_GNU_VERNEED:
            # info entries of Elf64_Verneed, each with a chain of Elf64_Vernaux.
            pos = offset
            for _ in range(info):
                _, count, _, aux, following = struct.unpack_from('<HHIII', data, pos)
                at = pos + aux
                for _ in range(count):
                    _, _, index, name, step = struct.unpack_from('<IHHII', data, at)
                    version = string(link, name)
                    names[index] = version
                    versions.setdefault(version, set())
                    at += step
                pos += following
    # Each undefined dynamic symbol's version index is in .gnu.version.
    versym = [s for s in sections if s[0] == SHT_GNU_VERSYM]
    dynsym = [s for s in sections if s[0] == SHT_DYNSYM]
    if versym and dynsym:
        _, symbols, size, link, _ = dynsym[0]
        for i in range(size // 24):
            name, shndx = struct.unpack_from('<I2xH', data, symbols + i * 24)
            index, = struct.unpack_from('<H', data, versym[0][1] + i * 2)
            if shndx == 0 and (index & 0x7fff) in names:
                versions[names[index & 0x7fff]].add(string(link, name))
    return Needs(libraries, dict((v, sorted(s)) for v, s in versions.items()))


def _number(text):
    return tuple(int(part) for part in text.split('.'))


def refusals(name, needs, policy):
    """Why the file called name, with these Needs, breaks the (tag, ceilings)
    policy: one message for each library or version it may not need."""
    tag, ceilings = policy
    problems = []
    for library in needs.libraries:
        if library not in LIBRARIES:
            problems.append('%s needs %s, which %s does not allow' % (name, library, tag))
    for version in sorted(needs.versions):
        if version in UNNUMBERED:
            continue
        m = re.match(r'([A-Z]+)_(\d+(?:\.\d+)*)$', version)
        if not m or m.group(1) not in ceilings:
            problems.append('%s needs %s, which %s does not allow' % (name, version, tag))
        elif _number(m.group(2)) > ceilings[m.group(1)]:
            symbols = needs.versions[version]
            shown = ' (%s%s)' % (', '.join(symbols[:3]), ', ...' if symbols[3:] else '') \
                if symbols else ''
            problems.append('%s needs %s%s, beyond %s' % (name, version, shown, tag))
    return problems


def platform_tag(needs_by_name):
    """The oldest policy tag that all files satisfy, from {name: Needs};
    PolicyError naming what breaks the newest one if none does."""
    for policy in POLICIES:
        if not any(refusals(n, needs, policy) for n, needs in needs_by_name.items()):
            return policy[0]
    problems = []
    for n in sorted(needs_by_name):
        problems += refusals(n, needs_by_name[n], POLICIES[-1])
    raise PolicyError('\n'.join(problems))
