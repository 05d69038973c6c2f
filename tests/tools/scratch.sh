# Sourced by transcripts: a copy of the example configuration and its key in the current folder, as
# the file that every command works on.
cp "$EXAMPLES/oruslapd.conf" oruslapd.conf
install -m 600 "$EXAMPLES/oruslapd.key" oruslapd.key
chmod 644 oruslapd.conf

# Prints what would show that a file was written to.
state_of() {
    stat --format='%i %y %s' "$1"
    sha256sum "$1"
}
