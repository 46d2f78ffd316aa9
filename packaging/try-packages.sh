#!/bin/sh
# Installs the packages in a bare root, makes an installation, signs a user on in the console, in C++ and in Python,
# removes them, and looks for what they left.
#   try-packages.sh FOLDER-OF-PACKAGES
set -eu
packages=$(cd "$1" && pwd)
sources=$(cd "$(dirname "$0")/.." && pwd)
suite=$(. /etc/os-release && echo "$VERSION_CODENAME")

mmdebstrap --quiet --variant=apt "$suite" \
  --customize-hook="copy-in $packages $sources/examples $sources/packaging/road.sh /root" \
  --customize-hook='chroot "$1" sh /root/road.sh' /dev/null
