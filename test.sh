#!/usr/bin/env bash
# The one test command: installs what is missing, builds, and runs every test.
set -euo pipefail
cd "$(dirname "$0")"

scripts/install.sh build screen test

for preset in sanitize release; do
    [ -e "build/$preset/build.ninja" ] || cmake --preset "$preset"
    cmake --build --preset "$preset"
done

status=0
echo "== Unit tests under address and undefined-behaviour sanitizers"
ctest --preset sanitize --parallel "$(nproc)" || status=1
echo "== All tests"
ctest --preset release --parallel "$(nproc)" || status=1
exit "$status"
