#!/usr/bin/env bash
# Installs what is missing, builds zrdict and the plug-in (Release), and reads the
# example purchase-order schema.
set -euo pipefail
source "$(dirname "${BASH_SOURCE[0]}")/setup.sh"

zr_install_packages
build="$ZR_ROOT/build/example"
zr_build "$build" -DCMAKE_BUILD_TYPE=Release -DZR_TESTS=OFF -DZR_BENCH=OFF

echo "== zrdict read examples/purchase-order.xsd"
cd "$ZR_ROOT"
"$build/bin/zrdict" read examples/purchase-order.xsd
