# SPDX-License-Identifier: MIT
# What the end-to-end benchmark scripts share, sourced with the build folder as $1: the programs of the
# build, a scratch folder removed on exit, the settings' defaults rather than the user's, and the clock.
build=${1:-build}
quimbel="$build/bin/quimbel"
generator="$build/bin/quimbel-gen"
for tool in "$quimbel" "$generator"; do
  [ -x "$tool" ] || { echo "$(basename "$0" .sh): $tool is missing; build the quimbel and quimbel-gen targets" >&2; exit 2; }
done

work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
# The settings' defaults (start 10000, interval 5, tabs), not the user's.
export QUIMBEL_CONFIG_DIR="$work/config"

now() { date +%s.%N; }
best() { printf '%s\n' "$@" | sort -g | head -n 1; }
