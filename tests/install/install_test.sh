#!/usr/bin/env bash
# Installs the build into an empty prefix and runs the installed programs from there, with nothing pointing
# at the build tree, so that a broken installation fails the suite.
# Arguments: the build folder, the source folder, the version.
set -euo pipefail
build=$1 source=$2 version=$3
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
prefix=$work/prefix
fail() {
  echo "FAIL: $*" >&2
  exit 1
}

cmake --install "$build" --prefix "$prefix" >"$work/install.log" || { cat "$work/install.log"; fail "cmake --install"; }

# What a user runs and reads, in the usual places.
for file in bin/quimbel bin/quimbel-ide share/man/man1/quimbel.1 share/man/man1/quimbel-ide.1 \
  share/applications/quimbel-ide.desktop share/icons/hicolor/scalable/apps/quimbel-ide.svg \
  share/quimbel/help/index.html share/doc/quimbel/SCRIPTING.md share/bash-completion/completions/quimbel \
  share/zsh/site-functions/_quimbel; do
  [ -f "$prefix/$file" ] || fail "$file is not installed"
done
addin=$(find "$prefix" -name libquimbel-addin.so)
[ -n "$addin" ] || fail "the add-in is not installed"
config=$(find "$work" -path '*/quimbel/quimbel.conf')
grep -qx "InstallationPath=$prefix/share/quimbel" "$config" || fail "$config names another folder: $(cat "$config")"

# Our own libraries are found relative to where the programs are, never in the build tree.
for binary in "$prefix/bin/quimbel" "$prefix/bin/quimbel-ide" "$addin"; do
  runpath=$(readelf -d "$binary" | sed -n 's/.*(RUNPATH).*\[\(.*\)\]/\1/p')
  case "$runpath" in *'$ORIGIN'*) ;; *) fail "$binary has no RUNPATH from \$ORIGIN: '$runpath'" ;; esac
  case "$runpath" in *"$build"*) fail "$binary looks into the build tree: '$runpath'" ;; esac
  libraries=$(env -u LD_LIBRARY_PATH ldd "$binary")
  if grep -q 'not found' <<<"$libraries"; then fail "$binary: $(grep 'not found' <<<"$libraries")"; fi
  grep 'libquimbel_ide.so' <<<"$libraries" | grep -q "=> $prefix/" || fail "$binary does not load the installed libquimbel_ide.so"
done

unset QUIMBEL_MACHINE_CONFIG QUIMBEL_ADDIN LD_LIBRARY_PATH
export QUIMBEL_CONFIG_DIR=$work/config QUIMBEL_DATA_DIR=$work/data QT_QPA_PLATFORM=offscreen LC_ALL=C.UTF-8
cd "$source"

[ "$("$prefix/bin/quimbel" --version)" = "quimbel $version" ] || fail "quimbel --version"
[ "$(env -u QT_QPA_PLATFORM -u DISPLAY -u WAYLAND_DISPLAY "$prefix/bin/quimbel-ide" --version)" = "Quimbel IDE $version" ] ||
  fail "quimbel-ide --version"

# The installed tool reads the example group as the built one does.
"$prefix/bin/quimbel" list examples/demo/Demo.vbg >"$work/installed.txt" || fail "quimbel list failed"
"$build/bin/quimbel" list examples/demo/Demo.vbg >"$work/built.txt"
diff -u "$work/built.txt" "$work/installed.txt" || fail "the installed quimbel lists the example group otherwise"

# The installed completion offers the commands and the options of the one typed.
completions=$(bash -c 'source "$1"; COMP_WORDS=(quimbel nu); COMP_CWORD=1; _quimbel; echo "${COMPREPLY[*]}"
  COMP_WORDS=(quimbel find --js); COMP_CWORD=2; _quimbel; echo "${COMPREPLY[*]}"' - \
  "$prefix/share/bash-completion/completions/quimbel")
[ "$completions" = $'number numindent\n--json' ] || fail "bash completion offered: $completions"
if command -v zsh >/dev/null; then zsh -n "$prefix/share/zsh/site-functions/_quimbel" || fail "zsh completion"; fi

# The installed IDE loads the installed add-in, which finds its configuration and help pages.
cat >"$work/session.qis" <<SCRIPT
open "$source/examples/demo/Demo.vbg"
expect projects 2
expect control "Menu Bar" Quimbel
click "Menu Bar" Quimbel Ajuda
echo session ended
SCRIPT
status=0
"$prefix/bin/quimbel-ide" --script "$work/session.qis" >"$work/session.txt" 2>"$work/session.err" || status=$?
[ $status -eq 0 ] || fail "quimbel-ide --script exited $status: $(cat "$work/session.txt" "$work/session.err")"
expected="document: $prefix/share/quimbel/help/index.html
session ended"
[ "$(cat "$work/session.txt")" = "$expected" ] || fail "quimbel-ide --script printed:
$(cat "$work/session.txt")"
[ ! -e "$work/data/errors.log" ] || fail "the add-in logged failures: $(cat "$work/data/errors.log")"
