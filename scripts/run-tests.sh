#!/usr/bin/env bash
# Installs what is missing, checks the C++ layout, then builds and runs the whole
# test suite twice: once with warnings as errors, once under the address and
# undefined-behaviour sanitizers; last, the threaded test of the unit tests under
# ThreadSanitizer. Stops at the first failure.
set -euo pipefail
source "$(dirname "${BASH_SOURCE[0]}")/setup.sh"

zr_install_packages
zr_check_format

werror="$ZR_ROOT/build/werror"
zr_build "$werror" -DCMAKE_BUILD_TYPE=RelWithDebInfo -DZR_WERROR=ON
echo "== ctest $werror"
ctest --test-dir "$werror" --output-on-failure -j "$ZR_JOBS"

sanitize="$ZR_ROOT/build/sanitize"
zr_build "$sanitize" -DCMAKE_BUILD_TYPE=Debug -DZR_WERROR=ON -DZR_SANITIZE=ON
echo "== ctest $sanitize (address, undefined)"
ASAN_OPTIONS=detect_leaks=1 \
UBSAN_OPTIONS=halt_on_error=1:print_stacktrace=1 \
    ctest --test-dir "$sanitize" --output-on-failure -j "$ZR_JOBS"

# Only the unit tests are built under ThreadSanitizer, and only the test that runs
# dictionaries on parallel threads is run there: the rest of the suite is
# single-threaded.
tsan="$ZR_ROOT/build/tsan"
echo "== configure $tsan -DZR_SANITIZE=thread"
cmake -S "$ZR_ROOT" -B "$tsan" -DCMAKE_BUILD_TYPE=RelWithDebInfo -DZR_WERROR=ON \
    -DZR_SANITIZE=thread -DZR_BENCH=OFF
echo "== build $tsan (zrtests)"
cmake --build "$tsan" -j "$ZR_JOBS" --target zrtests
echo "== $tsan: Concurrency.* (thread)"
TSAN_OPTIONS=halt_on_error=1:second_deadlock_stack=1 \
    "$tsan/bin/zrtests" --gtest_filter='Concurrency.*'
