Deleting entries.

    $ set -o pipefail
    $ "$TOOLS"/example_of_changes; cp conf conf.before
    $ listener="cn=Listener, cn=Network, cn=Configuration"

An entry goes with its comment:

    $ cfg32 -f conf delete -n "$listener"
    --- conf
    +++ conf
    @@ -11,10 +11,3 @@
     dn: cn=Network, cn=Configuration
     cn: Network
     
    -# Plain port.
    -dn: cn=Listener, cn=Network, cn=Configuration
    -cn: Listener
    -oru-slapdPort: 389
    -oru-slapdSuffix: o=x
    -oru-slapdSuffix: o=y
    -
    $ cmp conf conf.before
    $ cfg32 -f conf delete "$listener"
    $ diff -U0 conf.before conf | tail -n +3
    @@ -14,7 +13,0 @@
    -# Plain port.
    -dn: cn=Listener, cn=Network, cn=Configuration
    -cn: Listener
    -oru-slapdPort: 389
    -oru-slapdSuffix: o=x
    -oru-slapdSuffix: o=y
    -
    [1]

What is not there can't be deleted:

    $ cfg32 -f conf delete "$listener"
    cfg32: conf: Entry not found [No such object (32)]
      entry: cn=Listener, cn=Network, cn=Configuration
    [3]
    $ cfg32 -f conf delete ""
    cfg32: dn: is empty
      hint: `cfg32 delete --help` tells what there is
    [2]
    $ cfg32 -f conf delete "no name"
    cfg32: conf: Invalid character in RDN attribute: n [Invalid DN syntax (34)]
      entry: no name
    [3]

An entry with others below it goes with them, if that is meant:

    $ cp conf.before conf
    $ cfg32 -f conf delete "cn=Network, cn=Configuration"
    cfg32: conf: Entries stand below it: -r deletes them as well [Operation not allowed on nonleaf (66)]
      entry: cn=Network, cn=Configuration
    [3]
    $ cfg32 -f conf delete -r "cn=Network, cn=Configuration"
    $ diff -U0 conf.before conf | tail -n +3
    @@ -11,10 +10,0 @@
    -dn: cn=Network, cn=Configuration
    -cn: Network
    -
    -# Plain port.
    -dn: cn=Listener, cn=Network, cn=Configuration
    -cn: Listener
    -oru-slapdPort: 389
    -oru-slapdSuffix: o=x
    -oru-slapdSuffix: o=y
    -
    [1]

Several go together, or none:

    $ cp conf.before conf
    $ cfg32 -f conf delete "$listener" cn=None "cn=Network, cn=Configuration"
    cfg32: conf: Entry not found [No such object (32)]
      entry: cn=None
    [3]
    $ cmp conf conf.before
    $ cfg32 -f conf delete -c --json "$listener" cn=None "cn=Network, cn=Configuration"
    cfg32: skipped: conf: Entry not found [No such object (32)]
      entry: cn=None
    {
      "file": "conf",
      "result": "changed",
      "dryRun": false,
      "skipped": [
        {
          "dn": "cn=None",
          "reason": "conf: Entry not found [No such object (32)]\n  entry: cn=None"
        }
      ]
    }
    [3]
    $ diff -U0 conf.before conf | tail -n +3
    @@ -11,10 +10,0 @@
    -dn: cn=Network, cn=Configuration
    -cn: Network
    -
    -# Plain port.
    -dn: cn=Listener, cn=Network, cn=Configuration
    -cn: Listener
    -oru-slapdPort: 389
    -oru-slapdSuffix: o=x
    -oru-slapdSuffix: o=y
    -
    [1]

LDIF may name them, by their DNs alone or in records that delete:

    $ cp conf.before conf
    $ cfg32 -f conf delete <<END
    > dn: $listener
    > 
    > dn: cn=Network, cn=Configuration
    > changetype: delete
    > END
    $ grep ^dn: conf
    dn: cn=Configuration
    $ cat > other.ldif <<END
    > dn: cn=Configuration
    > changetype: modify
    > delete: cn
    > -
    > 
    > dn: cn=Configuration
    > cn: Configuration
    > END
    $ cfg32 -f conf delete -l other.ldif
    cfg32: other.ldif:1: a record that does not delete
    other.ldif:7: nothing may follow in a record that deletes
    [3]
    $ cfg32 -f conf delete -l other.ldif cn=Configuration
    cfg32: --ldif excludes dn
      hint: `cfg32 delete --help` tells what there is
    [2]
