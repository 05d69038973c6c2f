#!/bin/sh
# Programs with an LDAP client's header and without it agree about the records, and change a file
# alike. usage: ldap_client_test.sh <scratch folder> <program>...
set -eu
scratch=$1
shift
rm -rf "$scratch"
mkdir -p "$scratch"
cd "$scratch"

cat >before <<'TEXT'
charset: UTF-8
version: 1

dn: cn=Configuration
cn: Configuration
objectclass: top

dn: cn=Gone, cn=Configuration
cn: Gone

dn: cn=Old, cn=Configuration
note: old
oru-slapdPort: 389

TEXT

cat >expected <<'TEXT'
charset: UTF-8
version: 1

dn: cn=Configuration
cn: Configuration
objectclass: top

dn: cn=Old, cn=Configuration
note: binary
oru-slapdPort: 1389

dn: cn=New, cn=Configuration
cn: New
note: binary

TEXT

first=
for program; do
    name=$(basename "$program")
    cp before "$name.conf"
    "$program" "$name.conf" >"$name.layout"
    diff expected "$name.conf"
    test -s "$name.layout"
    first=${first:-$name}
    diff "$first.layout" "$name.layout"
    echo "$name: as $first"
done
