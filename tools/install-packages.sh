#!/bin/sh
# Installs the Debian packages that the project needs, as far as they are missing; asks no server when all are there.
#   tools/install-packages.sh          what building, testing and benchmarks need
#   tools/install-packages.sh demo     what building alone needs
#   tools/install-packages.sh lint     clang-format and clang-tidy as well
#   tools/install-packages.sh fuzz     clang as well
#   tools/install-packages.sh package  lintian and mmdebstrap as well
#   tools/install-packages.sh docs     doxygen as well
set -eu

packages="build-essential cmake ninja-build ccache
  libsqlite3-dev libssl-dev unixodbc-dev pkgconf libkrb5-dev libldap-dev
  libpugixml-dev zlib1g-dev libcli11-dev nlohmann-json3-dev libfccp-dev"
for_tests="tdsodbc libsqliteodbc gss-ntlmssp slapd ldap-utils openssl
  libgtest-dev libbenchmark-dev python3"

[ "${1:-}" = demo ] || packages="$packages $for_tests"
case "${1:-}" in
  "" | demo) ;;
  lint) packages="$packages clang-format clang-tidy" ;;
  fuzz) packages="$packages clang" ;;
  package) packages="$packages lintian mmdebstrap" ;;
  docs) packages="$packages doxygen" ;;
  *)
    echo "usage: $0 [demo | lint | fuzz | package | docs]" >&2
    exit 2
    ;;
esac

if ! command -v dpkg-query >/dev/null; then
  echo "This script knows Debian's packages only. Needed here are: $packages" >&2
  exit 1
fi

missing=""
for package in $packages; do
  status=$(dpkg-query --show --showformat='${db:Status-Status}' "$package" 2>/dev/null || true)
  [ "$status" = installed ] || missing="$missing $package"
done
[ -n "$missing" ] || exit 0

echo "Installing:$missing"
as_root=""
if [ "$(id -u)" -ne 0 ]; then
  if ! command -v sudo >/dev/null; then
    echo "Installing packages needs root, and there is no sudo. As root: apt-get install$missing" >&2
    exit 1
  fi
  as_root="sudo"
fi
export DEBIAN_FRONTEND=noninteractive
$as_root apt-get update --quiet=2

# The tests start a directory server of their own: the package must neither set one up nor start it, now or at boot.
case " $missing " in
  *" slapd "*)
    echo "slapd slapd/no_configuration boolean true" | $as_root debconf-set-selections
    if [ ! -e /usr/sbin/policy-rc.d ]; then
      printf '#!/bin/sh\nexit 101\n' | $as_root tee /usr/sbin/policy-rc.d >/dev/null
      $as_root chmod 755 /usr/sbin/policy-rc.d
      trap '$as_root rm -f /usr/sbin/policy-rc.d' EXIT
    fi
    ;;
esac

# shellcheck disable=SC2086  # one word a package
$as_root apt-get install --yes --quiet=2 --no-install-recommends $missing

case " $missing " in
  *" slapd "*) $as_root update-rc.d slapd disable >/dev/null 2>&1 || true ;;
esac
