#!/usr/bin/env bash
# Tries the packages build/deb/*.deb (tools/package.sh) in a bare Debian 12: installs them over older ones, runs
# debian/tests, removes and purges them, and looks at what is left. Needs root, and the network.
# usage: tools/try-package.sh [BASE]    BASE is a folder with the bare system, made where there is none
set -euo pipefail
top=$(cd "$(dirname "$0")/.." && pwd)
base=${1:-/var/tmp/nimbo-debian}
if [ ! -e "$base/usr/bin/apt" ]; then
  command -v debootstrap >/dev/null || apt-get install -y -q debootstrap
  debootstrap --variant=minbase --include=ca-certificates bookworm "$base"
fi
# Mounts of a namespace of its own go with it.
[ "${NIMBO_UNSHARED:-}" ] || NIMBO_UNSHARED=1 exec unshare --mount --propagation slave "$0" "$base"

try=$(mktemp -d /var/tmp/nimbo-try.XXXXXX)
trap 'umount -R "$try/proc" "$try/dev" 2>/dev/null || true; rm -rf --one-file-system "$try"' EXIT
cp -a "$base/." "$try"
chmod 755 "$try"
cp /etc/resolv.conf /etc/hosts "$try/etc/"
mount -t proc proc "$try/proc"
mount --rbind /dev "$try/dev"
mkdir -p "$try/root/new" "$try/root/old"
cp "$top"/build/deb/*.deb "$try/root/new"
cp -r "$top/debian/tests" "$try/srv"  # where others than root may look
# The same, as an older version.
for package in "$try"/root/new/*.deb; do
  case $package in *-dbgsym_*) rm "$package"; continue ;; esac
  tree=$(mktemp -d)
  dpkg-deb -R "$package" "$tree"
  sed -i 's/^Version: .*/Version: 0.0.1/; s/(= [^)]*)/(= 0.0.1)/' "$tree/DEBIAN/control"
  dpkg-deb --root-owner-group -Znone -b "$tree" "$try/root/old" >/dev/null
  rm -r "$tree"
done

inside() {
  echo "== $*"
  chroot "$try" /usr/bin/env -i HOME=/root PATH=/usr/sbin:/usr/bin:/sbin:/bin LANG=C.UTF-8 DEBIAN_FRONTEND=noninteractive \
    bash -ec "$*" </dev/null
}
# files FOLDER...: what there is of the packages in these.
files() { (cd "$try" && find "$@" -ipath '*nimbo*' | sort); }

inside 'apt-get update -q >/dev/null
  apt-get install -y -q --no-install-recommends /root/old/*.deb >/dev/null
  apt-get install -y -q --no-install-recommends systemd dbus libglib2.0-bin xauth xvfb grim sway >/dev/null'
[ -n "$(files etc usr)" ]
inside 'apt-get install -y -q --no-install-recommends /root/new/*.deb >/dev/null
  [ "$(dpkg-query -W -f "\${Version}\n" "nimbo-transit*" | grep -vc "^0\.0\.1$")" -eq "$(ls /root/new | wc -l)" ]
  XDG_RUNTIME_DIR=/tmp systemd-analyze --user verify --man=no /usr/lib/systemd/user/nimbo-transit-*.{service,timer}
  [ -z "$(dpkg --verify nimbo-transit nimbo-transit-desktop nimbo-transit-layer | tee /dev/stderr)" ]
  [ -z "$(ldd /usr/bin/nimbo-transit* /usr/lib/*/nimbo-transit/*.so | grep "not found" | tee /dev/stderr)" ]'
for test in command-line window layer; do inside "/srv/tests/$test"; done
# Without the other packages each of the two goes, and the first stays whole.
inside 'apt-get remove -y -q nimbo-transit-desktop nimbo-transit-layer >/dev/null; /srv/tests/command-line'
inside 'apt-get remove -y -q nimbo-transit >/dev/null'
left=$(files etc usr)
[ -z "$left" ] || { echo "left after removal: $left"; exit 1; }
inside 'apt-get install -y -q --no-install-recommends /root/new/*.deb >/dev/null
  apt-get purge -y -q "nimbo-transit*" >/dev/null
  [ -z "$(dpkg-query -W "nimbo-transit*" 2>/dev/null)" ]'
left=$(files etc usr var/lib/systemd)
[ -z "$left" ] || { echo "left after purge: $left"; exit 1; }
echo "try-package: installed, upgraded, tested, removed and purged"
