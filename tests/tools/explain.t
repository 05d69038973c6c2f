What an attribute takes, whatever the case of its name: the syntax, what is accepted, how many
values, and one that is accepted:

    $ cfg32 explain ORU-SLAPDPORT
    oru-slapdPort
      syntax:   an integer (int)
      accepts:  an integer from 1 to 65535
      values:   one
      example:  389

Several attributes, of each kind of syntax, with a blank line between them:

    $ cfg32 explain oru-slapdAuditOperation oru-slapdSslCipherSpecs oru-slapdSuffix \
    >     oru-slapdAdminPW oru-slapdReferral oru-slapdDbName oru-slapdCachedAttributeAutoAdjustTime
    oru-slapdAuditOperation
      syntax:   one of a list of words (enum)
      accepts:  one of: ALL, AUDITCONFIGMODIFYFROMMSG, AUDITCONFIGMODIFY, AUDITSTART, AUDITSTOP, BIND, CLEARSERVERLOG, PWDPOLICYCONFIGMODIFY, REREADSERVERCONFIG, SERVERCONFIGMODIFY, SERVERSTART, SERVERSTOP, UNBIND, USERPWDMODIFY, USERPWDMODIFYBYANOTHER
                in upper or lower case
      values:   one or several
      example:  ALL
    
    oru-slapdSslCipherSpecs
      syntax:   an integer made of permitted bits (mask)
      accepts:  an integer made of the bits 0xff00, such as 12288
      values:   one
      example:  12288
    
    oru-slapdSuffix
      syntax:   a distinguished name (dn)
      accepts:  a distinguished name, usually not an empty one
      values:   one or several
      example:  dc=example, dc=com
    
    oru-slapdAdminPW
      syntax:   a password (pw)
      accepts:  a password of 1 to 1024 bytes, or one that is encoded already
      values:   one
      example:  correct horse battery staple
    
    oru-slapdReferral
      syntax:   text, usually a URL (url)
      accepts:  text, usually a URL that begins with ldap:// or ldaps://
      values:   one or several
      example:  ldap://ldap1.example.org:389
    
    oru-slapdDbName
      syntax:   text (ces)
      accepts:  text of 1 to 8 bytes
      values:   one
      example:  people
    
    oru-slapdCachedAttributeAutoAdjustTime
      syntax:   a time of day, Thhmmss (time)
      accepts:  a time of day as Thhmmss, from T000000 to T235959
      values:   one
      example:  T023000

An unknown name is answered with the nearest one, if there is one, and with no; the others are told
all the same:

    $ cfg32 explain oru-slapdPrt mail version
    cfg32: no attribute is called oru-slapdPrt: did you mean oru-slapdPort?
    cfg32: no attribute is called mail
    version
      syntax:   an integer (int)
      accepts:  an integer that is 1
      values:   one
      example:  1
    [1]

The same name twice is told twice:

    $ cfg32 explain version version
    version
      syntax:   an integer (int)
      accepts:  an integer that is 1
      values:   one
      example:  1
    
    version
      syntax:   an integer (int)
      accepts:  an integer that is 1
      values:   one
      example:  1

An example is one that an administrator could mean:

    $ cfg32 explain charset oru-slapdSecurePort oru-slapdPwEncryption | grep example
      example:  UTF-8
      example:  636
      example:  aes256

The beginning that most names share may be left out of what is meant:

    $ cfg32 explain port
    cfg32: no attribute is called port: did you mean oru-slapdPort?
    [1]

JSON has the constraints one by one:

    $ cfg32 explain --json oru-slapdPort oru-slapdDbName oru-slapdReadOnly
    {
      "attributes": [
        {
          "name": "oru-slapdPort",
          "syntax": "int",
          "description": "an integer",
          "accepted": "an integer from 1 to 65535",
          "minimum": 1,
          "maximum": 65535,
          "singleValued": true,
          "example": "389"
        },
        {
          "name": "oru-slapdDbName",
          "syntax": "ces",
          "description": "text",
          "accepted": "text of 1 to 8 bytes",
          "minimumLength": 1,
          "maximumLength": 8,
          "singleValued": true,
          "example": "people"
        },
        {
          "name": "oru-slapdReadOnly",
          "syntax": "enum",
          "description": "one of a list of words",
          "accepted": "one of: true, false",
          "words": [
            "true",
            "false"
          ],
          "singleValued": true,
          "example": "true"
        }
      ]
    }
    $ cfg32 explain --json oru-slapdPort oru-slapdSslCipherSpecs oru-slapdReferral | "$TOOLS/valid_json" explain
    valid

Unknown names leave it JSON:

    $ cfg32 explain --json mail
    cfg32: no attribute is called mail
    {
      "attributes": []
    }
    [1]

On a terminal, and when it is asked for, the name stands out:

    $ cfg32 --color=always explain cn | head -1
    \x1b[1mcn\x1b[0m (esc)

Without a name there is nothing to explain:

    $ cfg32 explain
    cfg32: attributes is required
      hint: `cfg32 explain --help` tells what there is
    [2]
