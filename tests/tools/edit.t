The editor here is a script that does to its file what sed is told, or what the test says:

    $ export NO_COLOR=1
    $ . "$TOOLS/scratch.sh"
    $ in_terminal() { "$TOOLS"/in_terminal "$@" | sed "s|$TMPDIR/cfg32-[^/]*|PRIVATE|; s|$PWD/||"; }
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
    $ diff -U0 before.conf oruslapd.conf | grep '^[-+]oru'
    -oru-slapdPort: 389
    +oru-slapdPort:1389
    [1]
    $ cmp before.conf oruslapd.conf.bak
    $ ls private

One entry is edited by itself, with the comment above it:

    $ edit_by 'cat "$1"'
    $ in_terminal -- cfg32 -f oruslapd.conf edit "$listener"
    # Plain port, kept for StartTLS clients; see also cn=TLS below.
    dn: cn=Client Listener, cn=Network, cn=Configuration
    cn: Client Listener
    objectclass: top
    objectclass: oruListener
    oru-slapdIpAddress: 192.0.2.10
    oru-slapdPort:1389
    oru-slapdSecurePort: 636
    oru-slapdSecurity: SSLTLS
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
    --- oruslapd.conf
    +++ oruslapd.conf
    @@ -115,7 +115,7 @@
     objectclass: top
     objectclass: oruListener
     oru-slapdIpAddress: 192.0.2.10
    -oru-slapdPort:1389
    +oru-slapdPort:2389
     oru-slapdSecurePort: 636
     oru-slapdSecurity: SSLTLS
     
    $ state_of oruslapd.conf | cmp - state

A bad edit is shown at its lines; the editor is opened again on it, and then it is good:

    $ edit_by 'sed -i "s/99999/3389/; s/1389/99999/" "$1"'
    $ in_terminal '(d)rop?' e -- cfg32 -f oruslapd.conf edit "$listener"
    PRIVATE/oruslapd.conf:7:15: error: Integer value out of range [invalid-value]
        7 | oru-slapdPort:99999
          |               ^~~~~
          = accepted: an integer from 1 to 65535
    1 error
    (e)dit again, (w)rite or (d)rop? e
    $ cfg32 -f oruslapd.conf get "$listener" oru-slapdPort
    3389

What only a load would put aside may be written, on demand:

    $ replace 's/3389/99999/'
    $ in_terminal '(d)rop?' w -- cfg32 -f oruslapd.conf edit "$listener"
    PRIVATE/oruslapd.conf:7:15: error: Integer value out of range [invalid-value]
        7 | oru-slapdPort:99999
          |               ^~~~~
          = accepted: an integer from 1 to 65535
    1 error
    (e)dit again, (w)rite or (d)rop? w
    $ grep -n 99999 oruslapd.conf
    118:oru-slapdPort:99999

A dropped edit leaves the file alone:

    $ state_of oruslapd.conf > state
    $ replace 's/99999/88888/'
    $ in_terminal '(d)rop?' d -- cfg32 -f oruslapd.conf edit "$listener"
    PRIVATE/oruslapd.conf:7:15: error: Integer value out of range [invalid-value]
        7 | oru-slapdPort:88888
          |               ^~~~~
          = accepted: an integer from 1 to 65535
    1 error
    (e)dit again, (w)rite or (d)rop? d
    cfg32: dropped; nothing was written
    [1]
    $ state_of oruslapd.conf | cmp - state
    $ ls private

What can't be loaded is never written, and writing it is not offered:

    $ replace 's/^dn:.*/dn: no name/'
    $ in_terminal '(d)rop?' w '(d)rop?' d -- cfg32 -f oruslapd.conf edit "$listener"
    PRIVATE/oruslapd.conf:2:8: error: Invalid character in RDN attribute: n [invalid-dn]
        2 | dn: no name
          |        ^
          = accepted: a distinguished name, such as cn=Name, cn=Configuration
    PRIVATE/oruslapd.conf:7:15: error: Integer value out of range [invalid-value]
        7 | oru-slapdPort:99999
          |               ^~~~~
          = accepted: an integer from 1 to 65535
    2 errors
    cfg32: this can't be loaded, so it can't be written
    (e)dit again or (d)rop? w
    (e)dit again or (d)rop? d
    cfg32: dropped; nothing was written
    [1]
    $ state_of oruslapd.conf | cmp - state

When nobody answers nothing is written, and the edit is kept:

    $ cfg32 -f oruslapd.conf edit "$listener" < /dev/null 2>&1 | sed "s|$TMPDIR/cfg32-[^/]*|PRIVATE|"
    PRIVATE/oruslapd.conf:2:8: error: Invalid character in RDN attribute: n [invalid-dn]
        2 | dn: no name
          |        ^
          = accepted: a distinguished name, such as cn=Name, cn=Configuration
    PRIVATE/oruslapd.conf:7:15: error: Integer value out of range [invalid-value]
        7 | oru-slapdPort:99999
          |               ^~~~~
          = accepted: an integer from 1 to 65535
    2 errors
    cfg32: this can't be loaded, so it can't be written
    (e)dit again or (d)rop? 
    what you edited is kept in PRIVATE/oruslapd.conf
    cfg32: nobody answered; nothing was written
    [3]
    $ state_of oruslapd.conf | cmp - state
    $ cat private/*/* && rm -r private/*
    # Plain port, kept for StartTLS clients; see also cn=TLS below.
    dn: no name
    cn: Client Listener
    objectclass: top
    objectclass: oruListener
    oru-slapdIpAddress: 192.0.2.10
    oru-slapdPort:99999
    oru-slapdSecurePort: 636
    oru-slapdSecurity: SSLTLS

A change that somebody else made meanwhile is noticed; both are kept:

    $ edit_by 'sed -i "s/99999/3389/" "$1"; cfg32 -f oruslapd.conf set cn=Configuration oru-slapdVersion 9'
    $ in_terminal -- cfg32 -f oruslapd.conf edit "$listener"
    cfg32: oruslapd.conf: not all of it could be used (`cfg32 check` tells more):
      line 118: Integer value out of range, kept as oru-slapdInvalidLine
    what you edited is kept in PRIVATE/oruslapd.conf
    cfg32: oruslapd.conf: Configuration file was changed meanwhile [DSA is busy (51)]
    [3]
    $ cfg32 -f oruslapd.conf get cn=Configuration oru-slapdVersion
    9
    $ cat private/*/* && rm -r private/*
    # Plain port, kept for StartTLS clients; see also cn=TLS below.
    dn: cn=Client Listener, cn=Network, cn=Configuration
    cn: Client Listener
    objectclass: top
    objectclass: oruListener
    oru-slapdIpAddress: 192.0.2.10
    oru-slapdPort:3389
    oru-slapdSecurePort: 636
    oru-slapdSecurity: SSLTLS

An editor that fails writes nothing:

    $ state_of oruslapd.conf > state
    $ edit_by false
    $ in_terminal -- cfg32 -f oruslapd.conf edit
    cfg32: the editor failed: editor (VISUAL or EDITOR names another)
    [3]
    $ state_of oruslapd.conf | cmp - state

A signal at the question ends it, and says where the draft is:

    $ replace 's/^oru-slapdVersion: .*/oru-slapdVersion/'
    $ EDITOR="echo \$PPID > asking; $EDITOR" setsid -w cfg32 -f oruslapd.conf edit cn=Configuration < <(sleep 1; kill -INT "$(cat asking)"; sleep 1) 2>&1 | tail -1 | sed "s|$TMPDIR/cfg32-[^/]*|PRIVATE|"
    what you edited is kept in PRIVATE/oruslapd.conf
    [130]
    $ rm -r private/*

Whichever it is that ends a program:

    $ for signal in HUP ALRM PIPE USR1 XCPU; do EDITOR="kill -$signal \$PPID; true" cfg32 -f oruslapd.conf edit 2>&1 | tail -1 | sed "s|$TMPDIR/cfg32-[^/]*|PRIVATE|"; done 2>/dev/null
    what you edited is kept in PRIVATE/oruslapd.conf
    what you edited is kept in PRIVATE/oruslapd.conf
    what you edited is kept in PRIVATE/oruslapd.conf
    what you edited is kept in PRIVATE/oruslapd.conf
    what you edited is kept in PRIVATE/oruslapd.conf
    [152]
    $ rm -r private/*

The same when what would change reaches nobody:

    $ edit_by 'sed -i "s/^# Plain port/# That port/" "$1"; until [ -e gone ]; do sleep 0.01; done'
    $ cfg32 -f before.conf edit -n 2> told | { exec <&-; touch gone; }
    [141]
    $ sed "s|$TMPDIR/cfg32-[^/]*|PRIVATE|" told
    
    what you edited is kept in PRIVATE/before.conf
    $ grep -c '^# That port' private/*/before.conf && rm -r private/*
    1
    $ cfg32 -f before.conf edit -n 2>&1 > /dev/full | sed "s|$TMPDIR/cfg32-[^/]*|PRIVATE|"
    what you edited is kept in PRIVATE/before.conf
    cfg32: what would change can't be shown
    cfg32: standard output can't be written
    [3]
    $ rm -r private/*

When there is no draft any more, none is told of:

    $ edit_by 'until [ -e gone ]; do sleep 0.01; done'
    $ rm gone && cfg32 -f before.conf edit | { exec <&-; touch gone; }
    [141]
    $ ls private

An entry that its edit makes the same as another is a problem elsewhere in the file:

    $ replace 's/^dn: .*/dn: cn=Referrals, cn=Network, cn=Configuration/'
    $ in_terminal '(d)rop?' d -- cfg32 -f oruslapd.conf edit "$listener" | grep -c 'stands twice'
    1
    [1]

The administrator's name and password must be right, when they are given:

    $ echo wrong > password
    $ cfg32 -f oruslapd.conf --key-file oruslapd.key -D cn=root -y password edit
    cfg32: oruslapd.conf: not the administrator's DN and password [Invalid credentials (49)]
    [3]

VISUAL comes before EDITOR:

    $ VISUAL=true EDITOR=false cfg32 -f oruslapd.conf edit
    unchanged

An entry that is not there, or stands there twice, can't be edited by itself:

    $ cfg32 -f oruslapd.conf edit cn=nobody
    cfg32: no entry cn=nobody [No such object (32)]
    [1]
    $ printf 'dn: cn=a\n\ndn: CN=A\n' > twice.conf
    $ cfg32 -f twice.conf edit cn=a
    cfg32: cn=a stands in the file several times: edit the whole file
    [1]

A file that can't be loaded is edited until it can:

    $ printf 'dn: no name\ncn: x\n\ndn: cn=Configuration\ncn: x\n' > broken.conf
    $ replace 's/no name/cn=x/'
    $ cfg32 -f broken.conf edit
    $ cat broken.conf
    dn: cn=x
    cn: x
    
    dn: cn=Configuration
    cn: x

Without room for it the file stays as it was, and the edit is kept:

    $ state_of broken.conf > state
    $ edit_by 'ulimit -S -f unlimited; yes "# a comment" | head -1000 > comments; cat comments "$1" > both; cat both > "$1"'
    $ (ulimit -S -f 8; cfg32 -f broken.conf edit 2>&1 || echo "[$?]") | sed "s|$TMPDIR/cfg32-[^/]*|PRIVATE|"
    what you edited is kept in PRIVATE/broken.conf
    cfg32: broken.conf: System error writing file [Unknown error (80)]
      system error: File too large
    [3]
    $ state_of broken.conf | cmp - state
    $ cat private/*/* | wc -l && rm -r private/*
    1005

So it is when an editor moves the draft away, or keeps it locked:

    $ edit_by 'mv "$1" "$1.new"'
    $ cfg32 -f broken.conf edit 2>&1 | sed "s|$TMPDIR/cfg32-[^/]*|PRIVATE|"
    what you edited is kept in PRIVATE
    cfg32: PRIVATE/broken.conf: No such file or directory [Connection error (91)]
    [3]
    $ ls private/* && rm -r private/*
    broken.conf.new
    $ edit_by '(flock 9; sleep 3) 9< "$1" > /dev/null 2>&1 & sleep 0.2; echo "# more" >> "$1"'
    $ cfg32 -f broken.conf edit && tail -1 broken.conf
    # more

Of an entry's draft the lines are the draft's, and of the rest the file's:

    $ . "$TOOLS/scratch.sh"
    $ edit_by 'printf "oru-slapdPort: 1\noru-slapdPort: 2\n" >> "$1"'
    $ in_terminal '(d)rop?' d -- cfg32 -f oruslapd.conf edit "$listener"
    PRIVATE/oruslapd.conf:10:16: error: another value of oru-slapdPort, which takes only one; the first one stands on line 7 [second-value]
       10 | oru-slapdPort: 1
          |                ^
          = accepted: one value
    PRIVATE/oruslapd.conf:11:16: error: another value of oru-slapdPort, which takes only one; the first one stands on line 7 [second-value]
       11 | oru-slapdPort: 2
          |                ^
          = accepted: one value
    2 errors
    (e)dit again, (w)rite or (d)rop? d
    cfg32: dropped; nothing was written
    [1]
    $ edit_by 'sed -i "s/^dn:.*/dn: cn=Referrals, cn=Network, cn=Configuration\n# 1\n# 2/" "$1"'
    $ in_terminal '(d)rop?' d -- cfg32 -f oruslapd.conf edit "$listener"
    oruslapd.conf:170:5: warning: entry stands twice, the first one on line 2 of what you edited; the next rewrite merges them [duplicate-entry]
      170 | dn: cn=Referrals, cn=Network, cn=Configuration
          |     ^~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~
    oruslapd.conf:171:5: error: another value of cn, which takes only one; the first one stands on line 5 of what you edited [second-value]
      171 | cn: Referrals
          |     ^~~~~~~~~
          = accepted: one value
    1 error, 1 warning
    (e)dit again, (w)rite or (d)rop? d
    cfg32: dropped; nothing was written
    [1]

A draft without text deletes the entry; what follows it is the file's:

    $ printf 'dn: cn=Configuration\ncn: x\n\ndn: cn=a, cn=Configuration\ncn: a\n\ndn: cn=b, cn=a, cn=Configuration\ncn: b\n\n' > tree.conf
    $ edit_by ': > "$1"'
    $ in_terminal '(d)rop?' w -- cfg32 -f tree.conf edit "cn=a, cn=Configuration"
    tree.conf:7:5: warning: no entry "cn=a, cn=Configuration" above this one [missing-ancestor]
        7 | dn: cn=b, cn=a, cn=Configuration
          |     ^~~~~~~~~~~~~~~~~~~~~~~~~~~~
    1 warning
    (e)dit again, (w)rite or (d)rop? w
    $ cat tree.conf
    dn: cn=Configuration
    cn: x
    
    
    dn: cn=b, cn=a, cn=Configuration
    cn: b
    
