Setting a password from a prompt.

    $ set -o pipefail
    $ export NO_COLOR=1
    $ "$TOOLS"/example_of_changes
    $ listener="cn=Listener, cn=Network, cn=Configuration"
    $ in_terminal() { "$TOOLS"/in_terminal "$@"; }

It is asked for twice and not shown; what is stored is encoded:

    $ in_terminal "PW: " Isar "Again: " Isar -- cfg32 -f conf passwd cn=Configuration oru-slapdAdminPW
    cfg32: without --key-file the password is only masked, which hides it from nobody who tries
    New oru-slapdAdminPW: 
    Again: 
    $ grep -c "oru-slapdAdminPW: {iMASK}>" conf
    1
    $ grep -c Isar conf conf.bak
    conf:0
    conf.bak:0
    [1]

It is the administrator's from now on:

    $ echo Isar > password
    $ cfg32 -f conf -D cn=root -y password unset cn=Configuration x-none
    unchanged

The same password is not encoded anew:

    $ stat -c "%y %z %i" conf conf.bak > before
    $ in_terminal "PW: " Isar "Again: " Isar -- cfg32 -f conf passwd cn=Configuration oru-slapdAdminPW
    cfg32: without --key-file the password is only masked, which hides it from nobody who tries
    New oru-slapdAdminPW: 
    Again: 
    unchanged
    $ stat -c "%y %z %i" conf conf.bak | cmp - before

The administrator's own password may be asked for as well:

    $ in_terminal "PW: " Inn "Again: " Inn "cn=root: " Isar -- cfg32 -f conf -D cn=root -W passwd -n "$listener" oru-slapdDbUserPW
    cfg32: without --key-file the password is only masked, which hides it from nobody who tries
    New oru-slapdDbUserPW: 
    Again: 
    Password of cn=root: 
    --- conf
    +++ conf
    @@ -14,6 +14,7 @@
     # Plain port.
     dn: cn=Listener, cn=Network, cn=Configuration
     cn: Listener
    +oru-slapdDbUserPW: ********
     oru-slapdPort: 389
     oru-slapdSuffix: o=x
     oru-slapdSuffix: o=y

A dry run shows that it changes, and neither the old one nor the new one:

    $ in_terminal "PW: " Inn "Again: " Inn -- cfg32 -f conf passwd -n cn=Configuration ORU-slapdadminpw
    cfg32: without --key-file the password is only masked, which hides it from nobody who tries
    New oru-slapdAdminPW: 
    Again: 
    --- conf
    +++ conf
    @@ -6,7 +6,7 @@
     cn: Configuration
     objectclass: top
     oru-slapdAdminDN: cn=root
    -oru-slapdAdminPW: ********
    +oru-slapdAdminPW: ********
     
     dn: cn=Network, cn=Configuration
     cn: Network
    $ stat -c "%y %z %i" conf conf.bak | cmp - before
    $ in_terminal "PW: " Inn "Again: " Inn -- cfg32 -f conf passwd -n --json cn=Configuration oru-slapdAdminPW | grep -v -e New -e Again -e cfg32: | python3 -c 'import json, sys; print(json.load(sys.stdin)["diff"])'
    --- conf
    +++ conf
    @@ -6,7 +6,7 @@
     cn: Configuration
     objectclass: top
     oru-slapdAdminDN: cn=root
    -oru-slapdAdminPW: ********
    +oru-slapdAdminPW: ********
     
     dn: cn=Network, cn=Configuration
     cn: Network
    

With a key it is encrypted, and then shown as it is stored:

    $ install -m 600 "$EXAMPLES"/oruslapd.key key
    $ in_terminal "PW: " Inn "Again: " Inn -- cfg32 -f conf --key-file key passwd "$listener" oru-slapdDbUserPW
    New oru-slapdDbUserPW: 
    Again: 
    $ grep -c "oru-slapdDbUserPW: {AES256}" conf
    1

A key encrypts one that is only masked, though it is the same; after that there is nothing to do:

    $ in_terminal "PW: " Inn "Again: " Inn -- cfg32 -f conf passwd cn=Configuration oru-slapdAdminPW | tail -1
    Again: 
    $ in_terminal "PW: " Inn "Again: " Inn -- cfg32 -f conf --key-file key passwd cn=Configuration oru-slapdAdminPW | tail -1
    Again: 
    $ grep -c "oru-slapdAdminPW: {AES256}" conf
    1
    $ in_terminal "PW: " Inn "Again: " Inn -- cfg32 -f conf --key-file key passwd cn=Configuration oru-slapdAdminPW | tail -1
    unchanged

Two different ones change nothing, nor does an empty one:

    $ stat -c "%y %z %i" conf conf.bak > before
    $ in_terminal "PW: " Isar "Again: " isar -- cfg32 -f conf passwd cn=Configuration oru-slapdAdminPW
    cfg32: without --key-file the password is only masked, which hides it from nobody who tries
    New oru-slapdAdminPW: 
    Again: 
    cfg32: the two passwords differ
    [1]
    $ in_terminal "PW: " "" -- cfg32 -f conf passwd cn=Configuration oru-slapdAdminPW
    cfg32: without --key-file the password is only masked, which hides it from nobody who tries
    New oru-slapdAdminPW: 
    cfg32: an empty password is not set
    [1]
    $ stat -c "%y %z %i" conf conf.bak | cmp - before

One that is too long is refused, and not shown:

    $ long=$(printf 'x%.0s' {1..1025})
    $ printf "$long\n$long\n" | setsid -w cfg32 -f conf passwd cn=Configuration oru-slapdAdminPW 2>&1 | grep -v accepted:
    cfg32: without --key-file the password is only masked, which hides it from nobody who tries
    New oru-slapdAdminPW: Again: cfg32: Password length must be 1 to 1024 characters [Invalid syntax (21)]
      oru-slapdAdminPW: ********
    [3]

Without a terminal it is read from standard input:

    $ printf "Lech\nLech\n" | setsid -w cfg32 -f conf passwd cn=Configuration oru-slapdAdminPW
    cfg32: without --key-file the password is only masked, which hides it from nobody who tries
    New oru-slapdAdminPW: Again:  (no-eol)
    $ echo Lech > password
    $ cfg32 -f conf -D cn=root -y password unset cn=Configuration x-none
    unchanged
    $ setsid -w cfg32 -f conf passwd cn=Configuration oru-slapdAdminPW < /dev/null
    cfg32: without --key-file the password is only masked, which hides it from nobody who tries
    New oru-slapdAdminPW: cfg32: an empty password is not set
    [1]

Other attributes are not set so:

    $ cfg32 -f conf passwd cn=Configuration oru-slapdPort
    cfg32: oru-slapdPort is no password: use `cfg32 set`
    [2]
    $ cfg32 -f conf passwd cn=Configuration x-none
    cfg32: x-none is no password: use `cfg32 set`
    [2]
