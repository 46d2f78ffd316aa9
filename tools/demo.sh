#!/bin/sh
# A fresh embedded installation, an organisation in it, and the road of a sign-on through it. Run by `make demo`.
# QVSA_ORGANISATION names the folder of an organisation's files; set to nothing, one is made up. Where it is not set, one
# beside the project is taken, else one made up.
set -eu
cd "$(dirname "$0")/.."

programs=build/release
folder=build/demo
organisation=${QVSA_ORGANISATION-../shared/organisation}

rm -rf "$folder"
mkdir -p "$folder"

if [ -z "$organisation" ] || [ ! -f "$organisation/departments.csv" ]; then
  if [ -n "${QVSA_ORGANISATION:-}" ]; then
    echo "There is no departments.csv in QVSA_ORGANISATION ($QVSA_ORGANISATION)." >&2
    exit 1
  fi
  organisation="$folder/organisation"
  "$programs/examples/made_up_organisation" "$organisation"
  echo "An organisation of a real one's shape and size is made up."
fi

export QVSA_SERVER="file:$PWD/$folder/installation"

echo
echo "== An embedded installation =="
"$programs/console/qvsa" init --make-passwords

echo
echo "== The organisation of $organisation =="
"$programs/console/qvsa" import organisation "$organisation" </dev/null

echo
echo "== The road of a sign-on =="
login=$(sed -n 2p "$organisation/users.csv" | cut -d, -f1)
"$programs/examples/sign_on_road" "$QVSA_SERVER" "$login"

echo
echo "== A walk through the organisation =="
login=$(cut -d, -f1 "$organisation/holdings.csv" | sed 1d | sort | uniq -c | sort -rn | awk 'NR == 1 { print $2 }')
"$programs/examples/organisation_walk" "$QVSA_SERVER" "$login"

echo
echo "== From the application to the account =="
"$programs/examples/registration_road" "$QVSA_SERVER"

echo
echo "== The system log and the report classes =="
"$programs/examples/log_and_classes" "$QVSA_SERVER" "$PWD/$folder/log.txt"

echo
echo "== A backup, and a plan for those to come =="
mkdir "$folder/backups"
"$programs/console/qvsa" backup now "$PWD/$folder/backups"
"$programs/console/qvsa" plan add Nightly "$PWD/$folder/backups" --at 02:00 --keep 14

echo
echo "== What the console sees now =="
"$programs/console/qvsa" role list
echo
"$programs/console/qvsa" dept tree | head -30
echo "..."
echo
"$programs/console/qvsa" log list --type 2
echo
"$programs/console/qvsa" class tree
echo
"$programs/console/qvsa" sessions list
echo
"$programs/console/qvsa" doctor
