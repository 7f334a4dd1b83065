#!/usr/bin/env bash
# Runs the schema-read benchmarks: builds zrbench (Release) when needed, generates
# sets of 1,000, 10,000 and 100,000 complex types into a temporary folder, and
# prints, per set, the bare parser's time (the floor), the full read's time, their
# ratio and the read's peak heap against the schema text's size.
#
#   bench/run.sh                         the three sizes (about a minute on 2 cores)
#   bench/run.sh --sizes 1000,10000      other sizes
#   bench/run.sh --schema a.xsd          a real schema and what it includes
#   bench/run.sh --help                  every option of zrbench
#
# ZR_BENCH_BUILD_DIR chooses the build folder (default: build-bench in the
# repository). Generated sets go to $TMPDIR (or /tmp), never into the repository.
set -euo pipefail

root="$(cd "$(dirname "${BASH_SOURCE[0]}")/.." && pwd)"
build="${ZR_BENCH_BUILD_DIR:-$root/build-bench}"

if [[ ! -f "$build/CMakeCache.txt" ]]; then
    cmake -S "$root" -B "$build" -DCMAKE_BUILD_TYPE=Release -DZR_TESTS=OFF -DZR_BENCH=ON
elif ! grep -q '^CMAKE_BUILD_TYPE:STRING=Release$' "$build/CMakeCache.txt"; then
    echo "run.sh: $build is not a Release build; set ZR_BENCH_BUILD_DIR to another folder" >&2
    exit 1
fi
cmake --build "$build" -j2 --target zrbench >&2

# Without arguments, a multi-namespace set joins the generated ones when the shared
# real-world sets are beside the repository: UBL's invoice and the documents it imports.
ubl="$root/../shared/corpus/ubl-2.5/xsdrt/maindoc/UBL-Invoice-2.5.xsd"
if [[ $# -eq 0 && -f "$ubl" ]]; then
    set -- --sizes 1000,10000,100000 --schema "$ubl"
fi
exec "$build/bin/zrbench" "$@"
