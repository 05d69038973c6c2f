It makes the configuration the same as another file's, in one write, after a backup, and keeps the
comments and the order:

    $ export NO_COLOR=1
    $ . "$TOOLS/scratch.sh"
    $ cp oruslapd.conf original
    $ sed -e '/^#/d' -e 's/^oru-slapdPort: 389$/oru-slapdPort: 1389/' original > wanted
    $ sed -i -e '/^dn: cn=Hardware Token/,/^$/d' -e '/^dn: cn=Revocation Lists/i dn: cn=New, cn=TLS, cn=Configuration\ncn: New\n' wanted
    $ cfg32 diff oruslapd.conf wanted --format text
    - cn=Hardware Token, cn=TLS, cn=Configuration
    -   cn: Hardware Token
    -   objectclass: top
    -   objectclass: oruTlsToken
    -   oru-slapdSslPKCS11AcceleratorMode: SYMMETRIC
    -   oru-slapdSslPKCS11AcceleratorMode: RANDOM
    -   oru-slapdSslPKCS11TokenPW: ********
      cn=Client Listener, cn=Network, cn=Configuration
    -   oru-slapdPort: 389
    +   oru-slapdPort: 1389
    + cn=New, cn=TLS, cn=Configuration
    +   cn: New
    [1]
    $ cfg32 -f oruslapd.conf apply --dry-run wanted | grep '^+oru-slapdPort: 1'
    cfg32: oruslapd.conf: besides, the write sorts attributes, joins continued lines and prints names in one form
    +oru-slapdPort: 1389
    $ cmp original oruslapd.conf
    $ cfg32 -f oruslapd.conf apply wanted
    $ cfg32 diff oruslapd.conf wanted
    $ cmp original oruslapd.conf.bak
    $ grep -c '^# Plain port' oruslapd.conf
    1

What is the same already is left alone:

    $ state_of oruslapd.conf > state
    $ cfg32 -f oruslapd.conf apply wanted
    unchanged
    $ cfg32 -f oruslapd.conf apply wanted --json | tee result
    {
      "file": "oruslapd.conf",
      "result": "unchanged",
      "dryRun": false,
      "skipped": []
    }
    $ "$TOOLS/valid_json" changes < result
    valid
    $ state_of oruslapd.conf | cmp - state

The changes of diff do the same when modify takes them:

    $ cp original oruslapd.conf
    $ cfg32 diff oruslapd.conf wanted > changes
    [1]
    $ cfg32 -f oruslapd.conf modify < changes
    $ cfg32 diff oruslapd.conf wanted

A file that can't be used whole is not applied: what is left out of it would be deleted here.

    $ printf 'dn: cn=Configuration\noru-slapdPort: 0\n' > doubtful
    $ cfg32 -f oruslapd.conf apply doubtful
    cfg32: doubtful: read from a private copy, because not all of it can be used (`cfg32 check` tells more):
      line 2: Integer value out of range, kept as oru-slapdInvalidLine
    cfg32: doubtful can't be used whole: mend it first
    [3]
    $ cfg32 -f oruslapd.conf apply nowhere
    cfg32: nowhere: No such file or directory [Connection error (91)]
    [3]
