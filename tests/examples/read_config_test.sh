#!/bin/sh
# The example program reads the example configuration as the README shows it, and leaves the file
# as it was.
# usage: read_config_test.sh <read_config> <examples folder> <scratch folder>
set -eu
program=$1 examples=$2 scratch=$3
rm -rf "$scratch"
mkdir -p "$scratch"
cp "$examples/oruslapd.conf" "$scratch/"
install -m 600 "$examples/oruslapd.key" "$scratch/"
cd "$scratch"
# The example file is UTF-8 text.
LC_ALL=C.UTF-8
export LC_ALL
echo Correct-Horse-7 | "$program" oruslapd.conf oruslapd.key cn=root >output
diff "$examples/read_config.expected" output
cmp "$examples/oruslapd.conf" oruslapd.conf

echo "a wrong password is told from a right one"
if echo wrong | "$program" oruslapd.conf oruslapd.key cn=root >output 2>errors; then
    exit 1
fi
test ! -s output
test "$(cat errors)" = "bind: Invalid credentials"

echo "a missing file is reported with its name"
if echo wrong | "$program" no.conf oruslapd.key cn=root >output 2>errors; then
    exit 1
fi
grep -q '^Config file: no.conf$' errors
