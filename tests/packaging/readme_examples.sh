#!/usr/bin/env bash
# Every ```sh usage example of the README runs as it stands in a temporary
# installation (/opt/tarnex rewritten to it, pocket-classifier on the PATH as
# the package's /usr/bin link puts it) and a temporary HOME.
. "$(dirname "$0")/common.sh"
prefix=$scratch/opt/tarnex
cmake --install "$build" --prefix "$prefix" >/dev/null
mkdir -p "$scratch/bin" "$scratch/home"
ln -s "$prefix/exe/linux/pocket-classifier" "$scratch/bin/pocket-classifier"

awk '/^```sh$/ { inside = 1; n++; print "# ---- example " n; next }
     /^```/ { inside = 0; next }
     inside { print }' "$source_dir/README.md" | sed "s#/opt/tarnex#$prefix#g" >"$scratch/examples.sh"
count=$(grep -c '^# ---- example' "$scratch/examples.sh" || true)
[ "$count" -ge 1 ] || fail "no \`\`\`sh example in README.md"

(cd "$scratch/home" && env -i PATH="$scratch/bin:/usr/bin:/bin" HOME="$scratch/home" \
   bash -euo pipefail "$scratch/examples.sh" >"$scratch/examples.out" 2>&1) \
  || fail "README example failed: $(tail -n 20 "$scratch/examples.out")"
echo "readme_examples: $count examples ok"
