#!/usr/bin/env bash
# Builds the Debian package of a build tree, installs it in an empty folder, uses it and removes it again.
# smoke.sh BUILD-FOLDER HOST-PROGRAM
set -Eeuo pipefail

build=$1
host=$2
tmp=$(mktemp -d)
trap 'rm -rf "$tmp"' EXIT
PATH=$PATH:/usr/sbin:/sbin
exec 3>&1 >"$tmp/log" 2>&1

fail() {
    echo "package_smoke: $*" >&3
    tail -n 30 "$tmp/log" >&3
    exit 1
}
trap 'fail "line $LINENO"' ERR

# the package
cpack --config "$build/CPackConfig.cmake" -B "$tmp/package"
deb=$(echo "$tmp"/package/kest2_*.deb)
dpkg-deb --contents "$deb" >"$tmp/contents"
for path in bin/kest2 lib/libkest2.so.2 'lib/kest2/libkest2pdf-[0-9.]+\.so' share/kest2/templates/730.html \
    share/kest2/sql/quote-mariadb.sql share/kest2/sql/joblink.sql share/applications/kest2.desktop \
    share/icons/hicolor/scalable/apps/kest2.svg share/icons/hicolor/16x16/apps/kest2.png \
    share/icons/hicolor/256x256/apps/kest2.png share/man/man1/kest2.1.gz share/doc/kest2/copyright \
    share/doc/kest2/docs/operating.md; do
    grep -qE "\./usr/$path( |$)" "$tmp/contents" || fail "the package has no /usr/$path"
done
! grep -vE ' \./(usr/.*)?$' "$tmp/contents" || fail "the package has files outside /usr"
! grep -v ' root/root ' "$tmp/contents" || fail "the package has files that are not root's"
depends=$(dpkg-deb --field "$deb" Depends)
for package in libsqlite3-0 libqt6widgets6 libxml2 libnettle8; do
    [[ $depends == *"$package"* ]] || fail "the package does not depend on $package: $depends"
done
[[ $depends != *libqt6sql6-* ]] || fail "the package depends on a driver that it does not use: $depends"

# the installation in an empty folder; the dependencies are those of this machine
root=$tmp/root
mkdir -p "$root"/var/lib/dpkg/{info,updates} "$tmp/bin"
cp /var/lib/dpkg/status "$root/var/lib/dpkg"
printf '#!/bin/sh\necho ldconfig >>"%s"\n' "$tmp/called" >"$tmp/bin/ldconfig" # this machine's cache is not touched
chmod +x "$tmp/bin/ldconfig"
dpkg_here() {
    PATH=$tmp/bin:$PATH fakeroot -- dpkg --root="$root" --force-script-chrootless --log="$tmp/dpkg.log" \
        --path-include='/usr/*' "$@"
}
dpkg_here --install "$deb"
find "$root/usr" ! -type d -printf '/usr/%P\n' | sort >"$tmp/installed"
dpkg_here --listfiles kest2 | while read -r path; do [ -d "$root$path" ] || echo "$path"; done | sort >"$tmp/recorded"
diff "$tmp/recorded" "$tmp/installed" || fail "the files installed are not those recorded"
[ "$(cat "$tmp/called")" = ldconfig ] || fail "the library is not made known to the loader"

# its use
kest2=$root/usr/bin/kest2
library=$root/usr/lib/libkest2.so.2
viewer=$(echo "$root"/usr/lib/kest2/libkest2pdf-*.so)
readelf -d "$kest2" "$library" "$viewer" >"$tmp/dynamic"
! grep -E 'RPATH|RUNPATH' "$tmp/dynamic" || fail "a search path of the build is left"
export LD_LIBRARY_PATH=${library%/*} XDG_RUNTIME_DIR=$tmp QT_QPA_PLATFORM=offscreen
ldd "$kest2" >"$tmp/libraries"  # no pipe: a grep that ends early would make ldd fail
grep -q "libkest2.so.2 => $library " "$tmp/libraries" || fail "the command does not use the installed library"
! grep -E 'libQt6(Pdf|Network)' "$tmp/libraries" || fail "a start loads what only the PDF viewer needs"
desktop-file-validate "$root/usr/share/applications/kest2.desktop"
for picture in "$root"/usr/share/icons/hicolor/*/apps/kest2.png; do
    size=${picture#*/hicolor/}
    [[ $(file --brief "$picture") == *"${size%%x*} x ${size%%x*}"* ]] || fail "$picture has another size"
done
man --warnings --local-file "$root/usr/share/man/man1/kest2.1.gz" >"$tmp/page" 2>"$tmp/warnings"
[ ! -s "$tmp/warnings" ] || fail "the manual page has faults: $(cat "$tmp/warnings")"

version=$(dpkg-deb --field "$deb" Version)
[ "$("$kest2" --version)" = "kest2 $version" ] || fail "the command is not of version $version"
export KEST2_PROFILE=$tmp/profile
"$kest2" init --demo
[ "$("$kest2" list unread | wc -l)" -gt 10 ] || fail "the demo shop shows no messages"
diff -r "$root/usr/share/kest2/templates" "$KEST2_PROFILE/drive_c/wirra32/report" || fail "other templates than those installed"
"$host" "$library" show 1004 0 >"$tmp/shown" || fail "a host cannot load the installed library"
grep -qx done "$tmp/shown" || fail "a host's call does not return"

# a PDF document, with the viewer and without it
echo '{"windows": {"frmSubletAuth": [[{"click": "Command1"}]]}}' >"$tmp/open"
mkdir "$tmp/links"
ln -s "$library" "$tmp/links"  # a host may load the component through a link
LD_LIBRARY_PATH=$tmp/links "$kest2" --json --script "$tmp/open" load AUQT_1007.xml >"$tmp/shown"
grep -q '"frmViewPDF"' "$tmp/shown" || fail "a PDF document is not shown"
mv "$viewer" "$tmp"
"$kest2" --json --script "$tmp/open" reprint 1007.0_1.xml >"$tmp/shown"
grep -q 'the PDF viewer of KEST2 is missing' "$tmp/shown" || fail "nobody is told that the PDF viewer is missing"
grep -q "Description: .*$viewer" "$KEST2_PROFILE/component/kest2error.log" || fail "the log does not say which file is missing"
mv "$tmp/${viewer##*/}" "$viewer"

# the removal
dpkg_here --purge kest2
[ ! -e "$root/usr" ] || fail "left behind: $(find "$root/usr")"
echo "installed, used and removed: $(basename "$deb"), $(wc -l <"$tmp/installed") files" >&3
