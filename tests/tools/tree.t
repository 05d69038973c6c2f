It draws the entries below their parents:

    $ . "$TOOLS/scratch.sh"
    $ cfg32 -f oruslapd.conf tree | head -12
    ─ cn=Configuration (suffix)
        ├─ cn=Administrators
        │    ├─ cn=jvoss
        │    ├─ cn=tlindqvist
        │    ├─ cn=helpdesk
        │    └─ cn=auditors
        ├─ cn=Network
        │    ├─ cn=Client Listener
        │    ├─ cn=Management Listener
        │    ├─ cn=Connections
        │    │    └─ cn=Emergency Worker
        │    ├─ cn=Search Limits

An entry is where to begin, and the style what to draw with:

    $ cfg32 -f oruslapd.conf tree cn=network,cn=configuration
    ─ cn=Network, cn=Configuration
        ├─ cn=Client Listener
        ├─ cn=Management Listener
        ├─ cn=Connections
        │    └─ cn=Emergency Worker
        ├─ cn=Search Limits
        └─ cn=Referrals
    $ cfg32 -f oruslapd.conf tree cn=connections,cn=network,cn=configuration --style ascii
    - cn=Connections, cn=Network, cn=Configuration
        |
        +- cn=Emergency Worker
    $ cfg32 -f oruslapd.conf tree cn=connections,cn=network,cn=configuration --style cp437 | od -An -c -w16
     304       c   n   =   C   o   n   n   e   c   t   i   o   n   s
       ,       c   n   =   N   e   t   w   o   r   k   ,       c   n
       =   C   o   n   f   i   g   u   r   a   t   i   o   n  \n    
                 300 304       c   n   =   E   m   e   r   g   e   n
       c   y       W   o   r   k   e   r  \n
    $ cfg32 -f oruslapd.conf tree cn=nobody
    cfg32: oruslapd.conf: no entry cn=nobody [No such object (32)]
    [1]
    $ cfg32 -f oruslapd.conf tree --style curly
    cfg32: --style: curly not in {unicode,ascii,cp437}
      hint: `cfg32 tree --help` tells what there is
    [2]

An entry whose ancestors are missing hangs below the nearest one there is, with a mark; what is
missing stands below the drawing:

    $ cat > gap.conf <<EOF
    > dn: cn=Configuration
    > cn: Configuration
    > 
    > dn: cn=b, cn=missing, cn=Configuration
    > cn: b
    > 
    > dn: cn=Jörg, cn=b, cn=missing, cn=Configuration
    > cn: Jörg
    > EOF
    $ cfg32 -f gap.conf tree
    ─ cn=Configuration (suffix)
        └─ cn=b, cn=missing *
             └─ cn=Jörg
    
    * the following entries are undefined:
    cn=missing, cn=Configuration
    $ cfg32 -f gap.conf tree --json | tee found
    {
      "file": "gap.conf",
      "entries": [
        {
          "dn": "cn=Configuration",
          "depth": 0,
          "missingAncestors": []
        },
        {
          "dn": "cn=b, cn=missing, cn=Configuration",
          "depth": 1,
          "missingAncestors": [
            "cn=missing, cn=Configuration"
          ]
        },
        {
          "dn": "cn=Jörg, cn=b, cn=missing, cn=Configuration",
          "depth": 2,
          "missingAncestors": []
        }
      ],
      "leftOut": []
    }
    $ "$TOOLS/valid_json" tree < found
    valid
