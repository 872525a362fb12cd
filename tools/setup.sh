#!/usr/bin/env bash
# Installs the Debian packages that are missing: setup.sh run|test|lint|bench|fuzz|package (all hold run, lint holds test).
# Quick when nothing is missing. Needs root, or a user with sudo.
set -euo pipefail
purpose=${1:-run}

# Compiler and build tools; then a library each, with its reason in README.md.
packages=(
  g++ cmake ninja-build pkg-config ccache
  libglib2.0-dev libsqlite3-dev libcurl4-openssl-dev libprotozero-dev libzip-dev libcsv-dev zlib1g-dev libicu-dev libxxhash-dev
  nlohmann-json3-dev libcli11-dev libpango1.0-dev libcairo2-dev libturbojpeg0-dev libfontconfig-dev libbz2-dev libsystemd-dev
  libseccomp-dev libgtkmm-4.0-dev libwayland-dev wayland-protocols fonts-dejavu-core ca-certificates
)
case $purpose in
  run) ;;
  test | lint) packages+=(libgtest-dev libgmock-dev protobuf-compiler libprotobuf-dev python3 python3-kiwisolver zlib1g-dev libssl-dev
    desktop-file-utils appstream mandoc systemd bash-completion zsh fish libxml2-utils
    xvfb xdotool dbus at-spi2-core python3-gi gir1.2-atspi-2.0 procps sway grim waybar polybar) ;;
  bench) packages+=(libbenchmark-dev protobuf-compiler libprotobuf-dev python3 python3-dev python3-kiwisolver
    libxdamage-dev xvfb dbus procps sway mako-notifier dunst) ;;
  fuzz) packages+=(clang libclang-rt-dev llvm) ;;  # the compiler with libFuzzer, the sanitizers, names in their reports
  package) packages+=(dpkg-dev debhelper lintian) ;;
  *) echo "usage: tools/setup.sh run|test|lint|bench|fuzz|package" >&2; exit 2 ;;
esac
[ "$purpose" != lint ] || packages+=(clang-format clang-tidy git libbenchmark-dev python3-dev libxdamage-dev)

missing=()
# Fails, and says so, for each package that it has never heard of: those are missing.
installed=$(dpkg-query -W -f '${db:Status-Abbrev} ${Package}\n' "${packages[@]}" 2>/dev/null | sed -n 's/^ii  *//p' || true)
for package in "${packages[@]}"; do
  grep -qx -- "$package" <<<"$installed" || missing+=("$package")
done
[ ${#missing[@]} -gt 0 ] || exit 0

as_root=()
if [ "$(id -u)" -ne 0 ]; then
  command -v sudo >/dev/null || { echo "setup: missing packages: ${missing[*]}. Install them as root." >&2; exit 1; }
  as_root=(sudo)
fi
echo "setup: installing ${missing[*]}" >&2
export DEBIAN_FRONTEND=noninteractive
"${as_root[@]}" apt-get update -q >&2
"${as_root[@]}" apt-get install -y -q --no-install-recommends "${missing[@]}" >&2
