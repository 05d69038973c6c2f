Carrying out the changes of an LDIF text.

    $ set -o pipefail
    $ "$TOOLS"/example_of_changes; cp conf conf.before
    $ cat > changes.ldif <<'END'
    > version: 1
    > 
    > dn: cn=Listener, cn=Network, cn=Configuration
    > changetype: modify
    > replace: oru-slapdPort
    > oru-slapdPort: 1389
    > -
    > delete: oru-slapdSuffix
    > oru-slapdSuffix: o=x
    > -
    > add: oru-slapdSecurePort
    > oru-slapdSecurePort: 1636
    > -
    > 
    > dn: cn=New, cn=Configuration
    > changetype: add
    > cn: New
    > 
    > dn: cn=New, cn=Configuration
    > add: objectclass
    > objectclass: top
    > 
    > dn:
    > replace: charset
    > charset: ISO-8859-1
    > END

All changes are made in one write, or printed:

    $ cfg32 -f conf modify -n -l changes.ldif
    --- conf
    +++ conf
    @@ -1,4 +1,4 @@
    -charset: UTF-8
    +charset: ISO-8859-1
     version: 1
     
     # The server as a whole.
    @@ -14,7 +14,11 @@
     # Plain port.
     dn: cn=Listener, cn=Network, cn=Configuration
     cn: Listener
    -oru-slapdPort: 389
    -oru-slapdSuffix: o=x
    +oru-slapdPort: 1389
    +oru-slapdSecurePort: 1636
     oru-slapdSuffix: o=y
    +
    +dn: cn=New, cn=Configuration
    +cn: New
    +objectclass: top
     
    $ cmp conf conf.before && ls
    changes.ldif
    conf
    conf.before
    $ cfg32 -f conf modify < changes.ldif
    $ cmp conf.bak conf.before
    $ cat conf
    charset: ISO-8859-1
    version: 1
    
    # The server as a whole.
    dn: cn=Configuration
    cn: Configuration
    objectclass: top
    oru-slapdAdminDN: cn=root
    oru-slapdAdminPW: >EH0Ril93yPhQR2hyHVFGvV2C9/XVa9yBRtYNB9T+UyMo8Gg1NIo5Sly1jr8=
    
    dn: cn=Network, cn=Configuration
    cn: Network
    
    # Plain port.
    dn: cn=Listener, cn=Network, cn=Configuration
    cn: Listener
    oru-slapdPort: 1389
    oru-slapdSecurePort: 1636
    oru-slapdSuffix: o=y
    
    dn: cn=New, cn=Configuration
    cn: New
    objectclass: top
    

What is done already is not done again, save for an entry that would be added twice:

    $ stat -c "%y %z %i" conf conf.bak > before
    $ cfg32 -f conf modify -l changes.ldif
    cfg32: changes.ldif:15: The entry is there already [Already exists (68)]
      entry: cn=New, cn=Configuration
    [3]
    $ cfg32 -f conf modify -c --json -l changes.ldif
    cfg32: skipped: changes.ldif:15: The entry is there already [Already exists (68)]
      entry: cn=New, cn=Configuration
    {
      "file": "conf",
      "result": "unchanged",
      "dryRun": false,
      "skipped": [
        {
          "line": 15,
          "dn": "cn=New, cn=Configuration",
          "reason": "changes.ldif:15: The entry is there already [Already exists (68)]\n  entry: cn=New, cn=Configuration"
        }
      ]
    }
    [3]
    $ cfg32 -f conf modify <<'END'
    > dn: cn=Listener, cn=Network, cn=Configuration
    > replace: oru-slapdPort
    > oru-slapdPort: 1389
    > -
    > delete: oru-slapdSuffix
    > oru-slapdSuffix: o=x
    > -
    > replace: x-none
    > -
    > END
    unchanged
    $ stat -c "%y %z %i" conf conf.bak | cmp - before

One record that fails keeps all from the file:

    $ cat > failing.ldif <<'END'
    > dn: cn=Listener, cn=Network, cn=Configuration
    > replace: oru-slapdPort
    > oru-slapdPort: 1
    > 
    > dn: cn=Listener, cn=Network, cn=Configuration
    > delete: oru-slapdSuffix
    > -
    > add: oru-slapdPort
    > oru-slapdPort: 2
    > END
    $ cfg32 -f conf modify -l failing.ldif 2>&1 | grep -v accepted:
    cfg32: failing.ldif:9: Attribute may not have multiple values. [Constraint violation (19)]
      entry: cn=Listener, cn=Network, cn=Configuration
      oru-slapdPort: 2
    [3]
    $ stat -c "%y %z %i" conf conf.bak | cmp - before

It leaves nothing of itself when it is left out:

    $ cfg32 -f conf modify -c -n -l failing.ldif 2>&1 | grep -v accepted:
    cfg32: skipped: failing.ldif:9: Attribute may not have multiple values. [Constraint violation (19)]
      entry: cn=Listener, cn=Network, cn=Configuration
      oru-slapdPort: 2
    --- conf
    +++ conf
    @@ -14,7 +14,7 @@
     # Plain port.
     dn: cn=Listener, cn=Network, cn=Configuration
     cn: Listener
    -oru-slapdPort: 1389
    +oru-slapdPort: 1
     oru-slapdSecurePort: 1636
     oru-slapdSuffix: o=y
     
    [3]

What is not well-formed is an error with its line, never a guess:

    $ cfg32 -f conf modify <<'END'
    > dn: cn=Listener, cn=Network, cn=Configuration
    > repalce: oru-slapdPort
    > oru-slapdPort: 1
    > 
    > dn: cn=Listener, cn=Network, cn=Configuration
    > changetype: modify
    > repalce: oru-slapdPort
    > oru-slapdPort: 1
    > 
    > dn: cn=Listener, cn=Network, cn=Configuration
    > replace: oru-slapdPort
    > oru-slapdSecurePort: 1
    > 
    > dn: cn=Listener, cn=Network, cn=Configuration
    > changetype: modrdn
    > newrdn: cn=Other
    > 
    > dn: cn=Listener, cn=Network, cn=Configuration
    > replace: oru-slapdPort
    > oru-slapdPort:: MQ
    > END
    cfg32: standard input:2: the content of an entry is for `cfg32 add`, or needs "changetype: add" below "dn:"
    standard input:7: a value outside of a block: "add:", "replace:" or "delete:" begins one
    standard input:12: "oru-slapdSecurePort" in the block of oru-slapdPort, which a line "-" ends
    standard input:15: changetype modrdn is not supported
    standard input:20: not valid base64
    [3]
    $ stat -c "%y %z %i" conf conf.bak | cmp - before

A password may come in clear here, and is encoded; it is not shown:

    $ cfg32 -f conf modify -n <<'END'
    > dn: cn=Configuration
    > replace: oru-slapdAdminPW
    > oru-slapdAdminPW: secret
    > END
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

What may have been cut off is not guessed: a replacement without values and without its "-" would
delete, and a last line without newline may have lost its end. No password is quoted:

    $ printf 'dn: cn=Configuration\nreplace: objectclass\n' | cfg32 -f conf modify
    cfg32: standard input:2: a block without values needs the line "-" that ends it
    [3]
    $ printf 'dn: cn=Configuration\nreplace: oru-slapdPort\noru-slapdPort: 12' | cfg32 -f conf modify
    cfg32: standard input:3: the last line has no newline at its end, as if it were cut off
    [3]
    $ printf 'dn: cn=Configuration\nreplace: oru-slapdAdminPW: Isar\n-\n' | cfg32 -f conf modify
    cfg32: standard input:2: "oru-slapdAdminPW ..." is not an attribute's name
    [3]
    $ printf 'dn: cn=Configuration\nreplace: oru-slapdAdmn Isar\n-\n' | cfg32 -f conf modify
    cfg32: standard input:2: "oru-slapdAdmn ..." is not an attribute's name
    [3]
    $ printf 'dn: cn=Configuration\nchangetype:\n modify\n oru-slapdAdminPW: Isar\n' | cfg32 -f conf modify
    cfg32: standard input:2: "modifyoru-slapdAdminPW" is no changetype: add, modify and delete are
    [3]
    $ printf 'dn: cn=Configuration\nreplace: oru-slapdPort\noru-slapdPort: 390\n oru-slapdAdminPW: Isar\n' | cfg32 -f conf modify 2>&1 | grep Isar
    [1]
    $ cfg32 -f conf modify < .
    cfg32: standard input: Is a directory
    [3]

Unusable lines of the file are kept in their own way by the change, and the backup is the file of
before:

    $ sed 's/oru-slapdPort: .*/oru-slapdPort: many/' conf.before > kept; cp kept kept.before
    $ cfg32 -f kept modify -l failing.ldif 2>&1 | grep -v accepted:
    cfg32: failing.ldif:9: Attribute may not have multiple values. [Constraint violation (19)]
      entry: cn=Listener, cn=Network, cn=Configuration
      oru-slapdPort: 2
    [3]
    $ cmp kept kept.before
    $ head -n 3 failing.ldif | cfg32 -f kept modify
    cfg32: kept: not all of it could be used (`cfg32 check` tells more):
      line 17: Value is not valid integer syntax, kept as oru-slapdInvalidLine
    $ diff -U0 kept.before kept | tail -n +3
    @@ -17 +17,2 @@
    -oru-slapdPort: many
    +oru-slapdInvalidLine: oru-slapdPort: many
    +oru-slapdPort: 1
    [1]
    $ cmp kept.bak kept.before && ls kept*
    kept
    kept.bak
    kept.before

A backup that can't be made keeps the change from the file, when there is one:

    $ printf 'dn: cn=New, cn=Configuration\nreplace: x-none\n-\n' > nothing.ldif
    $ cfg32 -f conf --backup /nowhere/conf modify -l nothing.ldif
    unchanged
    $ head -n 3 failing.ldif | cfg32 -f conf --backup /nowhere/conf modify
    cfg32: conf: Unable to backup the configuration file: "conf"  [Insufficient access (50)]
      system error: No such file or directory
      backup: /nowhere/conf
    [3]
    $ stat -c "%y %z %i" conf conf.bak | cmp - before
