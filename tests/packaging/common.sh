# Shared by the packaging tests: a scratch directory removed at exit, failure
# reporting, and a work zone laid out for an installed run.
set -euo pipefail
build=$(realpath "$1")
source_dir=$(realpath "$2")
version=$3  # the project version the build reports
scratch=$(mktemp -d)
trap 'rm -rf "$scratch"' EXIT

fail() {
  echo "FAIL: $*" >&2
  exit 1
}

# make_zone <dir> <home>: a copy of the example zone that owns number 7, its
# temporary directory under a TRXTMP that only the user layer of <home> names.
make_zone() {
  local zone=$1 home=$2
  mkdir -p "$zone" "$home/.tarnex" "$scratch/trxtmp/00000007"
  cp "$source_dir"/examples/zone/tmp/* "$scratch/trxtmp/00000007/"
  echo 00000007 >"$zone/workzone.num"
  printf '[var]\nTRXTMP = %s/trxtmp\n' "$scratch" >"$home/.tarnex/environ.cfg"
}

# run_clean <dir> <command...>: runs with no TRX* variable but TRXZONE and HOME.
run_clean() {
  local dir=$1
  shift
  (cd "$dir" && env -i PATH=/usr/bin:/bin HOME="$HOME_FOR_RUN" TRXZONE="$dir" "$@")
}
