#!/usr/bin/env bash
# Runs the pocket classifier on a copy of the bundled work zone, inside the
# bundled installation (TRXHOME) and its user layer, in every output mode,
# and shows what each run wrote. The repository stays clean.
#   examples/demo.sh <pocket-classifier executable>
set -euo pipefail
exe=$(realpath "$1")
here=$(cd "$(dirname "$0")" && pwd)
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT

cp -r "$here/zone" "$work/zone"
export TRXHOME="$here/installation"
export TRXZONE="$work/zone"
export TRXTMPDIR="$work/zone/tmp"
cd "$work/zone"

echo "==== configuration layers (TRX_TRXFILES_VERBOSE=on) ===="
TRX_TRXFILES_VERBOSE=on "$exe" R | grep -E "^(LOADING|loading|Overloading|TRXUNITS = )" || true
rm -f poches.res

run() {
  echo "==== pocket-classifier $* ===="
  "$exe" "$@"
}
run            # default: tagged contour file $TMP/contour.bin
ls -l tmp/contour.bin | awk '{print "  wrote tmp/contour.bin,", $5, "bytes"}'
run F          # unformatted record contour file
ls -l tmp/contour.bin | awk '{print "  wrote tmp/contour.bin,", $5, "bytes"}'
run w          # level dump, then as F
ls -l tmp/wlevel.tmp | awk '{print "  wrote tmp/wlevel.tmp,", $5, "bytes"}'
run R          # text pocket result file in the current directory
echo "  wrote poches.res, $(wc -l < poches.res) lines; first lines:"
head -4 poches.res
