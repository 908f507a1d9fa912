#!/usr/bin/env bash
# SPDX-License-Identifier: MIT
# `quimbel list` on one generated module of 250,000, 1,000,000 and 2,000,000 code lines: the listing must
# grow in proportion to the module. Target: the processor time per line at 2,000,000 lines stays within
# 1.5 times the time per line at 250,000 (a step that grows with members times procedures shows at once:
# before it was removed, 2,000,000 lines took 40 times as long as 250,000).
#
# Usage: bench/cli/list_scaling.sh [BUILD_DIR]   (default: build; build it in Release first)
set -euo pipefail

source "$(dirname "$0")/../tools.sh" "${1:-build}"

sizes=(250000 1000000 2000000)
# Processor time (user + system) is what grows with the work; the wall clock of a busy machine is shown too.
TIMEFORMAT='%R %U %S'
results=()
for lines in "${sizes[@]}"; do
  "$generator" --lines "$lines" --components 1 --seed 7 "$work/g$lines" > /dev/null
  module=$(find "$work/g$lines" -name '*.bas' | head -n 1)
  best_cpu=""
  best_wall=""
  for run in 1 2 3; do
    read -r wall user sys < <({ time "$quimbel" list "$module" > /dev/null; } 2>&1)
    cpu=$(awk -v u="$user" -v s="$sys" 'BEGIN { print u + s }')
    if [ -z "$best_cpu" ] || awk -v a="$cpu" -v b="$best_cpu" 'BEGIN { exit !(a < b) }'; then
      best_cpu=$cpu
      best_wall=$wall
    fi
  done
  results+=("$lines $best_cpu $best_wall")
  rm -rf "$work/g$lines"
done

printf '%s\n' "${results[@]}" | awk '
  { lines[NR] = $1; cpu[NR] = $2; wall[NR] = $3 }
  END {
    printf "quimbel list on one module (best of 3 runs)\n"
    for (i = 1; i <= NR; ++i)
      printf "%9d lines   %6.2f s processor   %6.2f s wall   %6.2f us per line\n",
             lines[i], cpu[i], wall[i], cpu[i] / lines[i] * 1e6
    ratio = (cpu[NR] / lines[NR]) / (cpu[1] / lines[1])
    printf "time per line, largest against smallest: %.2f x   (target <= 1.5x: %s)\n", ratio,
           ratio <= 1.5 ? "met" : "MISSED"
    exit ratio <= 1.5 ? 0 : 1
  }'
