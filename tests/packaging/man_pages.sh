#!/usr/bin/env bash
# Every man page formats without a single groff warning.
. "$(dirname "$0")/common.sh"
command -v groff >/dev/null || fail "groff is missing"
pages=("$source_dir"/doc/*.[1-8])
[ -f "$source_dir/tools/inspect/pocket-inspect.1" ] && pages+=("$source_dir/tools/inspect/pocket-inspect.1")
[ ${#pages[@]} -ge 2 ] || fail "man pages missing: ${pages[*]}"
for page in "${pages[@]}"; do
  warnings=$(groff -z -wall -man "$page" 2>&1) || fail "groff failed on $page: $warnings"
  [ -z "$warnings" ] || fail "$page: $warnings"
  # The page's name line is what apropos and whatis show.
  grep -q '^\.SH NAME' "$page" || fail "$page has no NAME section"
done
# The pages of this program name the version the build reports.
for page in "$source_dir"/doc/*.[1-8]; do
  grep -q "^\.TH .*\"pocket-classifier $version\"" "$page" || fail "$page does not name version $version"
done
echo "man_pages: ${#pages[@]} pages ok"
