#!/usr/bin/env bash
# Builds Quimbel and runs every test (unit, widget and end-to-end) headless.
set -euo pipefail
cd "$(dirname "$0")/.."
scripts/install-deps.sh
cmake -S . -B build -G Ninja
cmake --build build
export QT_QPA_PLATFORM=offscreen
ctest --test-dir build --output-on-failure --parallel 2
