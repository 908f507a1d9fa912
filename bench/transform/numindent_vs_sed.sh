#!/usr/bin/env bash
# SPDX-License-Identifier: MIT
# `quimbel numindent` end to end (load, number and indent, save) on a generated project of 1,000,000 code
# lines in 200 components, against sed prefixing every line of the same files and flushing them to disk
# (`sync -d`): the least any tool that rewrites every line durably must spend. Targets: numindent within
# 2 times that, and at most 120 MB of memory at its peak.
#
# Usage: bench/transform/numindent_vs_sed.sh [BUILD_DIR]   (default: build; build it in Release first)
set -euo pipefail

source "$(dirname "$0")/../tools.sh" "${1:-build}"

"$generator" --lines 1000000 --components 200 --seed 7 "$work/source" > /dev/null
project=Projeto1/Projeto1.vbp


tool_times=()
sed_times=()
peaks=()
for run in 1 2 3; do
  rm -rf "$work/tool" "$work/sed"
  cp -r "$work/source" "$work/tool"
  cp -r "$work/source" "$work/sed"
  mapfile -t files < <(find "$work/sed" -type f \( -name '*.bas' -o -name '*.cls' -o -name '*.frm' \))
  cat "${files[@]}" "$work/tool"/*/* > /dev/null  # both start from a warm page cache
  # The copies must not be waiting to go to disk: quimbel flushes what it writes (so that a crash cannot
  # leave a file half written) and would otherwise pay for the copies too.
  sync

  start=$(now)
  /usr/bin/time -f %M -o "$work/peak" "$quimbel" numindent "$work/tool/$project"
  tool_times+=("$(awk -v a="$start" -v b="$(now)" 'BEGIN { print b - a }')")
  peaks+=("$(cat "$work/peak")")

  start=$(now)
  sed -i 's/^/10000 /' "${files[@]}"
  sync -d "${files[@]}"
  sed_times+=("$(awk -v a="$start" -v b="$(now)" 'BEGIN { print b - a }')")
done

tool_time=$(best "${tool_times[@]}")
sed_time=$(best "${sed_times[@]}")
lines=$(cat "${files[@]}" | wc -l)
peak=$(best "${peaks[@]}")
awk -v tool="$tool_time" -v sed="$sed_time" -v lines="$lines" -v peak="$peak" 'BEGIN {
  ratio = tool / sed
  printf "files: %d lines in 200 modules (best of 3 runs)\n", lines
  printf "quimbel numindent  %6.3f s   peak %d MB (target <= 120 MB: %s)\n", tool, peak / 1024,
         peak <= 120 * 1024 ? "met" : "MISSED"
  printf "sed prefix + sync  %6.3f s\n", sed
  printf "ratio              %6.2f x   (target <= 2x: %s)\n", ratio, ratio <= 2 ? "met" : "MISSED"
  exit (ratio <= 2 && peak <= 120 * 1024) ? 0 : 1
}'
