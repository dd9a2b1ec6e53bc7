"""Times getOrvmatXml / getOrvoptXml against the interpreter decoding the same
XML from UTF-8 bytes, and against a baseline build of the module, side by side
in one run. Each measurement runs in a child process of its own, which also
reports its peak memory (ru_maxrss) above what it held before the call.

    python bench/python_bench.py --module build [--baseline /tmp/base/build]
        [--library build/bench_library.orvmat] [--small FILE] [--options FILE]

Runs under Python 2.7 and 3.x; the modules must be built for the interpreter
that runs the script. The large library is written by build/orvxml_make_library
(built with the benchmarks) when the file is missing.
"""
from __future__ import print_function

import argparse
import json
import os
import resource
import subprocess
import sys
import tempfile
import time

HERE = os.path.dirname(os.path.abspath(__file__))
ROOT = os.path.dirname(HERE)
PY3 = sys.version_info[0] >= 3


def cpu_clock():
    """CPU seconds of this process (user and system): on a shared machine
    they are disturbed less than wall time by what else runs."""
    r = resource.getrusage(resource.RUSAGE_SELF)
    return r.ru_utime + r.ru_stime


clock = time.perf_counter if PY3 else time.time


def resident_bytes():
    with open('/proc/self/statm') as f:
        return int(f.read().split()[1]) * os.sysconf('SC_PAGE_SIZE')


def peak_bytes():
    return resource.getrusage(resource.RUSAGE_SELF).ru_maxrss * 1024


def text_path(path):
    return path if PY3 else path.decode(sys.getfilesystemencoding())


def best_time(call, rounds, calls):
    """The best of `rounds` rounds of `calls` calls, per call, as
    (wall seconds, CPU seconds)."""
    best = None
    for _ in range(rounds):
        start, cpu = clock(), cpu_clock()
        for _ in range(calls):
            call()
        elapsed = ((clock() - start) / calls, (cpu_clock() - cpu) / calls)
        best = elapsed if best is None or elapsed[1] < best[1] else best
    return best


# ---- child side: one measurement, one JSON line on stdout.

def child_module(module_dir, function, path, rounds, calls, dump):
    sys.path.insert(0, module_dir)
    import PyOrvXml
    convert = getattr(PyOrvXml, function)
    upath = text_path(path)
    before = resident_bytes()
    result = convert(upath)
    peak = peak_bytes() - before
    chars = len(result)
    size = sys.getsizeof(result)
    if dump:
        with open(dump, 'wb') as f:
            f.write(result.encode('utf-8', 'surrogatepass') if PY3 else result.encode('utf-8'))
    del result
    seconds = best_time(lambda: convert(upath), rounds, calls)
    return {'wall': seconds[0], 'seconds': seconds[1], 'chars': chars, 'string_bytes': size,
            'peak_extra': peak}


def child_decode(xml_path, rounds, calls):
    with open(xml_path, 'rb') as f:
        data = f.read()
    errors = 'surrogatepass' if PY3 else 'strict'
    before = resident_bytes()
    result = data.decode('utf-8', errors)
    peak = peak_bytes() - before
    chars, size = len(result), sys.getsizeof(result)
    del result
    seconds = best_time(lambda: data.decode('utf-8', errors), rounds, calls)
    return {'wall': seconds[0], 'seconds': seconds[1], 'chars': chars, 'string_bytes': size,
            'peak_extra': peak}


# ---- parent side.

def run_child(args):
    out = subprocess.check_output([sys.executable, os.path.abspath(__file__), '--child'] + args)
    return json.loads(out.decode('ascii').strip().splitlines()[-1])


def module_case(module_dir, function, path, rounds, calls, dump=None):
    args = ['module', module_dir, function, path, str(rounds), str(calls)]
    return run_child(args + ([dump] if dump else []))


def mb(n):
    return '%.1f MB' % (n / 1e6)


def per_call(seconds):
    return '%.1f us' % (seconds * 1e6) if seconds < 1e-2 else '%.3f s' % seconds


def timing(r):
    return '%s [%s]' % (per_call(r['seconds']), per_call(r['wall']))


def main():
    if len(sys.argv) > 1 and sys.argv[1] == '--child':
        kind, rest = sys.argv[2], sys.argv[3:]
        if kind == 'module':
            r = child_module(rest[0], rest[1], rest[2], int(rest[3]), int(rest[4]),
                             rest[5] if len(rest) > 5 else None)
        else:
            r = child_decode(rest[0], int(rest[1]), int(rest[2]))
        print(json.dumps(r))
        return 0

    p = argparse.ArgumentParser(description=__doc__.split('\n\n')[0])
    p.add_argument('--module', default=os.path.join(ROOT, 'build'), help='folder of PyOrvXml.so')
    p.add_argument('--baseline', help='folder of a baseline PyOrvXml.so to compare with')
    p.add_argument('--library', default=os.path.join(ROOT, 'build', 'bench_library.orvmat'))
    p.add_argument('--small', default=os.path.join(ROOT, 'examples', 'materials_all_layers.orvmat'))
    p.add_argument('--options', default=os.path.join(ROOT, 'examples', 'render_settings.orvopt'))
    p.add_argument('--rounds', type=int, default=5)
    a = p.parse_args()

    if not os.path.exists(a.library):
        tool = os.path.join(os.path.dirname(a.library), 'bench', 'orvxml_make_library')
        subprocess.check_call([tool, a.library])

    print('Python %s, %s; CPU time per call, best of the rounds (wall time in brackets)' % (
        sys.version.split()[0], 'UCS4' if sys.maxunicode > 0xFFFF else 'UCS2'))
    cases = [('large library', 'getOrvmatXml', a.library, max(2, a.rounds // 2), 1),
             ('4 KB library', 'getOrvmatXml', a.small, a.rounds, 2000),
             ('options document', 'getOrvoptXml', a.options, a.rounds, 2000)]
    header = '%-17s %22s %22s %22s %8s %8s  %s' % ('case', 'module', 'decode', 'baseline',
                                                  'x decode', 'x faster', 'peak above start / bound')
    print(header)
    print('-' * len(header))
    tmp = tempfile.mkdtemp(prefix='orvxml-bench-')
    try:
        for name, function, path, rounds, calls in cases:
            xml = os.path.join(tmp, 'doc.xml')
            new = module_case(a.module, function, path, rounds, calls, dump=xml)
            dec = run_child(['decode', xml, str(rounds), str(calls)])
            base = module_case(a.baseline, function, path, rounds, calls) if a.baseline else None
            # What the call may hold at its peak: the file, the result string
            # and one byte per character.
            bound = os.path.getsize(path) + new['string_bytes'] + new['chars']
            print('%-17s %22s %22s %22s %8.2f %8s  %s / %s (decode %s%s); %.2fM chars' % (
                name, timing(new), timing(dec), timing(base) if base else '-',
                new['seconds'] / dec['seconds'],
                '%.2f' % (base['seconds'] / new['seconds']) if base else '-',
                mb(new['peak_extra']), mb(bound), mb(dec['peak_extra']),
                ', baseline %s' % mb(base['peak_extra']) if base else '',
                new['chars'] / 1e6))
            os.remove(xml)
    finally:
        os.rmdir(tmp)
    return 0


if __name__ == '__main__':
    sys.exit(main())
