#!/usr/bin/env bash
# The .deb holds the installation under /opt/tarnex and a link in /usr/bin;
# unpacked into a throw-away root, the program runs from there.
. "$(dirname "$0")/common.sh"
command -v dpkg-deb >/dev/null || fail "dpkg-deb is missing"
(cd "$build" && cpack -G "DEB;TGZ" -B "$scratch/out" >"$scratch/cpack.log" 2>&1) \
  || fail "cpack: $(cat "$scratch/cpack.log")"
deb=$(ls "$scratch"/out/*.deb)
tgz=$(ls "$scratch"/out/*.tar.gz)

dpkg-deb -c "$deb" | awk '{ print $6, $7, $8 }' | sed 's/ *$//' | sort >"$scratch/contents"
for entry in ./opt/tarnex/exe/linux/pocket-classifier ./opt/tarnex/exe/linux/gen_contours \
             ./opt/tarnex/config/environ.cfg ./opt/tarnex/share/man/man1/pocket-classifier.1 \
             ./opt/tarnex/share/man/man5/environ.cfg.5 ./opt/tarnex/share/doc/pocket-classifier/LICENSE \
             ./opt/tarnex/share/doc/pocket-classifier/examples/zone/tmp/trxcon.inf \
             "./usr/bin/pocket-classifier -> /opt/tarnex/exe/linux/pocket-classifier"; do
  grep -qxF "$entry" "$scratch/contents" || fail "not in the package: $entry"
done
# Nothing outside the suite's directory but the link.
outside=$(grep -v '^\./opt/' "$scratch/contents" | grep -vxF -e ./ -e ./usr/ -e ./usr/bin/ \
          -e "./usr/bin/pocket-classifier -> /opt/tarnex/exe/linux/pocket-classifier" || true)
[ -z "$outside" ] || fail "package writes outside /opt/tarnex: $outside"
[ "$(dpkg-deb -f "$deb" Package)" = pocket-classifier ] || fail "package name"
[ "$(dpkg-deb -f "$deb" Version)" = "$version" ] || fail "package version $(dpkg-deb -f "$deb" Version)"

# The archive holds the layout itself, without the /opt prefix.
tar tzf "$tgz" >"$scratch/archive"
grep -qx -e ./exe/linux/pocket-classifier -e exe/linux/pocket-classifier "$scratch/archive" \
  || fail "tar.gz lacks exe/linux/pocket-classifier"

# Installed with dpkg into a throw-away root (the suite's libraries are the
# host's, so dependencies are not checked there); without root rights only
# unpacked.
root=$scratch/root
dpkg_root=(dpkg --root="$root" --force-not-root --force-depends --log=/dev/null)
if [ "$(id -u)" = 0 ]; then
  mkdir -p "$root/var/lib/dpkg/info" "$root/var/lib/dpkg/updates"
  touch "$root/var/lib/dpkg/status"
  "${dpkg_root[@]}" -i "$deb" >"$scratch/dpkg.log" 2>&1 || fail "dpkg -i: $(cat "$scratch/dpkg.log")"
  "${dpkg_root[@]}" -L pocket-classifier >"$scratch/listed"
  grep -qx /opt/tarnex/exe/linux/pocket-classifier "$scratch/listed" || fail "dpkg does not list the program"
else
  dpkg-deb -x "$deb" "$root"
fi
[ "$(readlink "$root/usr/bin/pocket-classifier")" = /opt/tarnex/exe/linux/pocket-classifier ] \
  || fail "/usr/bin link not installed"
HOME_FOR_RUN=$scratch/home
make_zone "$scratch/zone" "$HOME_FOR_RUN"
run_clean "$scratch/zone" "$root/opt/tarnex/exe/linux/pocket-classifier" R >"$scratch/run.out" \
  || fail "unpacked program ended with status $?: $(cat "$scratch/run.out")"
cp -r "$source_dir/examples/zone" "$scratch/ref"
(cd "$scratch/ref" && env -i PATH=/usr/bin:/bin TRXHOME="$source_dir/examples/installation" \
   TRXZONE="$scratch/ref" TRXTMPDIR="$scratch/ref/tmp" "$build/src/pocket-classifier" R >/dev/null)
cmp "$scratch/zone/poches.res" "$scratch/ref/poches.res" || fail "unpacked program's poches.res differs"
# Removing the package leaves nothing of it behind.
if [ "$(id -u)" = 0 ]; then
  "${dpkg_root[@]}" -r pocket-classifier >"$scratch/dpkg.log" 2>&1 || fail "dpkg -r: $(cat "$scratch/dpkg.log")"
  left=$(cd "$root" && find opt usr -not -type d 2>/dev/null || true)
  [ -z "$left" ] || fail "left after removal: $left"
fi
echo "deb_package: ok"
