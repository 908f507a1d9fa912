#!/usr/bin/env bash
# Fetches SQLCipher 4.5's amalgamation (sqlite3.c and sqlite3.h) into a cache outside the repository. The
# tests build it into a small program of their own (sqlcipher4_oracle) that checks the application
# database against SQLCipher 4 both ways; it is never part of the product. Optional: without npm or the
# network this says so, and those tests skip.
set -euo pipefail

version=4.5.5
cache="${QUIMBEL_CACHE_DIR:-${XDG_CACHE_HOME:-$HOME/.cache}/quimbel}/sqlcipher-$version"
if [ -f "$cache/sqlite3.c" ] && [ -f "$cache/sqlite3.h" ]; then
  exit 0
fi
if ! command -v npm >/dev/null 2>&1; then
  echo "fetch-sqlcipher4: npm is not installed; the SQLCipher 4 tests will skip" >&2
  exit 0
fi

work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
# npm checks the package against the registry's integrity hash.
if ! (cd "$work" && npm pack --silent "@commapp/sqlcipher-amalgamation@$version" >/dev/null); then
  echo "fetch-sqlcipher4: could not fetch @commapp/sqlcipher-amalgamation@$version; the SQLCipher 4 tests will skip" >&2
  exit 0
fi
tar -xzf "$work"/*.tgz -C "$work" package/src/sqlite3.c package/src/sqlite3.h package/LICENSE
mkdir -p "$cache"
cp "$work/package/src/sqlite3.c" "$work/package/src/sqlite3.h" "$work/package/LICENSE" "$cache/"
echo "fetch-sqlcipher4: SQLCipher $version's amalgamation is in $cache"
