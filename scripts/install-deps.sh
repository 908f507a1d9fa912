#!/usr/bin/env bash
# Installs the Debian packages that building and testing Quimbel needs, then fetches SQLCipher 4's
# amalgamation for the tests that check the database against it (scripts/fetch-sqlcipher4.sh).
# Safe to run again: apt-get skips what is already installed. Needs root (or sudo).
set -euo pipefail

packages=(
  cmake ninja-build pkg-config g++ clang-format
  dpkg-dev file
  qt6-base-dev
  xvfb xauth fonts-dejavu-core
  fonts-wine fonts-liberation fonts-crosextra-carlito fonts-crosextra-caladea
  libsqlcipher-dev sqlcipher
  libgsf-1-dev python3-olefile
  libgtest-dev libgmock-dev libbenchmark-dev
  libcli11-dev libssl-dev libeditorconfig-dev
  neovim
)

missing=()
for p in "${packages[@]}"; do
  dpkg-query -W -f='${Status}' "$p" 2>/dev/null | grep -q "install ok installed" || missing+=("$p")
done
if [ ${#missing[@]} -ne 0 ]; then
  sudo=""
  [ "$(id -u)" -ne 0 ] && sudo="sudo"
  $sudo apt-get update -q
  DEBIAN_FRONTEND=noninteractive $sudo apt-get install -y -q --no-install-recommends "${missing[@]}"
fi

"$(dirname "$0")/fetch-sqlcipher4.sh"
