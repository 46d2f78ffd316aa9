#!/bin/sh
# Builds the library without each of its parts, and calls what is missing: that has to fail with a number and a text.
set -eu
cd "$(dirname "$0")/.."
scratch=$(mktemp -d)
trap 'rm -rf "$scratch"' EXIT
export PYTHONPATH=bindings/python PYTHONDONTWRITEBYTECODE=1 QVSA_SECRETS=

# built NAME OPTIONS...: configures and builds build/options/NAME.
built() {
  name=$1
  shift
  echo "== $name: $*"
  cmake -S . -B "build/options/$name" -G Ninja -DCMAKE_BUILD_TYPE=Debug -DQVSA_TESTS=OFF -DQVSA_EXAMPLES=OFF "$@" \
    --log-level=WARNING
  cmake --build "build/options/$name" -j "$(nproc)"
  export QVSA_LIBRARY="$PWD/build/options/$name/packaging/libqvsa.so"
}

# refused TEXT SERVER TYPE: a sign-on of an account of that type.
refused() {
  python3 - "$@" <<'PYTHON'
import sys, qvsa
text, server, kind = sys.argv[1], sys.argv[2], qvsa.userTypes(int(sys.argv[3]))
user = qvsa.User(server, "QVApp")
try:
    if server.startswith("file:"):
        user.Name = user.Login = kind.name
        user.deptId, user.uType, user.Domain, user.dn = "_root", kind, "DOMAIN", "cn=ann"
        user.Save()
    user.loginAuth(kind.name, "a password")
except qvsa.Failure as failure:
    print(failure)
    assert failure.number == qvsa.number(0x80004005) and text in failure.text, "another failure"
else:
    sys.exit("the missing part answers")
PYTHON
}

installation() {
  printf 'Adm1n-first\nSa-first\n' | "build/options/$1/console/qvsa" init "$scratch/$1" >/dev/null
}

built parts -DQVSA_SQLSERVER=OFF -DQVSA_LDAP=OFF -DQVSA_NTLM=OFF
installation parts
refused "SQL Server" somewhere 0
refused LDAP "file:$scratch/parts" 3
refused NTLM "file:$scratch/parts" 1
ldd "$QVSA_LIBRARY" | grep -E 'odbc|ldap|gssapi' && exit 1

built server -DQVSA_SQLSERVER=OFF -DQVSA_CONSOLE=OFF
refused "SQL Server" somewhere 0
built directory -DQVSA_LDAP=OFF
installation directory
refused LDAP "file:$scratch/directory" 3
built domain -DQVSA_NTLM=OFF
installation domain
refused NTLM "file:$scratch/domain" 1
built library -DQVSA_CONSOLE=OFF -DQVSA_INSTALL=OFF
