#!/usr/bin/env bash
# SPDX-License-Identifier: MIT
# `quimbel find --whole-word` end to end (start, read, search, print) on a generated group of 1,000,000 code
# lines in 4 projects and 200 modules, against `grep -rnwi` on the same files: what a programmer would
# otherwise run, for a word with tens of thousands of occurrences and for one with none. Target: quimbel
# within 2 times grep's time, best of three runs each.
#
# Usage: bench/find/find_vs_grep.sh [BUILD_DIR]   (default: build; build it in Release first)
set -euo pipefail

source "$(dirname "$0")/../tools.sh" "${1:-build}"
"$generator" --lines 1000000 --components 200 --projects 4 --seed 7 "$work/source" > /dev/null
word=Boolean


cat "$work"/source/*/* > /dev/null  # both start from a warm page cache
# One word with tens of thousands of occurrences, one with none: reading and printing are both measured.
status=0
for word in Long Zzyzx; do
  tool_times=()
  grep_times=()
  for run in 1 2 3; do
    start=$(now)
    "$quimbel" find --whole-word "$word" "$work/source/Grupo.vbg" > "$work/tool.out" 2> /dev/null || true
    tool_times+=("$(awk -v a="$start" -v b="$(now)" 'BEGIN { print b - a }')")

    start=$(now)
    grep -rnwi "$word" "$work/source" > "$work/grep.out" || true
    grep_times+=("$(awk -v a="$start" -v b="$(now)" 'BEGIN { print b - a }')")
  done
  awk -v tool="$(best "${tool_times[@]}")" -v grep="$(best "${grep_times[@]}")" -v word="$word" \
      -v rows="$(wc -l < "$work/tool.out")" -v lines="$(wc -l < "$work/grep.out")" 'BEGIN {
    ratio = tool / grep
    printf "\"%s\", whole word: quimbel %d occurrences, grep %d lines (best of 3 runs)\n", word, rows, lines
    printf "  quimbel find   %6.3f s\n", tool
    printf "  grep -rnwi     %6.3f s\n", grep
    printf "  ratio          %6.2f x   (target <= 2x: %s)\n", ratio, ratio <= 2 ? "met" : "MISSED"
    exit ratio <= 2 ? 0 : 1
  }' || status=1
done
exit $status
