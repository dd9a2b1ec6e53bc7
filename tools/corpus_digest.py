#!/usr/bin/env python3
"""A digest of everything the converter writes for a large corpus of damaged
files, to show that a change of the code changed no output.

    tools/corpus_digest.py BUILD_DIR TREE [--files N] [--seed S]

If the folder TREE doesn't exist yet, writes into it the samples and one
library per class (BUILD_DIR/orvxml-samples --corpus), then N mutated copies
of them (cuts, byte flips, insertions, chosen by the seed); an existing TREE
is used as it is, since some samples hold a random UUID. Converts the tree
with orvxml -o, --explain and --report, and once more with --well-formed,
and prints one SHA-256 over every output file, every --explain line and the
report with its times left out. Run it with the same TREE on the build
before and after a change: the two digests must be equal.
"""
import argparse
import hashlib
import json
import os
import random
import shutil
import subprocess
import sys
import tempfile


def mutate(data, rng):
    data = bytearray(data)
    for _ in range(rng.randint(1, 4)):
        what = rng.random()
        at = rng.randrange(len(data) + 1)
        if what < 0.3 and data:
            del data[at:]  # cut
        elif what < 0.7 and at < len(data):
            data[at] ^= 1 << rng.randrange(8)  # flip a bit
        else:
            data[at:at] = bytes(rng.randrange(256) for _ in range(rng.randint(1, 8)))
    return bytes(data)


def digest_run(orvxml, tree, out, extra, h):
    report = out + '.jsonl'
    p = subprocess.run([orvxml, '-j2', '--explain', '--report', report, '-o', out] + extra + [tree],
                       stdout=subprocess.PIPE, stderr=subprocess.PIPE)
    h.update(b'status %d\n' % p.returncode)
    h.update(p.stdout)
    with open(report) as f:
        for line in f:
            row = json.loads(line)
            row.pop('milliseconds')
            h.update(json.dumps(row, sort_keys=True).encode() + b'\n')
    count = 0
    for folder, _, names in sorted(os.walk(out)):
        for name in sorted(names):
            path = os.path.join(folder, name)
            h.update(os.path.relpath(path, out).encode() + b'\n')
            with open(path, 'rb') as f:
                h.update(hashlib.sha256(f.read()).digest())
            count += 1
    return count


def make_tree(samples, tree, files, seed):
    seeds = os.path.join(tree, 'seeds')
    subprocess.run([samples, '--corpus', seeds], stdout=subprocess.DEVNULL, check=True)
    rng = random.Random(seed)
    sources = sorted(os.path.join(d, n) for d, _, ns in os.walk(seeds) for n in ns)
    os.makedirs(os.path.join(tree, 'mutated'))
    for i in range(files):
        source = rng.choice(sources)
        with open(source, 'rb') as f:
            data = mutate(f.read(), rng)
        with open(os.path.join(tree, 'mutated', '%05d_%s' % (i, os.path.basename(source))), 'wb') as f:
            f.write(data)


def main():
    ap = argparse.ArgumentParser()
    ap.add_argument('build')
    ap.add_argument('tree')
    ap.add_argument('--files', type=int, default=4000)
    ap.add_argument('--seed', type=int, default=20261125)
    args = ap.parse_args()
    orvxml = os.path.abspath(os.path.join(args.build, 'orvxml'))
    samples = os.path.abspath(os.path.join(args.build, 'orvxml-samples'))
    tree = os.path.abspath(args.tree)
    if not os.path.isdir(tree):
        make_tree(samples, tree, args.files, args.seed)
    inputs = sum(len(names) for _, _, names in os.walk(tree))
    work = tempfile.mkdtemp(prefix='orvxml-digest-')
    try:
        h = hashlib.sha256()
        exact = digest_run(orvxml, tree, os.path.join(work, 'exact'), [], h)
        well = digest_run(orvxml, tree, os.path.join(work, 'well'), ['--well-formed'], h)
        print('%s  %d inputs, %d outputs, %d well-formed outputs' % (h.hexdigest(), inputs, exact, well))
    finally:
        shutil.rmtree(work)


if __name__ == '__main__':
    sys.exit(main())
