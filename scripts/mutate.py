#!/usr/bin/env python3
"""Plants small faults in the product code, one at a time, and reports how many of
them the test suite catches.

    scripts/mutate.py [--seed N] [--count N] [--build-dir DIR] [--out FILE]
    scripts/mutate.py --replay FILE [--build-dir DIR] [--out FILE]
    scripts/mutate.py --list [--seed N] [--count N]

Faults: a comparison flipped (== and !=) or loosened (< to <=, > to >=, and back),
&& and || swapped, true and false swapped, an off-by-one (+ 1 or - 1 dropped), and
a statement replaced by an empty one. Candidate places are every match in the C++
outside tests/, fuzz/, bench/ and build/, comments and string literals left out;
they are shuffled with the seed and taken in that order. A fault that does not
compile is set aside and the next one is taken, until COUNT faults have built.

For each fault: the file is changed, the tree in DIR (default build/mutate, a Debug
build without sanitizers, configured on first use) is rebuilt incrementally, the
three test programs (zrclitests, zre2e, zrtests) run with --gtest_fail_fast until
one fails or times out, and the file is restored. The install tests and fuzz replays
are left out: they exercise packaging and crash-freedom, which these faults do not
touch. A run takes tens of minutes; it is a developer's tool, not part of CI.

A fault may damage more than its own file (a file closed with the wrong flag may
delete the document being read, a data file of the tests): so the tree must have no
uncommitted change to tracked files, and after each fault every tracked file is
checked out again, the damage named in the outcome.

--out writes the sample and each outcome as JSON. --replay takes such a file and
plants the same faults again, found by their line text (nearest to the recorded
line), so that a suite can be measured before and after a change to the tests on
exactly the same faults; a fault whose line is gone is reported as such.
Interrupting restores the file being changed.
"""

import argparse
import json
import os
import random
import re
import subprocess
import sys
import time

ROOT = os.path.dirname(os.path.dirname(os.path.abspath(__file__)))
SKIP_DIRS = ("tests/", "fuzz/", "bench/", "build/")
TEST_PROGRAMS = ("zrclitests", "zre2e", "zrtests")
TARGETS = ("zrdict", "zrbxmls") + TEST_PROGRAMS

# (name, pattern, replacement). Patterns run over a line whose comments and string
# literals were blanked, so the columns they find are the original line's.
OPERATORS = [
    ("== to !=", r"==", "!="),
    ("!= to ==", r"!=", "=="),
    ("<= to <", r"(?<=\s)<=(?=\s)", "<"),
    (">= to >", r"(?<=\s)>=(?=\s)", ">"),
    ("< to <=", r"(?<=\s)<(?=\s)", "<="),
    ("> to >=", r"(?<=\s)>(?=\s)", ">="),
    ("&& to ||", r"&&", "||"),
    ("|| to &&", r"\|\|", "&&"),
    ("true to false", r"\btrue\b", "false"),
    ("false to true", r"\bfalse\b", "true"),
    ("+ 1 dropped", r"\s\+\s1\b(?!\.)", ""),
    ("- 1 dropped", r"\s-\s1\b(?!\.)", ""),
]

# A whole-line statement worth removing: a call, an assignment or an increment,
# not a declaration (which would not compile without it anyway), not a return.
STATEMENT = re.compile(
    r"^(\s*)((?!return\b|break\b|continue\b|case\b|default\b|goto\b)"
    r"[A-Za-z_][\w:.\[\]]*(?:->[\w:.\[\]]+)*"
    r"(?:\s*\(.*\)|\s*[-+|&*/]?=[^=].*|\+\+|--)\s*;)\s*$")


def product_files():
    out = subprocess.run(["git", "ls-files", "*.cpp", "*.h"], cwd=ROOT, check=True,
                         capture_output=True, text=True).stdout.split()
    return sorted(f for f in out if not f.startswith(SKIP_DIRS))


def blank_code(lines):
    """Each line with comments and string/char literals replaced by blanks."""
    out = []
    in_block = False
    for line in lines:
        chars = list(line)
        i = 0
        n = len(chars)
        quote = None
        while i < n:
            c = chars[i]
            if in_block:
                if line.startswith("*/", i):
                    chars[i] = chars[i + 1] = " "
                    in_block = False
                    i += 2
                    continue
                chars[i] = " "
            elif quote:
                if c == "\\" and i + 1 < n:
                    chars[i] = chars[i + 1] = " "
                    i += 2
                    continue
                if c == quote:
                    quote = None
                chars[i] = " "
            elif line.startswith("//", i):
                for j in range(i, n):
                    chars[j] = " "
                break
            elif line.startswith("/*", i):
                chars[i] = chars[i + 1] = " "
                in_block = True
                i += 2
                continue
            elif c in "\"'":
                # A digit separator (1'000) is not a literal, nor is a raw string's
                # content worth mutating; both are rare enough here to treat simply.
                quote = c
                chars[i] = " "
            i += 1
        out.append("".join(chars))
    return out


def sites_in(path):
    with open(os.path.join(ROOT, path), encoding="utf-8") as f:
        lines = f.read().split("\n")
    sites = []
    for number, (line, code) in enumerate(zip(lines, blank_code(lines)), start=1):
        stripped = code.strip()
        if not stripped or stripped.startswith("#") or "static_assert" in code:
            continue
        for name, pattern, _ in OPERATORS:
            for m in re.finditer(pattern, code):
                sites.append({"file": path, "line": number, "column": m.start(),
                              "operator": name, "text": line})
        if STATEMENT.match(code) and code.count("(") == code.count(")"):
            sites.append({"file": path, "line": number, "column": 0,
                          "operator": "statement removed", "text": line})
    return sites


def sample(seed):
    sites = [s for f in product_files() for s in sites_in(f)]
    random.Random(seed).shuffle(sites)
    return sites


def mutated_line(site, line):
    if site["operator"] == "statement removed":
        return STATEMENT.sub(lambda m: m.group(1) + ";", line)
    for name, pattern, replacement in OPERATORS:
        if name == site["operator"]:
            m = re.compile(pattern).match(line, site["column"])
            if not m:
                return None
            return line[:m.start()] + replacement + line[m.end():]
    return None


def locate(site, lines):
    """Index of the line carrying the site's text, nearest to where it was."""
    want = site["line"] - 1
    if 0 <= want < len(lines) and lines[want] == site["text"]:
        return want
    hits = [i for i, line in enumerate(lines) if line == site["text"]]
    return min(hits, key=lambda i: abs(i - want)) if hits else None


def run(cmd, timeout, **kw):
    try:
        return subprocess.run(cmd, timeout=timeout, stdout=subprocess.DEVNULL,
                              stderr=subprocess.DEVNULL, **kw).returncode
    except subprocess.TimeoutExpired:
        return "timeout"


def build(build_dir, jobs):
    return run(["cmake", "--build", build_dir, "-j", str(jobs), "--target", *TARGETS],
               3600) == 0


def run_suite(build_dir, timeout):
    """The first test program that fails, or None when all pass."""
    for program in TEST_PROGRAMS:
        status = run([os.path.join(build_dir, "bin", program), "--gtest_fail_fast",
                      "--gtest_brief=1"], timeout, cwd=build_dir)
        if status != 0:
            return program + (" (timed out)" if status == "timeout" else "")
    return None


def damaged_files():
    out = subprocess.run(["git", "status", "--porcelain", "--untracked-files=no"], cwd=ROOT,
                         check=True, capture_output=True, text=True).stdout
    return [line[3:] for line in out.splitlines()]


def try_site(site, build_dir, jobs, timeout):
    """Plants one fault; returns its outcome: caught, survived, no-build or gone."""
    path = os.path.join(ROOT, site["file"])
    with open(path, encoding="utf-8") as f:
        original = f.read()
    lines = original.split("\n")
    index = locate(site, lines)
    if index is None:
        return {"outcome": "gone"}
    changed = mutated_line(site, lines[index])
    if changed is None or changed == lines[index]:
        return {"outcome": "gone"}
    lines[index] = changed
    try:
        with open(path, "w", encoding="utf-8") as f:
            f.write("\n".join(lines))
        if not build(build_dir, jobs):
            return {"outcome": "no-build"}
        caught_by = run_suite(build_dir, timeout)
        outcome = {"outcome": "caught" if caught_by else "survived", "mutant": changed}
        if caught_by:
            outcome["caught_by"] = caught_by
        return outcome
    finally:
        with open(path, "w", encoding="utf-8") as f:
            f.write(original)
        damaged = damaged_files()
        if damaged:
            subprocess.run(["git", "checkout", "--", *damaged], cwd=ROOT, check=True)
            print(f"  restored what the fault damaged: {', '.join(damaged)}", flush=True)


def main():
    parser = argparse.ArgumentParser(description=__doc__.split("\n\n")[0])
    parser.add_argument("--seed", type=int, default=20261207)
    parser.add_argument("--count", type=int, default=60)
    parser.add_argument("--build-dir", default=os.path.join(ROOT, "build", "mutate"))
    parser.add_argument("--jobs", type=int, default=os.cpu_count() or 2)
    parser.add_argument("--timeout", type=int, default=120,
                        help="seconds for each test program")
    parser.add_argument("--out", help="JSON file for the sample and outcomes")
    parser.add_argument("--replay", help="JSON file of an earlier run to plant again")
    parser.add_argument("--list", action="store_true", help="only list the candidates")
    args = parser.parse_args()

    if args.replay:
        with open(args.replay, encoding="utf-8") as f:
            previous = json.load(f)
        candidates = [r["site"] for r in previous["results"] if r["outcome"] != "no-build"]
        args.seed = previous["seed"]
        wanted = len(candidates)
    else:
        candidates = sample(args.seed)
        wanted = args.count
    if args.list:
        for s in candidates[:wanted]:
            print(f'{s["file"]}:{s["line"]}: {s["operator"]}: {s["text"].strip()}')
        return 0

    if damaged_files():
        print("commit or stash the changes to tracked files first: every tracked file is "
              "checked out again after each fault", file=sys.stderr)
        return 2
    if not os.path.exists(os.path.join(args.build_dir, "CMakeCache.txt")):
        subprocess.run(["cmake", "-S", ROOT, "-B", args.build_dir, "-DCMAKE_BUILD_TYPE=Debug",
                        "-DZR_BENCH=OFF"], check=True, stdout=subprocess.DEVNULL)
    if not build(args.build_dir, args.jobs) or run_suite(args.build_dir, args.timeout):
        print("the unchanged tree must build and pass first", file=sys.stderr)
        return 2

    results = []
    planted = 0
    started = time.time()
    try:
        for site in candidates:
            if planted >= wanted:
                break
            result = try_site(site, args.build_dir, args.jobs, args.timeout)
            result["site"] = site
            results.append(result)
            if result["outcome"] in ("caught", "survived"):
                planted += 1
            where = f'{site["file"]}:{site["line"]} {site["operator"]}'
            print(f'[{planted}/{wanted}] {result["outcome"]:8} {where}', flush=True)
    finally:
        build(args.build_dir, args.jobs)  # leave the tree built from the real sources

    caught = [r for r in results if r["outcome"] == "caught"]
    survived = [r for r in results if r["outcome"] == "survived"]
    gone = [r for r in results if r["outcome"] == "gone"]
    share = 100.0 * len(caught) / planted if planted else 0.0
    print(f"\n{len(caught)} of {planted} faults caught ({share:.1f} %), "
          f"{len(results) - planted - len(gone)} did not build, {len(gone)} gone; "
          f"{time.time() - started:.0f} s")
    for r in survived:
        s = r["site"]
        print(f'survived: {s["file"]}:{s["line"]}: {s["operator"]}: {s["text"].strip()}')
    for r in gone:
        s = r["site"]
        print(f'gone: {s["file"]}:{s["line"]}: {s["operator"]}: {s["text"].strip()}')
    if args.out:
        with open(args.out, "w", encoding="utf-8") as f:
            json.dump({"seed": args.seed, "planted": planted, "caught": len(caught),
                       "results": results}, f, indent=1)
    return 0


if __name__ == "__main__":
    sys.exit(main())
