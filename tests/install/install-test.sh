#!/usr/bin/env bash
# The installation as a user gets it, from the build folder BUILD:
#
#   install-test.sh stage BUILD STAGE            cmake --install into STAGE (fresh)
#   install-test.sh zrdict STAGE                 the installed zrdict, on an installed
#                                                example, with its own plug-in
#   install-test.sh host STAGE WORK [FLAGS]      a host program built against STAGE,
#                                                with find_package and pkg-config
#   install-test.sh package BUILD WORK           cpack's .deb: its dependencies, and
#                                                its zrdict run where it is unpacked
#
# FLAGS are extra compiler and linker flags (a sanitized tree's).
set -euo pipefail
here="$(cd "$(dirname "${BASH_SOURCE[0]}")" && pwd)"

fail() {
    echo "install-test: $*" >&2
    exit 1
}

# Runs zrdict from PREFIX on its own example and checks which plug-in and host
# libraries it used: those of PREFIX, never the build tree's.
check_zrdict() {
    local prefix="$1"
    local zrdict="$prefix/bin/zrdict"
    [[ -x "$zrdict" ]] || fail "no $zrdict"
    local out
    out="$(LD_DEBUG=files "$zrdict" read --format tree "$prefix/share/zrbxmls/examples/order.xsd" \
        2> "$prefix.ld-debug")"
    [[ "$out" == "order (length 0)"* ]] || fail "unexpected output: $out"
    grep -q "file=$prefix/lib/libzrbxmls.so .*dynamically loaded" "$prefix.ld-debug" ||
        fail "zrdict did not load $prefix/lib/libzrbxmls.so"
    rm -f "$prefix.ld-debug"
    local libraries
    libraries="$(ldd "$zrdict")"
    [[ "$libraries" == *"libzrapi.so => $prefix/bin/../lib/libzrapi.so"* ]] ||
        fail "zrdict does not take the host libraries from $prefix/lib: $libraries"
    out="$("$zrdict" read --format json "$prefix/share/zrbxmls/examples/purchase-order.xsd")"
    [[ "$out" == *'"status": 0'* ]] || fail "the installed zrdict cannot read the example"
}

case "${1:-}" in
stage)
    build="$2" stage="$3"
    rm -rf "$stage"
    cmake --install "$build" --prefix "$stage" > /dev/null
    for file in bin/zrdict lib/libzrbxmls.so lib/libzrapi.so lib/libzrutil.so \
        include/zrbxmls/zrapi.h lib/cmake/zrbxmls/zrbxmlsConfig.cmake \
        lib/pkgconfig/zrbxmls.pc share/zrbxmls/examples/order.xsd; do
        [[ -e "$stage/$file" ]] || fail "$file is not installed"
    done
    ;;
zrdict)
    check_zrdict "$2"
    ;;
host)
    stage="$2" work="$3" flags="${4:-}"
    rm -rf "$work"
    mkdir -p "$work"
    schema="$stage/share/zrbxmls/examples/order.xsd"
    cmake -S "$here/host" -B "$work/cmake" -DCMAKE_PREFIX_PATH="$stage" \
        -DCMAKE_CXX_FLAGS="$flags" -DCMAKE_EXE_LINKER_FLAGS="$flags" > "$work/configure.log" ||
        { cat "$work/configure.log"; fail "find_package(zrbxmls) failed"; }
    cmake --build "$work/cmake" > "$work/build.log" ||
        { cat "$work/build.log"; fail "building against the package failed"; }
    out="$("$work/cmake/tinyhost" "$schema")"
    [[ "$out" == $'order 3\nitem 2' ]] || fail "tinyhost (CMake) printed: $out"

    export PKG_CONFIG_PATH="$stage/lib/pkgconfig"
    # shellcheck disable=SC2046 # pkg-config's words are separate arguments
    c++ -std=c++17 $flags -o "$work/tinyhost-pc" "$here/host/tinyhost.cpp" \
        $(pkg-config --cflags --libs zrbxmls) -ldl
    plugin="$(pkg-config --variable=plugin zrbxmls)"
    out="$(LD_LIBRARY_PATH="$stage/lib" "$work/tinyhost-pc" "$schema" "$plugin")"
    [[ "$out" == $'order 3\nitem 2' ]] || fail "tinyhost (pkg-config) printed: $out"
    ;;
package)
    build="$2" work="$3"
    rm -rf "$work"
    cpack -G DEB --config "$build/CPackConfig.cmake" -B "$work" > "$work.log" 2>&1 ||
        { cat "$work.log"; fail "cpack failed"; }
    rm -f "$work.log"
    deb="$(ls "$work"/zrbxmls_*.deb)"
    depends="$(dpkg-deb -f "$deb" Depends)"
    [[ "$depends" == *libxerces-c3.2* ]] || fail "Depends lacks the Xerces-C runtime: $depends"
    if readelf -d "$build/bin/zrdict" | grep -q 'libmimalloc'; then
        [[ "$depends" == *libmimalloc* ]] || fail "Depends lacks zrdict's allocator: $depends"
    fi
    dpkg-deb -x "$deb" "$work/root"
    check_zrdict "$work/root/usr"
    ;;
*)
    sed -n '2,12p' "${BASH_SOURCE[0]}" >&2
    exit 2
    ;;
esac
