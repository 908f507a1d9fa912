#!/usr/bin/env bash
# SPDX-License-Identifier: MIT
# `quimbel indent` end to end (load, indent, durable save) on a generated project shaped like a real one:
# 400,000 code lines in 539 components. Target: under 0.5 s, best of three runs, each on a fresh copy.
# Beside it, sed indenting every line of the same files and flushing them to disk (`sync -d`): what the
# disk allows any tool that rewrites them durably.
#
# Usage: bench/transform/indent_project.sh [BUILD_DIR]   (default: build; build it in Release first)
set -euo pipefail

source "$(dirname "$0")/../tools.sh" "${1:-build}"

"$generator" --lines 400000 --components 539 --seed 11 "$work/source" > /dev/null
project=Projeto1/Projeto1.vbp

tool_times=()
sed_times=()
for run in 1 2 3; do
  rm -rf "$work/tool" "$work/sed"
  cp -r "$work/source" "$work/tool"
  cp -r "$work/source" "$work/sed"
  mapfile -t files < <(find "$work/sed" -type f \( -name '*.bas' -o -name '*.cls' -o -name '*.frm' \))
  cat "${files[@]}" "$work/tool"/*/* > /dev/null
  sync  # the copies' own writing is not the tools'

  start=$(now)
  "$quimbel" indent "$work/tool/$project"
  tool_times+=("$(awk -v a="$start" -v b="$(now)" 'BEGIN { print b - a }')")

  start=$(now)
  sed -i 's/^/    /' "${files[@]}"
  sync -d "${files[@]}"
  sed_times+=("$(awk -v a="$start" -v b="$(now)" 'BEGIN { print b - a }')")
done

awk -v t="$(best "${tool_times[@]}")" -v s="$(best "${sed_times[@]}")" 'BEGIN {
  printf "quimbel indent, 400,000 lines in 539 files  %6.3f s   (target < 0.5 s: %s)\n", t, t < 0.5 ? "met" : "MISSED"
  printf "sed indent + sync -d                        %6.3f s\n", s
  exit t < 0.5 ? 0 : 1
}'
