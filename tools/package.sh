#!/usr/bin/env bash
# Builds the Debian packages build/deb/*.deb from what stands in this folder.
set -euo pipefail
top=$(cd "$(dirname "$0")/.." && pwd)
"$top/tools/setup.sh" package
tree=$top/build/deb/nimbo-transit  # the packages come to lie beside it
rm -rf "$top/build/deb"
mkdir -p "$tree"
tar -C "$top" --exclude=./build --exclude=./.git -c . | tar -C "$tree" -x
cd "$tree"
dpkg-buildpackage -b -us -uc
lintian --pedantic --fail-on error,warning ../*.changes
