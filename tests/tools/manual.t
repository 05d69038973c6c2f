The manual pages are built beside the command:

    $ pages=$(dirname "$(command -v cfg32)")/../../../docs
    $ cp "$pages/cfg32.1" "$pages/oruslapd.conf.5" .

They are well-formed. The generator of the pages puts a paragraph macro before every block and after
every heading, which is harmless; nothing else is left out:

    $ for page in cfg32.1 oruslapd.conf.5; do
    >     mandoc -T lint -W warning $page |
    >         grep -v 'WARNING: skipping paragraph macro: PP \(empty\|after SH\|after SS\)$'
    > done
    [1]

Every command of the help has a section in cfg32(1), in the same words, with an example:

    $ mandoc -T utf8 -O width=200 cfg32.1 | col -bx >manual
    $ cfg32 --help | sed -n '/^Subcommands:/,$p' | awk 'NR > 1 && NF { print $1 }' >commands
    $ section() { awk -v name="$1" '/^   [^ ]/ { inside = $1 == name } /^[^ ]/ { inside = 0 } inside' manual; }
    $ wc -l <commands
    19
    $ while read -r name; do
    >     section $name | grep -q "^ *[$] .*cfg32 .*$name" || echo "no example of $name"
    > done <commands

and so have all options that a command has, there or among those that several have:

    $ awk '/^OPTIONS/,/^COMMANDS/' manual >shared
    $ while read -r name; do
    >     section $name | cat - shared >told
    >     cfg32 $name --help | grep -oE '^ +-[-a-zA-Z,]+' | grep -oE -e '--?[a-zA-Z][-a-zA-Z]*' |
    >         while read -r option; do
    >             grep -qE -e "(^|[ (])$option([], ).]|$)" told || echo "$name $option"
    >         done
    > done <commands
    $ cfg32 --help | grep -oE '^ +-[-a-zA-Z,]+' | grep -oE -e '--?[a-zA-Z][-a-zA-Z]*' | sort -u |
    >     while read -r option; do
    >         grep -qE -e "^ *(-., )?$option(,| |$)" shared || echo "$option"
    >     done

The exit statuses, files and variables stand there, too:

    $ grep -A100 '^EXIT STATUS' manual | grep -E '^       [0-3]$'
           0
           1
           2
           3
    $ grep -oE '^       (NUV_INSTALL_PATH|NO_COLOR|LC_ALL|VISUAL, EDITOR|TMPDIR)' manual
           NUV_INSTALL_PATH
           NO_COLOR
           LC_ALL
           VISUAL, EDITOR
           TMPDIR

What it shows of explain is what explain prints:

    $ section explain | sed -n '/[$] cfg32/,$p' | sed -e 1d -e 's/^           //' -e '/^$/d' >shown
    $ cfg32 explain oru-slapdPort | diff - shown

All attributes stand in oruslapd.conf(5), with what they accept and an example:

    $ mandoc -T utf8 -O width=1000 oruslapd.conf.5 | col -bx >manual
    $ sed -n '/^ATTRIBUTES/,/^SEE ALSO/p' manual | grep -E '^       [a-z][-A-Za-z0-9]*$' | tr -d ' ' >listed
    $ cfg32 schema | tail -n +2 | awk '{ print $1 }' | diff - listed
    $ grep -A2 -E '^       (oru-slapdSchemaCheck|oru-slapdAdminRole)$' manual
           oru-slapdAdminRole
               one of: AuditAdmin, DirDataAdmin, NoAdmin, ReplicationAdmin, SchemaAdmin, ServerConfigGroupMember, ServerStartStopAdmin, PasswordAdmin; several values.
               Example: AuditAdmin
    --
           oru-slapdSchemaCheck
               one of: none, V2, V3, V3_lenient; one value.
               Example: none
    $ cfg32 schema --json | /usr/bin/python3 -c '
    > import json, sys
    > text = open("manual").read()
    > for each in json.load(sys.stdin)["attributes"]:
    >     several = "one value" if each["singleValued"] else "several values"
    >     told = "       %s\n           %s; %s.\n           Example: %s\n" % (
    >         each["name"], each["accepted"], several, each["example"])
    >     if told not in text:
    >         print(told)
    > '
