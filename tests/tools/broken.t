The commands are most needed when the file is broken. This one has a bad value, a bad line, a bad
DN, bytes of another character set and an attribute above the first entry:

    $ export NO_COLOR=1
    $ . "$TOOLS/scratch.sh"
    $ printf '%s\n' 'version: 1' 'oru-slapdPort: 1' '' 'dn: cn=Configuration' 'cn: Configuration' \
    >     'oru-slapdPort: 70000' 'no colon' '' 'dn: no name' 'cn: lost' '' \
    >     'dn: cn=a, cn=Configuration' 'cn: a' $'# J\xf6rg' 'objectclass: top' > broken.conf
    $ state_of broken.conf > state

Each reading command takes what is usable, and says what is not; none touches the file:

    $ cfg32 -f broken.conf get "cn=a, cn=Configuration" cn
    cfg32: broken.conf: read from a private copy, because not all of it can be used (`cfg32 check` tells more):
      line 2: an attribute above the first entry, left out
      line 6: Integer value out of range, kept as oru-slapdInvalidLine
      line 7: no colon after the attribute's name, kept as oru-slapdInvalidLine
      line 9: Invalid character in RDN attribute: n, left out
      line 14: bytes that are no character in this locale; a file with other than ASCII text needs the locale it was written in, left out
    a
    $ cfg32 -f broken.conf search 'cn=*' 2> /dev/null
    dn: cn=Configuration
    cn: Configuration
    oru-slapdInvalidLine: oru-slapdPort: 70000
    oru-slapdInvalidLine: no colon:
    
    dn: cn=a, cn=Configuration
    cn: a
    objectclass: top
    
    $ cfg32 -f broken.conf search cn --json 2> /dev/null | tee found
    {
      "file": "broken.conf",
      "entries": [
        {
          "dn": "cn=Configuration",
          "attributes": {
            "cn": [
              "Configuration"
            ]
          }
        },
        {
          "dn": "cn=a, cn=Configuration",
          "attributes": {
            "cn": [
              "a"
            ]
          }
        }
      ],
      "leftOut": [
        {
          "line": 2,
          "text": "an attribute above the first entry"
        },
        {
          "line": 6,
          "text": "Integer value out of range"
        },
        {
          "line": 7,
          "text": "no colon after the attribute's name"
        },
        {
          "line": 9,
          "text": "Invalid character in RDN attribute: n"
        },
        {
          "line": 14,
          "text": "bytes that are no character in this locale; a file with other than ASCII text needs the locale it was written in"
        }
      ]
    }
    $ "$TOOLS/valid_json" search < found
    valid
    $ cfg32 -f broken.conf tree 2> /dev/null
    ─ cn=Configuration (suffix)
        └─ cn=a
    $ cfg32 diff broken.conf broken.conf 2> /dev/null
    $ state_of broken.conf | cmp - state

A change is refused, and says where to look:

    $ cfg32 -f broken.conf set cn=Configuration oru-slapdPort 389
    cfg32: broken.conf:2: "oru-slapdPort" attribute not allowed in <root> object [Object class violation (65)]
      entry: above all entries
      oru-slapdPort: 1
      hint: `cfg32 check` tells everything that is wrong
    [3]
    $ state_of broken.conf | cmp - state

A load that would only put lines aside is not let to the file either; a change does it, once there
is one:

    $ printf '%s\n' 'dn: cn=Configuration' 'cn: Configuration' 'oru-slapdPort: 70000' > doubtful.conf
    $ cfg32 -f doubtful.conf get cn=Configuration oru-slapdInvalidLine
    cfg32: doubtful.conf: read from a private copy, because not all of it can be used (`cfg32 check` tells more):
      line 3: Integer value out of range, kept as oru-slapdInvalidLine
    oru-slapdPort: 70000
    $ cfg32 -f doubtful.conf set cn=Configuration cn Configuration
    unchanged
    $ cat doubtful.conf
    dn: cn=Configuration
    cn: Configuration
    oru-slapdPort: 70000
    $ cfg32 -f doubtful.conf set cn=Configuration oru-slapdPort 7000
    cfg32: doubtful.conf: not all of it could be used (`cfg32 check` tells more):
      line 3: Integer value out of range, kept as oru-slapdInvalidLine
    $ cat doubtful.conf
    charset: ISO-8859-1
    version: 1
    
    dn: cn=Configuration
    cn: Configuration
    oru-slapdInvalidLine: oru-slapdPort: 70000
    oru-slapdPort: 7000
    
    $ cat doubtful.conf.bak
    dn: cn=Configuration
    cn: Configuration
    oru-slapdPort: 70000

An entry whose DN can't be printed is left out, because nothing could name it:

    $ printf 'dn: cn=Configuration\ncn: x\n\ndn: cn=\ncn: y\n' > nameless.conf
    $ cfg32 -f nameless.conf tree
    cfg32: nameless.conf: read from a private copy, because not all of it can be used (`cfg32 check` tells more):
      line 4: no change of the file can be made, because this entry can't be written: a value of its DN is empty, or has a line break, left out
    ─ cn=Configuration (suffix)
    $ cfg32 -f nameless.conf search 'cn=*'
    cfg32: nameless.conf: read from a private copy, because not all of it can be used (`cfg32 check` tells more):
      line 4: no change of the file can be made, because this entry can't be written: a value of its DN is empty, or has a line break, left out
    dn: cn=Configuration
    cn: x
    

The whole file is no help to a reader who can't open it:

    $ mkdir folder && cfg32 -f folder tree
    cfg32: folder: Is a directory [Connection error (91)]
    [3]
    $ mkfifo fifo && cfg32 -f fifo tree
    cfg32: fifo: Invalid argument [Connection error (91)]
    [3]
    $ : > empty.conf && cfg32 -f empty.conf tree && cfg32 -f empty.conf search
    cfg32: empty.conf: no entry cn=Configuration [No such object (32)]
    [1]
