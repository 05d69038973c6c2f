#!/bin/sh
# The example program changes a copy of the example configuration as it says, and leaves the version
# before its last change in the backup.
. "$(dirname "$0")/scratch.sh"

change() {
    echo Correct-Horse-7 | "$program" "$@"
}

echo "with a wrong password nothing is written"
fails wrong oruslapd.conf oruslapd.backup oruslapd.key cn=root
test "$(cat errors)" = "bind: Invalid credentials"
cmp "$examples/oruslapd.conf" oruslapd.conf
test ! -e oruslapd.backup

echo "it prints what is expected"
change oruslapd.conf oruslapd.backup oruslapd.key cn=root >output
diff "$examples/change_config.expected" output

echo "the file has all changes, the backup all but the last"
for file in oruslapd.conf oruslapd.backup; do
    grep -q '^dn: cn=Night Listener, cn=Network, cn=Configuration$' "$file"
    grep -q '^oru-slapdPort: 1389$' "$file"
    if grep -q 'Old Mail System' "$file"; then
        exit 1
    fi
done
diff oruslapd.backup oruslapd.conf >differences && exit 1
test "$(grep '^[<>]' differences)" = "< oru-slapdPort: 3538
> oru-slapdPort: 3539"

echo "a change that is refused is reported, and both files stay"
cp oruslapd.conf file_before
cp oruslapd.backup backup_before
fails Correct-Horse-7 oruslapd.conf oruslapd.backup oruslapd.key cn=root
grep -q '^delete the old mail system: No such object$' errors
grep -q '^Config file: oruslapd.conf$' errors
grep -q '^entry dn: cn=Old Mail System, cn=Pass-Through, cn=Configuration$' errors
cmp file_before oruslapd.conf
cmp backup_before oruslapd.backup

echo "without a folder for the backup nothing is changed"
cp "$examples/oruslapd.conf" other.conf
fails Correct-Horse-7 other.conf no/such/folder/backup oruslapd.key cn=root
grep -q '^delete the old mail system: Insufficient access$' errors
cmp "$examples/oruslapd.conf" other.conf

echo "a missing key and a missing file are reported with their names"
fails Correct-Horse-7 oruslapd.conf oruslapd.backup no.key cn=root
grep -q '^no.key: No such file or directory$' errors
fails Correct-Horse-7 no.conf oruslapd.backup oruslapd.key cn=root
grep -q '^Config file: no.conf$' errors

echo "other arguments are answered with the usage"
fails Correct-Horse-7 oruslapd.conf
grep -q '^usage: ' errors
