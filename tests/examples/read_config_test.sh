#!/bin/sh
# The example program reads the example configuration as the README shows it, and leaves the file
# as it was.
. "$(dirname "$0")/scratch.sh"
echo Correct-Horse-7 | "$program" oruslapd.conf oruslapd.key cn=root >output
diff "$examples/read_config.expected" output
cmp "$examples/oruslapd.conf" oruslapd.conf

echo "a wrong password is told from a right one"
fails wrong oruslapd.conf oruslapd.key cn=root
test ! -s output
test "$(cat errors)" = "bind: Invalid credentials"

echo "a missing file is reported with its name"
fails wrong no.conf oruslapd.key cn=root
grep -q '^Config file: no.conf$' errors
