#!/bin/sh
# The road of a package from its installation to its removal, as root of a bare system. Run by try-packages.sh.
set -eu
export DEBIAN_FRONTEND=noninteractive LC_ALL=C.UTF-8
cd /root

listing() {
  find / -xdev -not -path '/proc/*' -not -path '/sys/*' -not -path '/tmp/*' -not -path '/root/*' -not -path '/srv/*' \
    -not -path '/run/*' -not -path '/etc/*-' -not -path '/var/lib/dpkg/*' -not -path '/var/lib/apt/*' -not -path '/var/cache/*' -not -path '/var/log/*' | sort
}
fail() { echo "$*" >&2; exit 1; }

# What they need, apart, so that it is no trace of them.
needed=$(dpkg-deb --field packages/libqvsa-dev_*.deb Depends; dpkg-deb --field packages/qvsa_*.deb Depends)
apt-get install --yes -qq --no-install-recommends python3 g++ pkgconf \
  $(echo "$needed" | tr ',\n' '  ' | sed 's/([^)]*)//g; s/libqvsa0//g') >/dev/null
listing >before
apt-get install --yes -qq --no-install-recommends ./packages/*.deb >/dev/null

qvsa --version
qvsa secrets make --group qvsa
printf 'Adm1n-first\nSa-first\n' | qvsa init /srv/qvsa >/dev/null
export QVSA_SERVER=file:/srv/qvsa
echo Adm1n-first | qvsa sign-on Admin
# shellcheck disable=SC2046
g++ -std=c++20 examples/sign_on.cpp $(pkg-config --cflags --libs qvsa) -o sign_on
./sign_on "$QVSA_SERVER" ann Ann-pass-1
python3 examples/sign_on.py "$QVSA_SERVER" Admin Adm1n-first
qvsa doctor | grep -i secrets
ldd /usr/bin/qvsa | grep 'not found' && fail "a library is missing"
if setpriv --reuid=nobody --clear-groups qvsa doctor; then fail "a stranger reads the secrets"; fi
getent passwd qvsa-agent >/dev/null || fail "the agent has no account"

rm /etc/qvsa/secrets
apt-get purge --yes -qq qvsa libqvsa0 libqvsa-dev python3-qvsa >/dev/null
getent passwd qvsa-agent && fail "the agent's account is left"
getent group qvsa && fail "the group is left"
listing >after
diff before after || fail "something is left"
[ -e /srv/qvsa/QVSys.db ] || fail "the data is gone"
echo "Nothing is left but the data."
