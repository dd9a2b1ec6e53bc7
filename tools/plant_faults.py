#!/usr/bin/env python3
"""Plants one fault at a time in src/ and sees whether the unit tests find it.

    tools/plant_faults.py BUILD_DIR [--seed S] [--sample N] [--headers]
                          [--python] [--list] [--timeout SECONDS]

From every line of src/ that is code (not a comment, a blank line or a
preprocessor line) it gathers the places a fault can be planted: a
comparison flipped (< and <=, > and >=, == and !=), a boolean flipped (true
and false) or an integer constant n made n+1. The seed chooses a fixed
sample of lines and one place in each, so the same seed on the same sources
gives the same sample. For each fault in turn it changes the file, rebuilds
the test programs in BUILD_DIR (incrementally), runs them, and notes whether
a test failed (killed), none did (survived) or the build failed (did not
compile); then it puts the file back. The file is put back whatever happens,
Ctrl-C included.

Only the library's .cpp files for this system are sampled unless --headers
is given (a fault in a header rebuilds most of the tree, which on a small
machine makes a run too slow). --python also samples the command and the
binding, and runs the Python and command tests (ctest -R "python|cli").
--list prints the sample and stops.

BUILD_DIR must be configured from this tree. Mutating src/ while others build
from it disturbs them, so run this in a worktree of its own:
    git worktree add /tmp/mut-wt HEAD
    cmake -S /tmp/mut-wt -B /tmp/mut-wt/build -DCMAKE_BUILD_TYPE=RelWithDebInfo
    /tmp/mut-wt/tools/plant_faults.py /tmp/mut-wt/build --seed 20 --sample 36
"""
import argparse
import os
import random
import re
import signal
import subprocess
import sys
import time

ROOT = os.path.dirname(os.path.dirname(os.path.abspath(__file__)))

FLIP = {"<": "<=", "<=": "<", ">": ">=", ">=": ">", "==": "!=", "!=": "=="}
# A comparison operator with a space either side, so that template brackets,
# shifts and arrows are left alone.
COMPARISON = re.compile(r"(?<= )(<=|>=|==|!=|<|>)(?= )")
BOOLEAN = re.compile(r"\b(true|false)\b")
# A decimal integer that isn't part of a name, a float or a hex number; an
# integer suffix (u, L) may follow.
INTEGER = re.compile(r"(?<![\w.])(\d+)(?=[uUlL]*(?![\w.]))")
STRING = re.compile(r'"(?:[^"\\]|\\.)*"|\'(?:[^\'\\]|\\.)*\'')


def code_part(line, in_block):
    """The line with comments and string literals blanked out (same length),
    and whether a block comment is still open at its end."""
    out = []
    i = 0
    n = len(line)
    while i < n:
        if in_block:
            end = line.find("*/", i)
            if end < 0:
                out.append(" " * (n - i))
                return "".join(out), True
            out.append(" " * (end + 2 - i))
            i = end + 2
            in_block = False
            continue
        if line.startswith("//", i):
            out.append(" " * (n - i))
            break
        if line.startswith("/*", i):
            in_block = True
            continue
        m = STRING.match(line, i) if line[i] in "\"'" else None
        if m:
            out.append(" " * (m.end() - i))
            i = m.end()
            continue
        out.append(line[i])
        i += 1
    return "".join(out), in_block


def sites_of_file(path, rel):
    """Every place a fault can be planted in one file."""
    sites = []
    in_block = False
    with open(path, encoding="utf-8", errors="surrogateescape") as f:
        lines = f.read().split("\n")
    for number, line in enumerate(lines, 1):
        code, in_block = code_part(line, in_block)
        stripped = code.strip()
        if not stripped or stripped.startswith("#"):
            continue
        for m in COMPARISON.finditer(code):
            sites.append((rel, number, m.start(), m.group(1), FLIP[m.group(1)]))
        for m in BOOLEAN.finditer(code):
            word = m.group(1)
            sites.append((rel, number, m.start(), word, "false" if word == "true" else "true"))
        for m in INTEGER.finditer(code):
            sites.append((rel, number, m.start(), m.group(1), str(int(m.group(1)) + 1)))
    return sites


OTHER_SYSTEM = re.compile(r"Posix\.cpp$" if os.name == "nt" else r"Windows\.cpp$")


def tested(rel, headers, python):
    """Whether the tests run the code of a file: the library's sources for
    this system; the command's and the binding's only with the Python and
    command tests."""
    if rel.endswith(".h"):
        return headers
    if not rel.endswith(".cpp") or OTHER_SYSTEM.search(rel):
        return False
    if rel.startswith(("src/module/cli/", "src/module/python/", "src/platform/Program")):
        return python
    return True


def sample_sites(seed, size, headers, python):
    by_line = {}
    for folder, _, files in sorted(os.walk(os.path.join(ROOT, "src"))):
        for name in sorted(files):
            if not tested(os.path.relpath(os.path.join(folder, name), ROOT).replace(os.sep, "/"),
                          headers, python):
                continue
            path = os.path.join(folder, name)
            rel = os.path.relpath(path, ROOT)
            for site in sites_of_file(path, rel):
                by_line.setdefault((site[0], site[1]), []).append(site)
    rng = random.Random(seed)
    lines = sorted(by_line)
    chosen = sorted(rng.sample(lines, min(size, len(lines))))
    return [rng.choice(by_line[key]) for key in chosen], len(lines)


def test_programs(build):
    tests = os.path.join(ROOT, "tests")
    names = []
    for name in sorted(os.listdir(tests)):
        folder = os.path.join(tests, name)
        if name != "cli" and os.path.isdir(folder) and any(
                f.endswith(".cpp") for f in os.listdir(folder)):
            names.append("test_" + name)
    return names


def build(build_dir, targets):
    result = subprocess.run(["cmake", "--build", build_dir, "-j2", "--target"] + targets,
                            stdout=subprocess.PIPE, stderr=subprocess.STDOUT)
    return result.returncode == 0, result.stdout.decode(errors="replace")


def run_tests(build_dir, programs, timeout, python):
    """The first program that fails, or None when all pass. Two run at a time;
    a failure stops the rest. A program that runs past the timeout fails."""
    pending = list(programs)
    running = []
    failed = None
    start = time.monotonic()
    try:
        while (pending or running) and failed is None:
            while pending and len(running) < 2:
                name = pending.pop(0)
                exe = os.path.join(build_dir, "tests", name)
                running.append((name, subprocess.Popen(
                    [exe, "--gtest_brief=1"], cwd=os.path.join(build_dir, "tests"),
                    stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL)))
            time.sleep(0.05)
            for name, proc in list(running):
                code = proc.poll()
                if code is None:
                    if time.monotonic() - start > timeout:
                        failed = name + " (timeout)"
                    continue
                running.remove((name, proc))
                if code != 0:
                    failed = name
    finally:
        for _, proc in running:
            proc.kill()
            proc.wait()
    if failed is None and python:
        result = subprocess.run(["ctest", "--test-dir", build_dir, "-j2", "-R", "python|cli",
                                 "-E", "install", "--stop-on-failure", "--timeout", str(timeout)],
                                stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL)
        if result.returncode != 0:
            failed = "python/cli tests"
    return failed


def plant(site):
    rel, number, column, old, new = site
    path = os.path.join(ROOT, rel)
    with open(path, "rb") as f:
        original = f.read()
    lines = original.split(b"\n")
    line = lines[number - 1].decode("utf-8", "surrogateescape")
    assert line[column:column + len(old)] == old, (rel, number, line)
    lines[number - 1] = (line[:column] + new + line[column + len(old):]).encode(
        "utf-8", "surrogateescape")
    return path, original, b"\n".join(lines)


def describe(site):
    rel, number, _, old, new = site
    return "%s:%d  %s -> %s" % (rel, number, old, new)


def main():
    parser = argparse.ArgumentParser(description=__doc__.split("\n")[0])
    parser.add_argument("build_dir")
    parser.add_argument("--seed", type=int, default=20)
    parser.add_argument("--sample", type=int, default=36)
    parser.add_argument("--headers", action="store_true", help="sample headers too")
    parser.add_argument("--python", action="store_true", help="run the Python and command tests too")
    parser.add_argument("--list", action="store_true", help="print the sample and stop")
    parser.add_argument("--timeout", type=float, default=300, help="seconds for one run of the tests")
    args = parser.parse_args()

    sites, line_count = sample_sites(args.seed, args.sample, args.headers, args.python)
    print("seed %d: %d faults from %d candidate lines" % (args.seed, len(sites), line_count))
    if args.list:
        for site in sites:
            print("  " + describe(site))
        return 0

    build_dir = os.path.abspath(args.build_dir)
    programs = test_programs(build_dir)
    targets = ["all"] if args.python else programs
    # SIGTERM takes the same road as Ctrl-C, so the file is put back.
    signal.signal(signal.SIGTERM, lambda *_: (_ for _ in ()).throw(KeyboardInterrupt()))

    start = time.monotonic()
    ok, log = build(build_dir, targets)
    if not ok or run_tests(build_dir, programs, args.timeout, args.python):
        print(log[-3000:])
        print("the tests don't pass on the unchanged sources; nothing planted")
        return 2

    results = {"killed": [], "survived": [], "did not compile": []}
    for index, site in enumerate(sites, 1):
        began = time.monotonic()
        path, original, mutated = plant(site)
        try:
            with open(path, "wb") as f:
                f.write(mutated)
            ok, _ = build(build_dir, targets)
            if not ok:
                outcome, by = "did not compile", ""
            else:
                failed = run_tests(build_dir, programs, args.timeout, args.python)
                outcome, by = ("killed", failed) if failed else ("survived", "")
        finally:
            # No signal may cut the file short while it is written back.
            blocked = signal.pthread_sigmask(signal.SIG_BLOCK, {signal.SIGINT, signal.SIGTERM})
            with open(path, "wb") as f:
                f.write(original)
            signal.pthread_sigmask(signal.SIG_SETMASK, blocked)
        results[outcome].append(site)
        print("[%2d/%d] %-16s %-60s %s (%.0fs)" % (index, len(sites), outcome, describe(site), by,
                                                   time.monotonic() - began), flush=True)

    # Leave the build matching the sources.
    build(build_dir, targets)
    killed = len(results["killed"])
    survived = len(results["survived"])
    broken = len(results["did not compile"])
    print("\nseed %d, sample %d: killed %d, survived %d, did not compile %d; %d of %d built faults "
          "found; %.1f minutes" % (args.seed, len(sites), killed, survived, broken, killed,
                                   killed + survived, (time.monotonic() - start) / 60))
    if results["survived"]:
        print("survivors:")
        for site in results["survived"]:
            print("  " + describe(site))
    return 0


if __name__ == "__main__":
    try:
        sys.exit(main())
    except KeyboardInterrupt:
        print("\ninterrupted; the source file is restored")
        sys.exit(130)
