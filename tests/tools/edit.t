The editor here is a script that does to its file what sed is told, or what the test says:

    $ export NO_COLOR=1
    $ . "$TOOLS/scratch.sh"
    $ in_terminal() { "$TOOLS"/in_terminal "$@" | sed "s|$TMPDIR/cfg32-[^/]*|PRIVATE|"; }
    $ unset VISUAL
    $ export EDITOR=$PWD/editor
    $ edit_by() { printf '#!/bin/sh\n%s\n' "$1" > editor; chmod +x editor; }
    $ replace() { edit_by "sed -i '$1' \"\$1\""; }
    $ set -o pipefail
    $ listener="cn=Client Listener, cn=Network, cn=Configuration"
    $ export TMPDIR=$PWD/private && mkdir private

A good edit is written as it stands, after a backup, and the private copy goes:

    $ cp oruslapd.conf before.conf
    $ replace 's/^oru-slapdPort: 389$/oru-slapdPort:1389/'
    $ in_terminal -- cfg32 -f oruslapd.conf edit
    $ diff before.conf oruslapd.conf
    119c119
    < oru-slapdPort: 389
    ---
    > oru-slapdPort:1389
    [1]
    $ cmp before.conf oruslapd.conf.bak
    $ ls private

One entry is edited by itself, with the comment above it:

    $ edit_by 'cat "$1"'
    $ in_terminal -- cfg32 -f oruslapd.conf edit "$listener"
    # The port of all clients.
    unchanged

What is left as it was is not written:

    $ state_of oruslapd.conf > state
    $ edit_by true
    $ in_terminal -- cfg32 -f oruslapd.conf edit
    unchanged
    $ state_of oruslapd.conf | cmp - state

A dry run shows what would be written:

    $ replace 's/1389/2389/'
    $ in_terminal -- cfg32 -f oruslapd.conf edit -n "$listener"
    x
    $ state_of oruslapd.conf | cmp - state

A bad edit is shown at its lines; the editor is opened again on it, and then it is good:

    $ edit_by 'sed -i "s/99999/3389/; s/1389/99999/" "$1"'
    $ in_terminal 'drop?' e -- cfg32 -f oruslapd.conf edit "$listener"
    x
    $ cfg32 -f oruslapd.conf get "$listener" oru-slapdPort
    3389

What only a load would put aside may be written, on demand:

    $ replace 's/3389/99999/'
    $ in_terminal 'drop?' w -- cfg32 -f oruslapd.conf edit "$listener"
    x
    $ grep -n 99999 oruslapd.conf
    119:oru-slapdPort:99999

A dropped edit leaves the file alone:

    $ state_of oruslapd.conf > state
    $ replace 's/99999/88888/'
    $ in_terminal 'drop?' d -- cfg32 -f oruslapd.conf edit "$listener"
    x
    $ state_of oruslapd.conf | cmp - state
    $ ls private

What can't be loaded is never written, and writing it is not offered:

    $ replace 's/^dn:.*/dn: no name/'
    $ in_terminal 'drop?' w 'drop?' d -- cfg32 -f oruslapd.conf edit "$listener"
    x
    $ state_of oruslapd.conf | cmp - state

When nobody answers nothing is written, and the edit is kept:

    $ cfg32 -f oruslapd.conf edit "$listener" < /dev/null 2>&1 | sed "s|$TMPDIR/cfg32-[^/]*|PRIVATE|"
    x
    $ state_of oruslapd.conf | cmp - state
    $ cat private/*/* && rm -r private/*

A change that somebody else made meanwhile is noticed; both are kept:

    $ edit_by 'cfg32 -f oruslapd.conf set cn=Configuration oru-slapdVersion 9; echo "# Mine." >> "$1"'
    $ in_terminal -- cfg32 -f oruslapd.conf edit "$listener"
    x
    $ cfg32 -f oruslapd.conf get cn=Configuration oru-slapdVersion
    9
    $ cat private/*/* && rm -r private/*

An editor that fails writes nothing:

    $ state_of oruslapd.conf > state
    $ edit_by false
    $ in_terminal -- cfg32 -f oruslapd.conf edit
    x
    $ state_of oruslapd.conf | cmp - state

VISUAL comes before EDITOR:

    $ VISUAL=true EDITOR=false cfg32 -f oruslapd.conf edit
    unchanged

An entry that is not there, or stands there twice, can't be edited by itself:

    $ cfg32 -f oruslapd.conf edit cn=nobody
    x
    $ printf 'dn: cn=a\n\ndn: CN=A\n' > twice.conf
    $ cfg32 -f twice.conf edit cn=a
    x

A file that can't be loaded is edited until it can:

    $ printf 'dn: no name\ncn: x\n\ndn: cn=Configuration\ncn: x\n' > broken.conf
    $ replace 's/no name/cn=x/'
    $ cfg32 -f broken.conf edit
    $ cat broken.conf
