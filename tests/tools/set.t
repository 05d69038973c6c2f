The commands that change one attribute, `set` and `unset`.

    $ set -o pipefail
    $ "$TOOLS"/example_of_changes
    $ listener="cn=Listener, cn=Network, cn=Configuration"

A dry run prints the change and leaves the file, its times and its neighbours alone:

    $ stat -c "%y %z %i" conf > before; cp conf conf.before
    $ cfg32 -f conf set -n "$listener" oru-slapdPort 1389
    --- conf
    +++ conf
    @@ -14,7 +14,7 @@
     # Plain port.
     dn: cn=Listener, cn=Network, cn=Configuration
     cn: Listener
    -oru-slapdPort: 389
    +oru-slapdPort: 1389
     oru-slapdSuffix: o=x
     oru-slapdSuffix: o=y
     
    $ stat -c "%y %z %i" conf | cmp - before && cmp conf conf.before && ls
    before
    conf
    conf.before

A change is made without a word, after a backup:

    $ cfg32 -f conf set "$listener" oru-slapdPort 1389
    $ diff -U0 conf.before conf | tail -n +3
    @@ -17 +17 @@
    -oru-slapdPort: 389
    +oru-slapdPort: 1389
    [1]
    $ cmp conf.before conf.bak

What is set already is not set again:

    $ stat -c "%y %z %i" conf conf.bak > before
    $ cfg32 -f conf set "$listener" oru-slapdPort 1389
    unchanged
    $ cfg32 -f conf set -n "$listener" oru-slapdport 01389
    unchanged
    $ cfg32 -f conf set --json "$listener" oru-slapdPort 1389
    {
      "file": "conf",
      "result": "unchanged",
      "dryRun": false,
      "skipped": []
    }
    $ stat -c "%y %z %i" conf conf.bak | cmp - before

The values take the place of all there are, in their order; the table's spelling of the name is used:

    $ cfg32 -f conf set "$listener" ORU-SLAPDSUFFIX o=z o=x
    $ grep -i suffix conf
    oru-slapdSuffix: o=z
    oru-slapdSuffix: o=x
    $ cfg32 -f conf set -n --json "$listener" oru-slapdEntryCacheSize 10
    {
      "file": "conf",
      "result": "changed",
      "dryRun": true,
      "diff": "--- conf\n+++ conf\n@@ -14,6 +14,7 @@\n # Plain port.\n dn: cn=Listener, cn=Network, cn=Configuration\n cn: Listener\n+oru-slapdEntryCacheSize: 10\n oru-slapdPort: 1389\n oru-slapdSuffix: o=z\n oru-slapdSuffix: o=x\n",
      "skipped": []
    }

A negative number needs no care, other values that begin with "-" stand behind "--":

    $ cfg32 -f conf set "$listener" oru-slapdUlimitNofile -1
    $ cfg32 -f conf set "$listener" oru-slapdSetenv -- -x
    $ grep -e -1 -e -x conf
    oru-slapdSetenv: -x
    oru-slapdUlimitNofile: -1

A value that its syntax refuses is told with the file, the entry and the value:

    $ cfg32 -f conf set "$listener" oru-slapdPort 70000 2>&1 | grep -v accepted:
    cfg32: conf: Integer value out of range [Invalid syntax (21)]
      entry: cn=Listener, cn=Network, cn=Configuration
      oru-slapdPort: 70000
    [3]
    $ cfg32 -f conf set "$listener" oru-slapdPort 1 2 2>&1 | grep -v accepted:
    cfg32: conf: Attribute may not have multiple values. [Constraint violation (19)]
      entry: cn=Listener, cn=Network, cn=Configuration
      oru-slapdPort: 2
    [3]
    $ cfg32 -f conf set "cn=Nobody, cn=Configuration" oru-slapdPort 1
    cfg32: conf: Entry not found [No such object (32)]
      entry: cn=Nobody, cn=Configuration
    [3]
    $ cfg32 -f conf set "Nobody" oru-slapdPort 1
    cfg32: conf: Missing RDN value: Nobody [Invalid DN syntax (34)]
      entry: Nobody
    [3]
    $ cfg32 -f conf set "$listener" oru-slapdSuffix $'o=a\nb' 2>&1 | grep -v accepted:
    cfg32: conf: Attribute would not read back as it is written [Invalid syntax (21)]
      entry: cn=Listener, cn=Network, cn=Configuration
      attribute: oru-slapdSuffix
    [3]

A name that the server does not know is refused, unless it is meant:

    $ cfg32 -f conf set "$listener" x-house-telephone 4410
    cfg32: the server knows no attribute "x-house-telephone"
      hint: --unknown-attribute sets it all the same
    [2]
    $ cfg32 -f conf set --unknown-attribute "$listener" x-house-telephone 4410
    $ grep x-house conf
    x-house-telephone: 4410

Passwords are not taken in clear, where others see them; encoded ones are:

    $ cfg32 -f conf set cn=Configuration oru-slapdAdminPW secret
    cfg32: oru-slapdAdminPW takes no password in clear on the command line, where others see it: use `cfg32 passwd`
    [2]
    $ cfg32 -f conf unset cn=Configuration ORU-SLAPDADMINPW secret
    cfg32: ORU-SLAPDADMINPW takes no password in clear on the command line, where others see it: use `cfg32 passwd`
    [2]
    $ cfg32 -f conf set cn=Configuration oru-slapdAdminPW {SHA}bm90IGEgaGFzaA==
    $ grep oru-slapdAdminPW conf
    oru-slapdAdminPW: {SHA}bm90IGEgaGFzaA==

An attribute goes, or some of its values; what is not there is not missed:

    $ cfg32 -f conf unset "$listener" oru-slapdSuffix o=z o=none
    $ grep -i suffix conf
    oru-slapdSuffix: o=x
    $ cfg32 -f conf unset "$listener" oru-slapdSuffix
    $ grep -ci suffix conf
    0
    [1]
    $ cfg32 -f conf unset "$listener" oru-slapdSuffix
    unchanged
    $ cfg32 -f conf unset --json -n "$listener" oru-slapdSuffix o=z
    {
      "file": "conf",
      "result": "unchanged",
      "dryRun": true,
      "diff": "",
      "skipped": []
    }
    $ cfg32 -f conf unset -n "$listener" x-house-telephone
    --- conf
    +++ conf
    @@ -17,5 +17,4 @@
     oru-slapdPort: 1389
     oru-slapdSetenv: -x
     oru-slapdUlimitNofile: -1
    -x-house-telephone: 4410
     
    $ cfg32 -f conf unset "cn=Nobody, cn=Configuration" x-note
    cfg32: conf: Entry not found [No such object (32)]
      entry: cn=Nobody, cn=Configuration
    [3]

Without values there is nothing to set:

    $ cfg32 -f conf set "$listener" oru-slapdPort
    cfg32: value is required
      hint: `cfg32 set --help` tells what there is
    [2]

The administrator's name and password, when they are given, must be right:

    $ echo wrong > password
    $ cfg32 -f conf -D cn=root -y password set -n "$listener" oru-slapdPort 1
    cfg32: conf: a stored password can't be decoded with this key, or without one [Decoding error (84)]
      entry: cn=Configuration
    [3]
    $ cfg32 -f conf -D cn=root set "$listener" oru-slapdPort 1
    cfg32: -D needs a password: add -W or -y FILE
    [2]

Colours are for people, unless they are asked for:

    $ cfg32 -f conf --color always set -n "$listener" oru-slapdPort 1
    [1m--- conf[0m
    [1m+++ conf[0m
    [36m@@ -14,7 +14,7 @@[0m
     # Plain port.
     dn: cn=Listener, cn=Network, cn=Configuration
     cn: Listener
    [31m-oru-slapdPort: 1389[0m
    [32m+oru-slapdPort: 1[0m
     oru-slapdSetenv: -x
     oru-slapdUlimitNofile: -1
     x-house-telephone: 4410
    $ cfg32 -f conf --color always set --json -n "$listener" oru-slapdPort 1
    {
      "file": "conf",
      "result": "changed",
      "dryRun": true,
      "diff": "--- conf\n+++ conf\n@@ -14,7 +14,7 @@\n # Plain port.\n dn: cn=Listener, cn=Network, cn=Configuration\n cn: Listener\n-oru-slapdPort: 1389\n+oru-slapdPort: 1\n oru-slapdSetenv: -x\n oru-slapdUlimitNofile: -1\n x-house-telephone: 4410\n",
      "skipped": []
    }

A file that does not load, and one that is not there:

    $ sed 's/^dn: .*Network.*/dn: Network/' conf.before > broken
    $ cfg32 -f broken set cn=Configuration oru-slapdVersion 1
    cfg32: broken:11: Missing RDN value: Network [Invalid DN syntax (34)]
      entry: above all entries
      hint: `cfg32 check` tells everything that is wrong
    [3]
    $ cfg32 -f missing set cn=Configuration oru-slapdVersion 1
    cfg32: missing: No such file or directory [Connection error (91)]
    [3]

JSON is UTF-8, whatever the file's name is:

    $ cp conf.before $'conf\xff'
    $ cfg32 -f $'conf\xff' unset --json "$listener" x-none | iconv -f UTF-8 -t UTF-8
    {
      "file": "conf�",
      "result": "unchanged",
      "dryRun": false,
      "skipped": []
    }

A signal at any time leaves the file as it was, or with the change, and nothing beside it:

    $ . "$TOOLS/scratch.sh"
    $ mkdir signals && cp oruslapd.conf signals/conf
    $ cfg32 -f signals/conf set cn=Configuration oru-slapdVersion 1
    $ sed '/^oru-slapdVersion/d' signals/conf > rest
    $ for i in $(seq 100 130); do
    >     timeout -s INT "0.0$((i % 20 + 1))" cfg32 -f signals/conf set cn=Configuration oru-slapdVersion $i
    >     sed '/^oru-slapdVersion/d' signals/conf | cmp - rest
    >     grep -c '^oru-slapdVersion: ' signals/conf
    > done | sort -u
    1
    $ ls -A signals
    conf
    conf.bak
