#!/usr/bin/env bash
# Builds the Debian package build/deb/nimbo-transit_VERSION_ARCHITECTURE.deb.
set -euo pipefail
top=$(cd "$(dirname "$0")/.." && pwd)
"$top/tools/setup.sh" package
cd "$top"
cmake --preset release -B build/deb -DCMAKE_INSTALL_PREFIX=/usr >/dev/null
cmake --build build/deb
(cd build/deb && cpack -G DEB)
