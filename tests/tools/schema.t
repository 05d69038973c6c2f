All attributes, sorted by name, for people:

    $ cfg32 schema >table; head -5 table; grep -E 'Port |AdjustTime |Plugin ' table
    ATTRIBUTE                                       SYNTAX  VALUES   ACCEPTS
    charset                                         ces     one      text
    cn                                              cis     one      text, upper and lower case alike
    nuv-instanceDesc                                dc      one      text, usually a domain name
    nuv-instanceLocation                            path    one      text of 1 to 4096 bytes, usually a path
    oru-slapdCachedAttributeAutoAdjustTime          time    one      a time of day as Thhmmss, from T000000 to T235959
    oru-slapdDNPartitionPlugin                      plugin  one      text, usually a plug-in directive
    oru-slapdLdapCrlPort                            int     one      an integer from 1 to 65535
    oru-slapdLogTALMPort                            int     one      an integer from 1 to 65535
    oru-slapdPlugin                                 plugin  several  text, usually a plug-in directive
    oru-slapdPort                                   int     one      an integer from 1 to 65535
    oru-slapdSecurePort                             int     one      an integer from 1 to 65535

Each is there once, under the heading:

    $ wc -l <table
    197
    $ tail -n +2 table | awk '{ print tolower($1) }' | sort -c -u

The table is what is printed without a format:

    $ cfg32 schema --format table | cmp - table

Every attribute of the example file is there:

    $ tail -n +2 table | awk '{ print tolower($1) }' | sort >known
    $ sed -n 's/^\([a-zA-Z][^: ]*\):.*/\1/p' "$EXAMPLES/oruslapd.conf" | tr A-Z a-z | sort -u >used
    $ comm -23 used known
    dn

For documents:

    $ cfg32 schema --format markdown | grep -E 'attribute \||---|Port`|`cn`'
    | attribute | syntax | values | accepts | example |
    |---|---|---|---|---|
    | `cn` | cis | one | text, upper and lower case alike | `Client Listener` |
    | `oru-slapdLdapCrlPort` | int | one | an integer from 1 to 65535 | `389` |
    | `oru-slapdLogTALMPort` | int | one | an integer from 1 to 65535 | `9443` |
    | `oru-slapdPort` | int | one | an integer from 1 to 65535 | `389` |
    | `oru-slapdSecurePort` | int | one | an integer from 1 to 65535 | `636` |

For programs, by either option:

    $ cfg32 schema --json >json; cfg32 schema --format json | cmp - json
    $ "$TOOLS/valid_json" schema <json
    valid
    $ /usr/bin/python3 -c 'import json; print(len(json.load(open("json"))["attributes"]))'
    196

It says of each what explain says:

    $ cfg32 explain --json $(tail -n +2 table | awk '{ print $1 }') | cmp - json

Another format is a usage error, and so are two:

    $ cfg32 schema --format xml
    cfg32: --format: xml not in {table,json,markdown}
      hint: `cfg32 schema --help` tells what there is
    [2]
    $ cfg32 schema --json --format table
    cfg32: --json excludes --format
      hint: `cfg32 schema --help` tells what there is
    [2]
