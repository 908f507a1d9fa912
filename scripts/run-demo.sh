#!/usr/bin/env bash
# Builds Quimbel and runs its main job on the bundled example group (examples/demo/Demo.vbg).
set -euo pipefail
cd "$(dirname "$0")/.."
scripts/install-deps.sh
cmake -S . -B build -G Ninja
cmake --build build
build/bin/quimbel list examples/demo/Demo.vbg

# The desktop IDE in script mode, headless, on a copy of the example group: screenshots go to build/screenshots/.
rm -rf build/ide-demo && cp -r examples/demo build/ide-demo
QT_QPA_PLATFORM=offscreen DEMO=build/ide-demo SHOTS=build/screenshots \
  build/bin/quimbel-ide --script scripts/ide-demo.qis
echo "Screenshots of quimbel-ide: build/screenshots/"
