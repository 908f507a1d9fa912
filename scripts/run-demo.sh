#!/usr/bin/env bash
# Builds Quimbel and runs its main job on the bundled example group (examples/demo/Demo.vbg).
set -euo pipefail
cd "$(dirname "$0")/.."
scripts/install-deps.sh
cmake -S . -B build -G Ninja
cmake --build build
build/bin/quimbel list examples/demo/Demo.vbg
