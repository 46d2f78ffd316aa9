#!/bin/sh
# Builds the Debian packages from what is committed, looks at them with lintian, and tries them in a bare root.
set -eu
cd "$(dirname "$0")/.."
packages=$PWD/build/packages
tree=$PWD/build/package-tree

echo "== Building the packages (build/packages)"
rm -rf "$packages" "$tree"
mkdir -p "$packages" "$tree"
git archive HEAD | tar -x -C "$tree"
QVSA_MULTIARCH=$(dpkg-architecture -qDEB_HOST_MULTIARCH)
export QVSA_MULTIARCH
(
  cd "$tree"
  cmake --preset package --log-level=NOTICE
  cmake --build --preset package -j "$(nproc)"
  cd build/package
  umask 022
  cpack -G DEB -B "$packages" >"$packages/cpack.log" || { cat "$packages/cpack.log"; exit 1; }
)
rm -rf "$packages/_CPack_Packages" "$tree"
ls -l "$packages"/*.deb

echo "== lintian"
# They go to a site and not into the archive: no bug closes, and the site puts its own address into QVSA_MAINTAINER.
lintian --fail-on error --suppress-tags initial-upload-closes-no-bugs,bogus-mail-host "$packages"/*.deb

echo "== In a bare root"
packaging/try-packages.sh "$packages"
