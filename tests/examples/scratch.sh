# What the tests of the example programs share, which read this file first: a scratch folder with a
# private copy of the example configuration and its key, as the working directory, and a locale for
# it.
# usage: <test> <program> <examples folder> <scratch folder>
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

# fails <password> <argument>...: the program fails; its reports are in the file "errors", and what
# it has printed is in "output".
fails() {
    password=$1
    shift
    if echo "$password" | "$program" "$@" >output 2>errors; then
        echo "$program $* succeeds" >&2
        exit 1
    fi
}
