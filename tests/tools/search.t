It prints what a filter matches as LDIF:

    $ . "$TOOLS/scratch.sh"
    $ cfg32 -f oruslapd.conf search '(oru-slapdPort=389)'
    dn: cn=Client Listener, cn=Network, cn=Configuration
    cn: Client Listener
    objectclass: top
    objectclass: oruListener
    oru-slapdIpAddress: 192.0.2.10
    oru-slapdPort: 389
    oru-slapdSecurePort: 636
    oru-slapdSecurity: SSLTLS
    

The filter needs no parentheses, "*" stands for any value, and names behind it choose attributes:

    $ cfg32 -f oruslapd.conf search 'oru-slapdPort=*' oru-slapdport CN
    dn: cn=Client Listener, cn=Network, cn=Configuration
    cn: Client Listener
    oru-slapdPort: 389
    
    dn: cn=Management Listener, cn=Network, cn=Configuration
    cn: Management Listener
    oru-slapdPort: 3538
    
    $ cfg32 -f oruslapd.conf search 'oru-slapdPort=389' 1.1
    dn: cn=Client Listener, cn=Network, cn=Configuration
    

Base and scope say where to look:

    $ cfg32 -f oruslapd.conf search -b cn=connections,cn=network,cn=configuration -s base cn
    dn: cn=Connections, cn=Network, cn=Configuration
    cn: Connections
    
    $ cfg32 -f oruslapd.conf search -b cn=connections,cn=network,cn=configuration -s one cn
    dn: cn=Emergency Worker, cn=Connections, cn=Network, cn=Configuration
    cn: Emergency Worker
    
    $ cfg32 -f oruslapd.conf search -b cn=connections,cn=network,cn=configuration cn
    dn: cn=Connections, cn=Network, cn=Configuration
    cn: Connections
    
    dn: cn=Emergency Worker, cn=Connections, cn=Network, cn=Configuration
    cn: Emergency Worker
    
    $ cfg32 -f oruslapd.conf search -s everywhere
    cfg32: --scope: everywhere not in {base,one,sub}
      hint: `cfg32 search --help` tells what there is
    [2]

Without a filter every entry is found, also one without an objectclass:

    $ printf 'dn: cn=Configuration\ncn: Configuration\n' > plain.conf
    $ cfg32 -f plain.conf search
    dn: cn=Configuration
    cn: Configuration
    

What is not plain ASCII comes in base64, and long lines are folded, as other LDAP tools do it:

    $ cfg32 -f oruslapd.conf search -s base nuv-instanceDesc
    dn: cn=Configuration
    nuv-instanceDesc:: RGlyZWN0b3J5IG9mIHRoZSBMaW5kYXUgYW5kIE3DvG5jaGVuIG9mZmljZ
     XM7IGNoYW5nZXMgYXJlIGFncmVlZCB3aXRoIErDtnJnIFZvw58sIHRlbGVwaG9uZSBleHRlbnNp
     b24gNDQxMA==
    
    $ cfg32 -f oruslapd.conf search -s base nuv-instanceDesc --no-wrap | wc -l
    3

JSON holds the text itself, and no password that somebody could read:

    $ cfg32 -f oruslapd.conf search -s base cn nuv-instanceDesc oru-slapdAdminPW --json | tee found
    {
      "file": "oruslapd.conf",
      "entries": [
        {
          "dn": "cn=Configuration",
          "attributes": {
            "cn": [
              "Configuration"
            ],
            "nuv-instanceDesc": [
              "Directory of the Lindau and München offices; changes are agreed with Jörg Voß, telephone extension 4410"
            ],
            "oru-slapdAdminPW": [
              "********"
            ]
          }
        }
      ],
      "leftOut": []
    }
    $ "$TOOLS/valid_json" search < found
    valid
    $ cfg32 -f oruslapd.conf search --json | "$TOOLS/valid_json" search
    valid

Passwords are not decoded, also not where they are asked for by name:

    $ cfg32 -f oruslapd.conf --key-file oruslapd.key search 'cn=Munich' oru-slapdMasterPW
    dn: cn=Munich, cn=Suppliers, cn=Replication, cn=Configuration
    oru-slapdMasterPW: {AES256}EN93x+HR+8AkUrdcqg713x6BiCVVW2H4FrMVgxsZ6MmI9d0hN
     9GI2Rfwymca
    

Finding nothing is the answer no, and so is a base that is not there:

    $ cfg32 -f oruslapd.conf search '(cn=nobody)'
    [1]
    $ cfg32 -f oruslapd.conf search '(cn=nobody)' --json
    {
      "file": "oruslapd.conf",
      "entries": [],
      "leftOut": []
    }
    [1]
    $ cfg32 -f oruslapd.conf search -b cn=nobody
    cfg32: oruslapd.conf: no entry cn=nobody [No such object (32)]
    [1]
    $ cfg32 -f oruslapd.conf search -b cn=nobody '(cn=*)'
    cfg32: oruslapd.conf: no entry cn=nobody [No such object (32)]
    [1]

What a filter can't say is refused, because it would find nothing or everything; a name that may be
mistyped is told:

    $ for filter in '(&(cn=a)(cn=b))' '(|(cn=a)(cn=b))' '(!(cn=a))' 'cn=Cli*' 'oru-slapdPort>=1' '(cn=a' 'cn=a)' '()' '=' '((cn=a))'; do
    >     cfg32 -f oruslapd.conf search "$filter" > found 2>&1; echo "$? $(wc -l < found)"
    > done | sort | uniq -c
         10 2 1
    $ cfg32 -f oruslapd.conf search '(!(cn=a))'
    cfg32: (!(cn=a)) is no filter: it is one term, attribute=value or attribute=*
    [2]
    $ cfg32 -f oruslapd.conf search '(oru-slapdPrt=389)'
    cfg32: the server knows no attribute oru-slapdPrt; did you mean oru-slapdPort?
    [1]

A filter that its attribute does not allow is a failure:

    $ cfg32 -f oruslapd.conf search '(oru-slapdPort=http)'
    cfg32: oruslapd.conf: Value is not a valid integer. [Invalid syntax (21)]
      oru-slapdPort: http
      accepted: an integer from 1 to 65535
    [3]

Reading leaves the file alone:

    $ state_of oruslapd.conf > before
    $ cfg32 -f oruslapd.conf search > all.ldif
    $ state_of oruslapd.conf | cmp - before

Text that the locale has no characters for is told as that:

    $ printf 'dn: cn=Configuration\ncn: x\n' > ascii.conf
    $ LC_ALL=C cfg32 -f ascii.conf search cn=Jörg
    cfg32: ascii.conf: text that is not of the locale's character set [Unusable input character (162)]
    [3]

Two attributes whose names hide a password, and so look the same, both show their values:

    $ printf 'dn: cn=Configuration\noru-slapdAdminPW one: 1\noru-slapdAdminPW two: 2\nz: 3\n' > meet.conf
    $ cfg32 -f meet.conf --json search
    {
      "file": "meet.conf",
      "entries": [
        {
          "dn": "cn=Configuration",
          "attributes": {
            "oru-slapdAdminPW ********": [
              "********",
              "********"
            ],
            "z": [
              "3"
            ]
          }
        }
      ],
      "leftOut": []
    }
