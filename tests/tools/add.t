Adding entries from LDIF.

    $ set -o pipefail
    $ "$TOOLS"/example_of_changes

From standard input, in the form that ldapadd takes:

    $ cfg32 -f conf add <<'END'
    > version: 1
    > 
    > # Two listeners.
    > dn: cn=Second,cn=Network,cn=Configuration
    > cn: Second
    > objectclass: top
    > oru-slapdPort: 0390
    > 
    > dn:: Y249RMO8c3NlbGRvcmYsY249TmV0d29yayxjbj1Db25maWd1cmF0aW9u
    > changetype: add
    > cn:: RMO8c3NlbGRvcmY=
    > END
    $ diff -U0 conf.bak conf | tail -n +3
    @@ -20,0 +21,8 @@
    +dn: cn=Second, cn=Network, cn=Configuration
    +cn: Second
    +objectclass: top
    +oru-slapdPort: 390
    +
    +dn: cn=Düsseldorf, cn=Network, cn=Configuration
    +cn: Düsseldorf
    +
    [1]

From a file; a dry run prints what would become of it:

    $ cat > entries.ldif <<'END'
    > dn: cn=Third, cn=Network, cn=Configuration
    > cn: Third
    > oru-slapdPort: 391
    > END
    $ cfg32 -f conf add -n -l entries.ldif
    --- conf
    +++ conf
    @@ -26,3 +26,7 @@
     dn: cn=Düsseldorf, cn=Network, cn=Configuration
     cn: Düsseldorf
     
    +dn: cn=Third, cn=Network, cn=Configuration
    +cn: Third
    +oru-slapdPort: 391
    +
    $ cfg32 -f conf add --json -l entries.ldif
    {
      "file": "conf",
      "result": "changed",
      "dryRun": false,
      "skipped": []
    }

An entry that is there is refused, unless it is to be given what it lacks:

    $ cfg32 -f conf add -l entries.ldif
    cfg32: entries.ldif:1: The entry is there already [Already exists (68)]
      entry: cn=Third, cn=Network, cn=Configuration
    [3]
    $ cfg32 -f conf add --merge -l entries.ldif
    unchanged
    $ sed 's/cn: Third/objectclass: top/' entries.ldif | cfg32 -f conf add --merge -n
    --- conf
    +++ conf
    @@ -28,5 +28,6 @@
     
     dn: cn=Third, cn=Network, cn=Configuration
     cn: Third
    +objectclass: top
     oru-slapdPort: 391
     
    $ sed 's/391/392/' entries.ldif | cfg32 -f conf add --merge 2>&1 | grep -v accepted:
    cfg32: standard input:3: Attribute may not have multiple values. [Constraint violation (19)]
      entry: cn=Third, cn=Network, cn=Configuration
      oru-slapdPort: 392
    [3]

Every record is read and checked before anything is changed, and all that is wrong is told:

    $ cat > bad.ldif <<'END'
    > dn: cn=Fourth, cn=Network, cn=Configuration
    > cn: Fourth
    > oru-slapdPort 391
    > 
    > dn: cn=Fifth, cn=Network, cn=Configuration
    > replace: cn
    > cn: Fifth
    > END
    $ cfg32 -f conf add -l bad.ldif
    cfg32: bad.ldif:3: a line without a colon
    bad.ldif:6: "replace:" needs "changetype: modify" below "dn:"
    [3]
    $ cat > refused.ldif <<'END'
    > dn: cn=Fourth, cn=Network, cn=Configuration
    > cn: Fourth
    > oru-slapdPort: 65536
    > 
    > dn: cn=Fifth, cn=Network, cn=Configuration
    > cn: Fifth
    > 
    > dn: cn
    > cn: Sixth
    > END
    $ stat -c "%y %z %i" conf > before
    $ cfg32 -f conf add -l refused.ldif 2>&1 | grep -v accepted:
    cfg32: refused.ldif:3: Integer value out of range [Invalid syntax (21)]
      entry: cn=Fourth, cn=Network, cn=Configuration
      oru-slapdPort: 65536
    refused.ldif:8: Missing RDN value: cn [Invalid DN syntax (34)]
      entry: cn
    [3]
    $ stat -c "%y %z %i" conf | cmp - before

Or what fails is left out:

    $ (cat bad.ldif; echo; cat refused.ldif) | cfg32 -f conf add -c 2>&1 | grep -v accepted:
    cfg32: skipped: standard input:3: a line without a colon
    cfg32: skipped: standard input:6: "replace:" needs "changetype: modify" below "dn:"
    cfg32: skipped: standard input:11: Integer value out of range [Invalid syntax (21)]
      entry: cn=Fourth, cn=Network, cn=Configuration
      oru-slapdPort: 65536
    cfg32: skipped: standard input:16: Missing RDN value: cn [Invalid DN syntax (34)]
      entry: cn
    [3]
    $ diff -U0 conf.bak conf | tail -n +3
    @@ -32,0 +33,3 @@
    +dn: cn=Fifth, cn=Network, cn=Configuration
    +cn: Fifth
    +
    [1]

No file, a folder, and nothing at all:

    $ cfg32 -f conf add -l missing.ldif
    cfg32: missing.ldif: No such file or directory
    [3]
    $ cfg32 -f conf add -l .
    cfg32: .: Is a directory
    [3]
    $ cfg32 -f conf add < /dev/null
    unchanged

A pipe is read to its end, however the text comes:

    $ cfg32 -f conf add -n -l <(printf 'dn: cn=P, cn=Configuration\n'; sleep 0.1; echo 'cn: P') | grep '^+[a-z]'
    +dn: cn=P, cn=Configuration
    +cn: P
