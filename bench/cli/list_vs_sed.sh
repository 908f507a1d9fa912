#!/usr/bin/env bash
# SPDX-License-Identifier: MIT
# `quimbel list` end to end (start, read, index, print) on a generated project of 1,000,000 code lines in
# 200 modules, against `sed -n '$='` counting the lines of the same files: the least any tool that reads
# every line must spend. Target: list within 4 times sed's time, best of three runs each.
#
# Usage: bench/cli/list_vs_sed.sh [BUILD_DIR]   (default: build; build it in Release first)
set -euo pipefail

source "$(dirname "$0")/../tools.sh" "${1:-build}"
"$generator" --lines 1000000 --components 200 --seed 7 "$work/source" > /dev/null
mapfile -t files < <(find "$work/source" -type f \( -name '*.bas' -o -name '*.cls' -o -name '*.frm' \))
cat "${files[@]}" > /dev/null  # both start from a warm page cache

tool_times=()
sed_times=()
for run in 1 2 3; do
  start=$(now)
  "$quimbel" list "$work/source/Projeto1/Projeto1.vbp" > /dev/null
  tool_times+=("$(awk -v a="$start" -v b="$(now)" 'BEGIN { print b - a }')")

  start=$(now)
  sed -n '$=' "${files[@]}" > /dev/null
  sed_times+=("$(awk -v a="$start" -v b="$(now)" 'BEGIN { print b - a }')")
done

awk -v tool="$(best "${tool_times[@]}")" -v sed="$(best "${sed_times[@]}")" 'BEGIN {
  ratio = tool / sed
  printf "quimbel list   %6.3f s\n", tool
  printf "sed -n \x27$=\x27    %6.3f s\n", sed
  printf "ratio          %6.2f x   (target <= 4x: %s)\n", ratio, ratio <= 4 ? "met" : "MISSED"
  exit ratio <= 4 ? 0 : 1
}'
