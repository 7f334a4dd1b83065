#!/usr/bin/env python3
"""Times whole zrdict processes against the floor process over the same documents.

    bench/zrdict_bench.py                        the generated 10,000-type set
    bench/zrdict_bench.py --sizes 1000,10000     other generated sizes
    bench/zrdict_bench.py --schema main.xsd      a real schema set (repeatable)

Builds zrdict, the plug-in, zrgen and zrfloor (Release, in build-bench/ or
$ZR_BENCH_BUILD_DIR, as bench/run.sh does) unless --bin-dir names built ones, and
generates each set into a temporary folder. Then, in rounds whose order is shuffled,
it runs zrfloor (the reader's parser over the set's documents and nothing else) and
`zrdict read --format F` for each format, standard output to /dev/null. Per process it
keeps the fastest CPU time (user + system) and elapsed time over the rounds and the
highest peak resident memory (the kernel's ru_maxrss), and prints one table and the
targets:

    json / floor <= 2.5            CPU time of the whole processes
    text <= json, tree <= json     CPU time
    json peak memory <= 4 x text   the set's schema text, all documents

The exit status is 1 when a process fails (the targets are reported, not enforced).
"""
import argparse
import os
import random
import shutil
import subprocess
import sys
import tempfile
import time

ROOT = os.path.dirname(os.path.dirname(os.path.abspath(__file__)))
FORMATS = ["json", "text", "tree", "dot"]
MB = 1024.0 * 1024.0


def build(build_dir):
    """Builds the programs in a Release tree, as bench/run.sh does; returns bin/."""
    cache = os.path.join(build_dir, "CMakeCache.txt")
    if not os.path.exists(cache):
        subprocess.run(["cmake", "-S", ROOT, "-B", build_dir, "-DCMAKE_BUILD_TYPE=Release",
                        "-DZR_TESTS=OFF", "-DZR_BENCH=ON"], check=True, stdout=sys.stderr)
    elif "CMAKE_BUILD_TYPE:STRING=Release\n" not in open(cache).read():
        sys.exit(f"zrdict_bench: {build_dir} is not a Release build; "
                 "set ZR_BENCH_BUILD_DIR to another folder")
    subprocess.run(["cmake", "--build", build_dir, "-j2", "--target", "zrdict", "zrbxmls",
                    "zrgen", "zrfloor"], check=True, stdout=sys.stderr)
    return os.path.join(build_dir, "bin")


class Run:
    def __init__(self, cpu, elapsed, maxrss):
        self.cpu = cpu  # seconds, user + system
        self.elapsed = elapsed  # seconds
        self.maxrss = maxrss  # bytes


# The kernel starts a program's peak from the peak of the process that executes it,
# so a process started from this script would inherit the script's own. GNU time
# forks the program from a process a few hundred kilobytes large and reports the
# program's own peak; its CPU time, which wait4 adds to its own, is next to none.
GNU_TIME = "/usr/bin/time"


def run_once(command):
    """Runs `command` with stdout to /dev/null; its CPU time, elapsed time and peak
    resident memory, from the kernel's accounting of the process."""
    with open(os.devnull, "wb") as devnull, tempfile.TemporaryFile() as err, \
            tempfile.NamedTemporaryFile(mode="r") as peak:
        spawned = [GNU_TIME, "-q", "-f", "%M", "-o", peak.name] + command
        start = time.perf_counter()
        pid = os.posix_spawn(spawned[0], spawned, os.environ,
                             file_actions=[(os.POSIX_SPAWN_DUP2, devnull.fileno(), 1),
                                           (os.POSIX_SPAWN_DUP2, err.fileno(), 2)])
        _, status, usage = os.wait4(pid, 0)
        elapsed = time.perf_counter() - start
        code = os.waitstatus_to_exitcode(status)
        if code != 0:
            err.seek(0)
            raise RuntimeError(f"{' '.join(command)} exited {code}: "
                               f"{err.read().decode(errors='replace')[:2000]}")
        maxrss_kib = int(peak.read().split()[-1])
    return Run(usage.ru_utime + usage.ru_stime, elapsed, maxrss_kib * 1024)


def measure_set(label, main_path, bins, formats, repetitions):
    """Times the floor and each format on one set; returns a result dict."""
    floor = [os.path.join(bins, "zrfloor"), main_path]
    listed = subprocess.run(floor[:1] + ["--list"] + floor[1:], check=True,
                            capture_output=True, text=True).stdout.split("\n")
    documents = [d for d in listed if d]
    text_bytes = sum(os.path.getsize(d) for d in documents)
    commands = {"floor": floor}
    for fmt in formats:
        commands[fmt] = [os.path.join(bins, "zrdict"), "read", "--format", fmt, main_path]

    runs = {name: [] for name in commands}
    order = list(commands)
    for _ in range(repetitions):
        random.shuffle(order)
        for name in order:
            runs[name].append(run_once(commands[name]))
    best = {name: Run(min(r.cpu for r in rs), min(r.elapsed for r in rs),
                      max(r.maxrss for r in rs)) for name, rs in runs.items()}
    return {"label": label, "documents": len(documents), "text": text_bytes, "best": best}


def print_table(results, formats):
    names = ["floor"] + formats
    print("\nfastest of the rounds; CPU time (user + system) of each whole process "
          "unless marked elapsed; peak = most resident memory")
    head = ["set", "text MB", "docs"] + [f"{n} ms" for n in names] + \
        ["json/floor", "json/floor elapsed", "text/json", "tree/json"] + \
        [f"{n} peak MB" for n in ("floor", "json")] + ["json peak/text"]
    print("| " + " | ".join(head) + " |")
    print("|" + "---|" * len(head))
    for r in results:
        b = r["best"]
        row = [r["label"], f"{r['text'] / MB:.2f}", str(r["documents"])]
        row += [f"{b[n].cpu * 1e3:.0f}" for n in names]
        row += [f"{b['json'].cpu / b['floor'].cpu:.2f}",
                f"{b['json'].elapsed / b['floor'].elapsed:.2f}"]
        row += [f"{b[n].cpu / b['json'].cpu:.2f}" if n in b else "-" for n in ("text", "tree")]
        row += [f"{b['floor'].maxrss / MB:.1f}", f"{b['json'].maxrss / MB:.1f}",
                f"{b['json'].maxrss / r['text']:.2f}"]
        print("| " + " | ".join(row) + " |")

    print()
    for r in results:
        b = r["best"]
        checks = [("json/floor <= 2.5", b["json"].cpu / b["floor"].cpu, 2.5)]
        for fmt in ("text", "tree"):
            if fmt in b:
                checks.append((f"{fmt}/json <= 1", b[fmt].cpu / b["json"].cpu, 1.0))
        checks.append(("json peak/text <= 4", b["json"].maxrss / r["text"], 4.0))
        for name, value, limit in checks:
            print(f"target {name:<22} at {r['label']:<10} {value:6.2f}  "
                  f"{'met' if value <= limit else 'MISSED'}")


def main():
    parser = argparse.ArgumentParser(description=__doc__.split("\n")[0])
    parser.add_argument("--sizes", default=None,
                        help="generated sets, complex types (default 10000; none with --schema)")
    parser.add_argument("--schema", action="append", default=[],
                        help="also a real schema and what it includes (repeatable)")
    parser.add_argument("--repetitions", type=int, default=7, help="rounds (default 7)")
    parser.add_argument("--formats", default=",".join(FORMATS),
                        help="zrdict formats to time (json always; default all)")
    parser.add_argument("--bin-dir", help="built programs to use instead of building")
    args = parser.parse_args()

    formats = ["json"] + [f for f in args.formats.split(",") if f and f != "json"]
    if any(f not in FORMATS for f in formats):
        parser.error(f"formats are {', '.join(FORMATS)}")
    sizes = [int(s) for s in args.sizes.split(",")] if args.sizes else \
        ([] if args.schema else [10000])
    if not os.access(GNU_TIME, os.X_OK):
        sys.exit(f"zrdict_bench: needs GNU time ({GNU_TIME}, Debian package time)")
    bins = args.bin_dir or build(os.environ.get("ZR_BENCH_BUILD_DIR",
                                                os.path.join(ROOT, "build-bench")))

    results = []
    work = tempfile.mkdtemp(prefix="zrdict-bench-")
    try:
        for size in sizes:
            folder = os.path.join(work, str(size))
            subprocess.run([os.path.join(bins, "zrgen"), str(size), folder], check=True,
                           stdout=subprocess.DEVNULL)
            results.append(measure_set(f"{size:,}", os.path.join(folder, "main.xsd"), bins,
                                       formats, args.repetitions))
            shutil.rmtree(folder)
        for schema in args.schema:
            results.append(measure_set(os.path.basename(schema), os.path.abspath(schema), bins,
                                       formats, args.repetitions))
    except (RuntimeError, subprocess.CalledProcessError) as e:
        print(f"zrdict_bench: {e}", file=sys.stderr)
        return 1
    finally:
        shutil.rmtree(work, ignore_errors=True)
    print_table(results, formats)
    return 0


if __name__ == "__main__":
    sys.exit(main())
