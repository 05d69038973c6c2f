Two files with the same content do not differ, whatever their order, their comments and their case:

    $ . "$TOOLS/scratch.sh"
    $ cat > a.conf <<EOF
    > # The first one.
    > version: 1
    > 
    > dn: cn=Configuration
    > cn: Configuration
    > oru-slapdLogMessages: TRUE
    > 
    > dn: cn=x, cn=Configuration
    > oru-slapdReferral: ldap://one
    > oru-slapdReferral: ldap://two
    > EOF
    $ cat > b.conf <<EOF
    > dn: cn=X,CN=Configuration
    > oru-slapdReferral: ldap://two
    > oru-slapdReferral: ldap://ONE
    > 
    > dn: cn=Configuration
    > # Another comment.
    > oru-slapdLogMessages: true
    > cn: configuration
    > EOF
    $ cfg32 diff a.conf b.conf

What differs comes as changes that `cfg32 modify` takes, and as the answer no: entries that go, each
after those below it, entries that change, new entries:

    $ cat > b.conf <<EOF
    > dn: cn=Configuration
    > cn: Configuration
    > oru-slapdLogMessages: FALSE
    > oru-slapdPort: 389
    > 
    > dn: cn=y, cn=Configuration
    > cn: y
    > 
    > dn: cn=z, cn=y, cn=Configuration
    > cn: z
    > EOF
    $ cfg32 diff a.conf b.conf
    dn: cn=x, cn=Configuration
    changetype: delete
    
    dn: cn=Configuration
    changetype: modify
    replace: oru-slapdLogMessages
    oru-slapdLogMessages: FALSE
    -
    replace: oru-slapdPort
    oru-slapdPort: 389
    -
    
    dn: cn=y, cn=Configuration
    changetype: add
    cn: y
    
    dn: cn=z, cn=y, cn=Configuration
    changetype: add
    cn: z
    
    [1]

Of an attribute with several values only those are named that differ:

    $ cat > c.conf <<EOF
    > version: 1
    > 
    > dn: cn=Configuration
    > cn: Configuration
    > oru-slapdLogMessages: TRUE
    > 
    > dn: cn=x, cn=Configuration
    > oru-slapdReferral: ldap://two
    > oru-slapdReferral: ldap://three
    > EOF
    $ cfg32 diff a.conf c.conf
    dn: cn=x, cn=Configuration
    changetype: modify
    delete: oru-slapdReferral
    oru-slapdReferral: ldap://one
    -
    add: oru-slapdReferral
    oru-slapdReferral: ldap://three
    -
    
    [1]

For people it is shorter:

    $ cfg32 diff --format text a.conf b.conf
    - cn=x, cn=Configuration
    -   oru-slapdReferral: ldap://one
    -   oru-slapdReferral: ldap://two
      cn=Configuration
    -   oru-slapdLogMessages: TRUE
    +   oru-slapdLogMessages: FALSE
    +   oru-slapdPort: 389
    + cn=y, cn=Configuration
    +   cn: y
    + cn=z, cn=y, cn=Configuration
    +   cn: z
    [1]
    $ cfg32 diff --format json a.conf c.conf | tee found
    {
      "from": "a.conf",
      "to": "c.conf",
      "entries": [
        {
          "dn": "cn=x, cn=Configuration",
          "change": "changed",
          "attributes": [
            {
              "name": "oru-slapdReferral",
              "removed": [
                "ldap://one"
              ],
              "added": [
                "ldap://three"
              ]
            }
          ]
        }
      ]
    }
    $ "$TOOLS/valid_json" diff < found
    valid

The lines above all entries are an entry without a name:

    $ sed 's/^version: 1/charset: UTF-8/' a.conf > d.conf
    $ cfg32 diff a.conf d.conf
    dn:
    changetype: modify
    replace: charset
    charset: UTF-8
    -
    
    [1]

An entry that stays below one that goes is removed with it and added again:

    $ printf 'dn: cn=a\ncn: a\n\ndn: cn=b, cn=a\ncn: b\n' > above.conf
    $ printf 'dn: cn=b, cn=a\ncn: b\n' > alone.conf
    $ cfg32 diff above.conf alone.conf
    dn: cn=b, cn=a
    changetype: delete
    
    dn: cn=a
    changetype: delete
    
    dn: cn=b, cn=a
    changetype: add
    cn: b
    
    [1]
    $ cfg32 diff --format text above.conf alone.conf
    - cn=a
    -   cn: a
    [1]

Passwords are compared by what they are, with the key, and are never seen in clear. In changes they
stand as they are stored; what is only masked there should be guarded:

    $ secret() { printf 'dn: cn=Configuration\noru-slapdAdminPW: %s\n' "$1"; }
    $ secret Correct-Horse-7 > clear.conf
    $ grep -m2 -e '^dn' -e '^oru-slapdAdminPW' oruslapd.conf > masked.conf
    $ cfg32 diff clear.conf masked.conf
    $ secret Wrong-Horse > other.conf
    $ cfg32 diff --format text clear.conf other.conf
      cn=Configuration
    -   oru-slapdAdminPW: ********
    +   oru-slapdAdminPW: ********
    [1]
    $ cfg32 diff --json clear.conf other.conf | grep -c '\*\*\*\*\*\*\*\*'
    2
    $ cfg32 diff clear.conf other.conf > changes
    cfg32: masked passwords, which anybody can decode, are in this output: guard it like the file
    [1]
    $ grep -e Horse changes
    [1]
    $ cfg32 --key-file oruslapd.key diff clear.conf other.conf | grep -o ': {AES256}'
    : {AES256}

A name that would be read as another can't be said in LDIF:

    $ printf 'dn: cn=Configuration\ncn: x\n' > one.conf
    $ printf 'dn: cn=Configuration\ncn: x\n\ndn: cn=a+ou=b, cn=Configuration\ncn: a\n' > pair.conf
    $ cfg32 diff one.conf pair.conf
    cfg32: these changes do not lead to the other file: as a name in LDIF, "cn=a + ou=b, cn=Configuration" would be taken for another, or not at all
    dn: cn=a + ou=b, cn=Configuration
    changetype: add
    cn: a
    
    [1]
    $ cfg32 -f one.conf apply pair.conf
    cfg32: pair.conf can't be applied: "cn=a + ou=b, cn=Configuration" would be taken for another name, or not at all
    [3]
    $ printf 'dn: cn=Configuration\ncn: x\noru-slapdAdminDN: cn=a+ou=b\n' > value.conf
    $ cfg32 -f one.conf apply value.conf
    cfg32: value.conf can't be applied: "cn=a + ou=b" would be taken for another name, or not at all
    [3]
    $ printf 'dn: cn=Configuration\ncn: x\na b: y\n' > attribute.conf
    $ cfg32 -f one.conf apply attribute.conf
    cfg32: attribute.conf can't be applied: "a b" would be taken for another name, or not at all
    [3]

What can't be read is a failure:

    $ cfg32 diff a.conf nowhere
    cfg32: nowhere: No such file or directory [Connection error (91)]
    [3]
    $ cfg32 diff a.conf
    cfg32: to is required
      hint: `cfg32 diff --help` tells what there is
    [2]
