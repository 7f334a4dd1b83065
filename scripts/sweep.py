#!/usr/bin/env python3
"""Reads every .xsd under a folder with `zrdict read --format json`, each file as the
main document, under a time and a memory limit per read, and prints a summary.

    scripts/sweep.py FOLDER [TIMEOUT_S] [MEM_MB] [-- ZRDICT_ARG...]

TIMEOUT_S defaults to 30 and MEM_MB (address-space limit of each read) to 1024.
Arguments after "--" go to every `zrdict read` before the document, for example
`-- --option SchemaCatalog=corpus/musicxml-4.0/catalog.xml` to sweep a set with its
catalog (relative paths are taken from the folder the sweep runs in).
Environment: ZRDICT names the zrdict program (default: the one in build/example or
build/werror, the trees of run-example.sh and run-tests.sh), JOBS the
number of reads run at once (default 2), SWEEP_RESULTS a file that receives one
tab-separated line per document (outcome, exit status, seconds, peak KB, path, reason);
the peak resident size is sampled every few milliseconds, so it may miss a short peak.
Use a build without sanitizers: the address sanitizer reserves far more address space
than any sensible limit.

Outcomes: read (status 0); failed with a logged reason (status 19 and an error
message, grouped by the first error with paths, positions and names stripped);
failed silently (status 19 without an error message); crashed (killed by a signal);
timed out; out of memory (the limit was hit: std::bad_alloc, or a logged
out-of-memory message); other (any other exit status, or output that is not the
JSON document the contract promises). The exit status is 0 when nothing but the
first two outcomes occurred, 1 otherwise.
"""

import collections
import concurrent.futures
import json
import os
import re
import shutil
import signal
import sys
import tempfile
import threading
import time

ROOT = os.path.dirname(os.path.dirname(os.path.abspath(__file__)))
PRLIMIT = shutil.which("prlimit") or "/usr/bin/prlimit"

# The plug-in's own messages, reduced to their formats so that reads failing for the
# same reason group together whatever names they mention.
KNOWN_FORMATS = [
    (re.compile(r"^Unable to find complex type .*$", re.S), "Unable to find complex type %S"),
    (re.compile(r"^Unable to find group .*$", re.S), "Unable to find group %S"),
    (re.compile(r"^Failed to look up ref to .*$", re.S), "Failed to look up ref to %S:%S"),
    (re.compile(r"^Lookup of type '.*' \(ns '.*'\) failed for field '.*'$", re.S),
     "Lookup of type '%s' (ns '%s') failed for field '%s'"),
    (re.compile(r"^Error resolving simple type .*$", re.S), "Error resolving simple type %S"),
    (re.compile(r"^Circular reference to group .*$", re.S), "Circular reference to group %S"),
    (re.compile(r"^Circular reference to element .*$", re.S),
     "Circular reference to element %S:%S"),
    (re.compile(r"^Circular base type chain at complex type .*$", re.S),
     "Circular base type chain at complex type %S"),
    (re.compile(r"^Circular base type chain at simple type .*$", re.S),
     "Circular base type chain at simple type %S"),
    (re.compile(r"^Schema nesting deeper than \d+ levels at .*$", re.S),
     "Schema nesting deeper than %d levels at %S"),
    (re.compile(r"^Schema: Error: External entity '.*' in file .* is not read$", re.S),
     "Schema: Error: External entity '%s' in file %s is not read"),
    (re.compile(r"^Schema: Error: Entity '.*' in file .* is longer than \d+ characters$", re.S),
     "Schema: Error: Entity '%s' in file %s is longer than %d characters"),
    (re.compile(r"^Schema: Error: Declarations and types nested deeper than \d+ in file .*$",
                re.S), "Schema: Error: Declarations and types nested deeper than %d in file %s"),
    (re.compile(r"^Schema: Out of memory reading file .*$", re.S),
     "Schema: Out of memory reading file %s"),
    (re.compile(r"^Schema: Error: Include of '.*' in file .* is not read: it is not a local file.*$",
                re.S), "Schema: Error: Include of '%s' in file %s is not read: not a local file"),
    (re.compile(r"^Schema: Error: Include of '.*' in file .* is not read: the catalog maps it.*$",
                re.S), "Schema: Error: Include of '%s' in file %s is not read: the catalog maps "
                       "it to a network location"),
    (re.compile(r"^Schema: Error: Catalog file .* is not read: .*$", re.S),
     "Schema: Error: Catalog file %s is not read: %s"),
    (re.compile(r"^Schema: Error: Reading file .* stopped: entity references expand the "
                r"document beyond .*$", re.S),
     "Schema: Error: Reading file %s stopped: entity references expand the document beyond %d "
     "characters"),
]
PARSER_MESSAGE = re.compile(
    r"^(Schema: (?:Warning|Error|Fatal): )At line -?\d+, column -?\d+ of file (.*?): (.*)$", re.S)


def reason_key(text):
    """A message with what varies from document to document taken out."""
    m = PARSER_MESSAGE.match(text)
    if m:
        head, path, rest = m.groups()
        if path:
            rest = rest.replace(path, "<path>")
        text = head + "At line #, column # of file <path>: " + rest
    else:
        for pattern, fmt in KNOWN_FORMATS:
            if pattern.match(text):
                return fmt
    text = re.sub(r"(?:file://)?/[^\s'\"]+", "<path>", text)
    text = re.sub(r"'[^']*'", "'…'", text)
    text = re.sub(r'"[^"]*"', '"…"', text)
    text = re.sub(r"\d+", "#", text)
    return text


def sampled_peak_kb(pid):
    """The peak resident size of a running process so far, in KB; 0 once it is gone.

    Read from /proc rather than from wait4's rusage, which would also count the memory
    of this script: a spawned child starts from its parent's high-water mark."""
    try:
        with open("/proc/%d/status" % pid) as f:
            for line in f:
                if line.startswith("VmHWM:"):
                    return int(line.split()[1])
    except (OSError, ValueError):
        pass
    return 0


def run_one(zrdict, extra_args, path, timeout_s, mem_mb, scratch):
    """Reads one document; returns (outcome, status, seconds, peak_kb, reason)."""
    out_path = os.path.join(scratch, "out-%d" % threading.get_ident())
    limit = mem_mb * 1024 * 1024
    # prlimit applies the limits to the read itself (it execs zrdict), and posix_spawn
    # runs no Python code in the child, which matters with reader threads around.
    argv = ([PRLIMIT, "--as=%d" % limit, "--core=0", "--", zrdict, "read", "--format", "json"] +
            extra_args + [path])
    start = time.monotonic()
    with open(out_path + ".json", "wb") as out, open(out_path + ".err", "wb") as err:
        pid = os.posix_spawn(PRLIMIT, argv, os.environ,
                             file_actions=[(os.POSIX_SPAWN_DUP2, out.fileno(), 1),
                                           (os.POSIX_SPAWN_DUP2, err.fileno(), 2)])
        timed_out = False
        peak_kb = 0
        while True:
            done, wstatus, _ = os.wait4(pid, os.WNOHANG)
            if done:
                break
            peak_kb = max(peak_kb, sampled_peak_kb(pid))
            if time.monotonic() - start > timeout_s:
                os.kill(pid, signal.SIGKILL)
                _, wstatus, _ = os.wait4(pid, 0)
                timed_out = True
                break
            time.sleep(0.005)
    seconds = time.monotonic() - start
    with open(out_path + ".json", "rb") as f:
        stdout = f.read().decode("utf-8", "replace")
    with open(out_path + ".err", "rb") as f:
        stderr = f.read().decode("utf-8", "replace")
    os.unlink(out_path + ".json")
    os.unlink(out_path + ".err")

    if timed_out:
        return "timed out", None, seconds, peak_kb, ""
    memory_hint = re.search(r"bad_alloc|[Oo]ut of memory|OutOfMemory", stderr)
    if os.WIFSIGNALED(wstatus):
        sig = os.WTERMSIG(wstatus)
        if memory_hint:
            return "out of memory", -sig, seconds, peak_kb, memory_hint.group(0)
        return "crashed", -sig, seconds, peak_kb, signal.Signals(sig).name
    status = os.WEXITSTATUS(wstatus)
    try:
        doc = json.loads(stdout)
        messages = doc["messages"]
        json_status = doc["status"]
    except (ValueError, KeyError, TypeError):
        if memory_hint:
            return "out of memory", status, seconds, peak_kb, memory_hint.group(0)
        return "other", status, seconds, peak_kb, "no JSON document (%s)" % stderr.strip()[:200]
    if any(m.get("code") == 5 and m.get("severity", 0) >= 4 for m in messages):
        return "out of memory", status, seconds, peak_kb, "logged out of memory"
    if status == 0 and json_status == 0:
        return "read", 0, seconds, peak_kb, ""
    if status == 19 and json_status == 19:
        errors = [m for m in messages if m.get("severity") in (4, 8)]
        if not errors:
            return "failed silently", 19, seconds, peak_kb, ""
        return "failed with a logged reason", 19, seconds, peak_kb, reason_key(errors[0]["text"])
    return "other", status, seconds, peak_kb, "exit %d, JSON status %s" % (status, json_status)


def main(argv):
    extra_args = []
    if "--" in argv:
        at = argv.index("--")
        argv, extra_args = argv[:at], argv[at + 1:]
    if len(argv) < 2 or len(argv) > 4:
        sys.stderr.write(__doc__)
        return 2
    folder = argv[1]
    timeout_s = float(argv[2]) if len(argv) > 2 else 30.0
    mem_mb = int(argv[3]) if len(argv) > 3 else 1024
    zrdict = os.environ.get("ZRDICT") or next(
        (p for p in (os.path.join(ROOT, "build", d, "bin", "zrdict") for d in ("example", "werror"))
         if os.access(p, os.X_OK)), os.path.join(ROOT, "build", "example", "bin", "zrdict"))
    jobs = int(os.environ.get("JOBS", "2"))
    if not os.access(zrdict, os.X_OK):
        sys.stderr.write("zrdict not found at %s (set ZRDICT)\n" % zrdict)
        return 2

    files = []
    for dirpath, dirnames, filenames in os.walk(folder):
        dirnames.sort()
        files.extend(os.path.join(dirpath, n) for n in sorted(filenames) if n.endswith(".xsd"))
    if not files:
        sys.stderr.write("no .xsd files under %s\n" % folder)
        return 2

    started = time.monotonic()
    results = []
    with tempfile.TemporaryDirectory(prefix="zrsweep-") as scratch:
        with concurrent.futures.ThreadPoolExecutor(max_workers=jobs) as pool:
            futures = {pool.submit(run_one, zrdict, extra_args, os.path.abspath(f), timeout_s,
                                   mem_mb, scratch): f for f in files}
            for n, future in enumerate(concurrent.futures.as_completed(futures), 1):
                results.append((futures[future],) + future.result())
                if sys.stderr.isatty() and n % 50 == 0:
                    sys.stderr.write("\r%d/%d" % (n, len(files)))
    if sys.stderr.isatty():
        sys.stderr.write("\r")
    elapsed = time.monotonic() - started
    results.sort()

    if os.environ.get("SWEEP_RESULTS"):
        with open(os.environ["SWEEP_RESULTS"], "w", encoding="utf-8") as f:
            for path, outcome, status, seconds, peak_kb, reason in results:
                f.write("%s\t%s\t%.3f\t%d\t%s\t%s\n" % (outcome, status, seconds, peak_kb, path,
                                                        reason.replace("\n", " ")))

    order = ["read", "failed with a logged reason", "failed silently", "crashed", "timed out",
             "out of memory", "other"]
    counts = collections.Counter(r[1] for r in results)
    print("Sweep of %s: %d documents, limits %gs and %d MB per read, %d at a time, %.0fs"
          % (folder, len(results), timeout_s, mem_mb, jobs, elapsed))
    if extra_args:
        print("zrdict arguments: %s" % " ".join(extra_args))
    print()
    print("| outcome | documents |")
    print("|---|---:|")
    for outcome in order:
        print("| %s | %d |" % (outcome, counts.get(outcome, 0)))

    reasons = collections.Counter(r[5] for r in results if r[1] == "failed with a logged reason")
    if reasons:
        print()
        print("| first logged error of the failed reads | documents |")
        print("|---|---:|")
        for reason, count in reasons.most_common():
            print("| %s | %d |" % (reason.replace("|", "\\|").replace("\n", " "), count))

    bad = [r for r in results if r[1] not in ("read", "failed with a logged reason")]
    if bad:
        print()
        print("Documents that need a look:")
        for path, outcome, status, seconds, peak_kb, reason in bad:
            print("  %s (%s, %s): %s" % (outcome, status, reason, path))

    print()
    print("Slowest reads:")
    for r in sorted(results, key=lambda r: -r[3])[:5]:
        print("  %.2fs %6d KB  %s" % (r[3], r[4], r[0]))
    print("Largest peak memory:")
    for r in sorted(results, key=lambda r: -r[4])[:5]:
        print("  %6d KB %.2fs  %s" % (r[4], r[3], r[0]))
    return 1 if bad else 0


if __name__ == "__main__":
    sys.exit(main(sys.argv))
