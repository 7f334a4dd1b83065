#!/usr/bin/env bash
# Runs one fuzz target under libFuzzer for a number of seconds.
#
#   scripts/fuzz.sh TARGET SECONDS [LIBFUZZER_OPTION...]
#
# TARGET is document, include, pattern or names. The first run configures and builds
# a clang tree with -DZR_FUZZ=ON in build/fuzz/ (another folder with
# ZR_FUZZ_BUILD_DIR). New inputs the fuzzer finds go to BUILD/corpus/TARGET, failing
# inputs to BUILD/artifacts/TARGET/. Needs clang-14 and libclang-rt-14-dev.
set -euo pipefail

usage() {
    echo "usage: $0 document|include|pattern|names SECONDS [LIBFUZZER_OPTION...]" >&2
    exit 2
}

[[ $# -ge 2 ]] || usage
target=$1
seconds=$2
shift 2
[[ $seconds =~ ^[0-9]+$ ]] || usage

root=$(cd "$(dirname "$0")/.." && pwd)
build=${ZR_FUZZ_BUILD_DIR:-$root/build/fuzz}
cxx=${CXX:-clang++-14}

case $target in
document | include)
    max_len=65536
    dict=$root/fuzz/xsd.dict
    seeds=("$root/fuzz/corpus/$target" "$root/tests/data" "$root/examples")
    ;;
pattern)
    max_len=4096
    dict=$root/fuzz/pattern.dict
    seeds=("$root/fuzz/corpus/pattern")
    ;;
names)
    max_len=4096
    dict=
    seeds=("$root/fuzz/corpus/names")
    ;;
*) usage ;;
esac

# Two fuzzers started side by side share the build tree: build one at a time.
mkdir -p "$build"
(
    flock 9
    if [[ ! -f $build/CMakeCache.txt ]]; then
        CXX=$cxx cmake -S "$root" -B "$build" -DCMAKE_BUILD_TYPE=RelWithDebInfo \
            -DZR_FUZZ=ON -DZR_TESTS=OFF -DZR_BENCH=OFF
    fi
    cmake --build "$build" --target "fuzz_$target" -j "${ZR_JOBS:-2}"
) 9>"$build/.build-lock"

corpus=$build/corpus/$target
artifacts=$build/artifacts/$target
mkdir -p "$corpus" "$artifacts"
existing=()
for dir in "${seeds[@]}"; do
    [[ -d $dir ]] && existing+=("$dir")
done

options=(-max_total_time="$seconds" -max_len="$max_len" -rss_limit_mb=2048 -timeout=10
    -print_final_stats=1 -artifact_prefix="$artifacts/")
[[ -n $dict ]] && options+=(-dict="$dict")

export ASAN_OPTIONS=${ASAN_OPTIONS:-detect_leaks=1:halt_on_error=1}
export UBSAN_OPTIONS=${UBSAN_OPTIONS:-halt_on_error=1:print_stacktrace=1}
exec "$build/bin/fuzz_$target" "${options[@]}" "$@" "$corpus" "${existing[@]}"
