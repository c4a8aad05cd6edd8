#!/usr/bin/env bash
# The installed program finds its installation from its own path (no TRXHOME),
# its user layer through HOME, and writes what the build tree's program writes.
. "$(dirname "$0")/common.sh"
prefix=$scratch/prefix
cmake --install "$build" --prefix "$prefix" >/dev/null

for f in exe/linux/pocket-classifier exe/linux/gen_contours config/environ.cfg \
         share/man/man1/pocket-classifier.1 share/man/man5/environ.cfg.5 \
         share/doc/pocket-classifier/README.md share/doc/pocket-classifier/LICENSE \
         share/doc/pocket-classifier/examples/zone/tmp/trxcon.inf \
         share/doc/pocket-classifier/examples/zone/tmp/outil.par; do
  [ -f "$prefix/$f" ] || fail "not installed: $f"
done
# An install into a prefix stays inside it (the /usr/bin link is the package's).
outside=$(grep -v "^$prefix/" "$build/install_manifest.txt" || true)
[ -z "$outside" ] || fail "installed outside the prefix: $outside"
[ -x "$prefix/exe/linux/pocket-classifier" ] || fail "the installed program is not executable"
if [ -x "$build/tools/pocket-inspect" ]; then
  [ -x "$prefix/exe/linux/pocket-inspect" ] || fail "pocket-inspect built but not installed"
fi

HOME_FOR_RUN=$scratch/home
make_zone "$scratch/zone" "$HOME_FOR_RUN"
answer=$(run_clean "$scratch/zone" "$prefix/exe/linux/pocket-classifier" --version)
[ "$answer" = "pocket-classifier $version" ] || fail "--version printed '$answer'"

run_clean "$scratch/zone" "$prefix/exe/linux/pocket-classifier" R >"$scratch/installed.out" \
  || fail "installed run ended with status $?: $(cat "$scratch/installed.out")"
[ -s "$scratch/zone/poches.res" ] || fail "installed run wrote no poches.res"

# The same run from the build tree, inside the bundled example installation.
cp -r "$source_dir/examples/zone" "$scratch/ref"
(cd "$scratch/ref" && env -i PATH=/usr/bin:/bin TRXHOME="$source_dir/examples/installation" \
   TRXZONE="$scratch/ref" TRXTMPDIR="$scratch/ref/tmp" "$build/src/pocket-classifier" R >"$scratch/ref.out")
cmp "$scratch/zone/poches.res" "$scratch/ref/poches.res" || fail "poches.res differs from the build tree's"
diff "$scratch/installed.out" "$scratch/ref.out" || fail "console output differs from the build tree's"

# The tagged contour file is written into the zone's directory under TRXTMP.
run_clean "$scratch/zone" "$prefix/exe/linux/pocket-classifier" >/dev/null
(cd "$scratch/ref" && env -i PATH=/usr/bin:/bin TRXHOME="$source_dir/examples/installation" \
   TRXZONE="$scratch/ref" TRXTMPDIR="$scratch/ref/tmp" "$build/src/pocket-classifier" >/dev/null)
cmp "$scratch/trxtmp/00000007/contour.bin" "$scratch/ref/tmp/contour.bin" || fail "contour.bin differs"

# Without the user layer the sample configuration stands on its own: a zone
# with TRXTMPDIR runs, and a missing installation file is fatal.
mkdir "$scratch/plain"
cp "$source_dir"/examples/zone/tmp/* "$scratch/plain/"
(cd "$scratch/plain" && env -i PATH=/usr/bin:/bin HOME="$scratch/nohome" TRXTMPDIR="$scratch/plain" \
   "$prefix/exe/linux/pocket-classifier" R >/dev/null) || fail "sample configuration alone does not run"
cmp "$scratch/plain/poches.res" "$scratch/ref/poches.res" || fail "poches.res differs with the sample alone"
mv "$prefix/config/environ.cfg" "$prefix/config/environ.cfg.away"
status=0
(cd "$scratch/plain" && env -i PATH=/usr/bin:/bin TRXTMPDIR="$scratch/plain" \
   "$prefix/exe/linux/pocket-classifier" R >"$scratch/missing.out" 2>&1) || status=$?
[ "$status" = 255 ] || fail "missing installation file: status $status"
grep -q "Error loading '$prefix/config/environ.cfg'" "$scratch/missing.out" \
  || grep -q "Error loading" "$scratch/missing.out" || fail "missing installation file: $(cat "$scratch/missing.out")"
echo "install_run: ok"
