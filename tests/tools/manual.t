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

and what it shows of modify can be carried out:

    $ cp "$EXAMPLES/oruslapd.conf" my.conf
    $ section modify | sed -n '/[$] cfg32 modify <<END/,/^ *END/p' |
    >     sed -e 's/^ *[$] cfg32/cfg32 -f my.conf/' -e 's/^           //' >example.sh
    $ sh example.sh && cfg32 -f my.conf get 'cn=Search Limits, cn=Network, cn=Configuration' oru-slapdSizeLimit
    1000
    $ cfg32 -f my.conf get 'cn=Referrals, cn=Network, cn=Configuration' oru-slapdReferral | grep ldap3
    ldap://ldap3.example.org:389

All files that are written stand under FILES:

    $ sed -n '/^FILES/,/^ENVIRONMENT/p' manual | grep -oE '^       [^ ]+$'
           etc/oruslapd.conf
           FILE.bak
           FILE.before-restore
           FILE.before-undo
           share/cfg32/cfg32.schema.json

The commands that take no administrator are those that it says:

    $ tr -s ' \n' ' ' <manual | grep -oE '[a-z, ]+ have no use for it, and refuse it' |
    >     sed 's/ have no use.*//' | grep -oE '[a-z]+' | grep -vx and | sort | tee refusing
    check
    completion
    diff
    explain
    keygen
    schema
    $ while read -r name; do
    >     for arguments in '' 'a' 'a b' 'a b c' 'bash'; do
    >         cfg32 $name -D cn=root -y none $arguments 2>&1 </dev/null
    >     done | sed -n 's/^cfg32: \(.*\) takes no -D$/\1/p' | sort -u
    > done <commands | sort | diff - refusing

What DIAGNOSTICS explains is what messages say:

    $ tells() { grep -qF "$1" <(sed -n '/^DIAGNOSTICS/,/^JSON/p' manual) && grep -oF "$1"; }
    $ printf '# This file is being written. If it stays so, its backup is the complete version.\n' >half.conf
    $ cfg32 -f half.conf set cn=Configuration cn Configuration 2>&1 | tells 'not written to its end'
    not written to its end
    $ printf 'dn: cn=Configuration\ncn: J\xf6rg\n' >latin.conf
    $ cfg32 -f latin.conf set cn=Configuration cn Configuration 2>&1 |
    >     tells "not of the locale's character set"
    not of the locale's character set
    $ cfg32 check latin.conf | tells 'no character in this locale'
    no character in this locale
    $ head -c 32 /dev/zero >open.key; chmod 644 open.key
    $ cfg32 -f my.conf --key-file open.key get cn=Configuration cn 2>&1 |
    >     tells 'a key file that others can read is not used'
    a key file that others can read is not used

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
               Example: V3_lenient
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

What is said there to stop a load does, and what is said not to doesn't:

    $ tr -s ' \n' ' ' <manual | grep -o "a wrong value in an entry doesn't, but the server starts without it"
    a wrong value in an entry doesn't, but the server starts without it
    $ is_loaded() {
    >     printf "$1" >file.conf
    >     cfg32 -f file.conf --no-backup set cn=Configuration cn Configuration >/dev/null 2>&1
    >     echo $?
    > }
    $ is_loaded 'dn: cn=Configuration\ncn: x\noru-slapdPort: 70000\n'
    0
    $ is_loaded 'dn: cn=Configuration\ncn: x\nno colon\n'
    0
    $ is_loaded 'oru-slapdPort: 389\n\ndn: cn=Configuration\ncn: x\n'
    3
    $ is_loaded 'dn: cn=Configuration\ncn: x\n\noru-slapdPort: 389\n'
    3
    $ is_loaded 'version: 1\nversion: 1\n\ndn: cn=Configuration\ncn: x\n'
    3
    $ is_loaded 'version: 2\n\ndn: cn=Configuration\ncn: x\n'
    3
    $ is_loaded 'dn: cn=Configuration\ncn: x\n\ndn: none\n'
    3
    $ is_loaded 'dn: cn=Configuration\ncn: J\xf6rg\n'
    3
    $ is_loaded '\xef\xbb\xbfversion: 1\n\ndn: cn=Configuration\ncn: x\n'
    3

Its lines to find what was kept aside are commands that do so:

    $ cp "$EXAMPLES/oruslapd.conf" my.conf
    $ sed -i 's/^oru-slapdWorkers: .*/oru-slapdWorkers: many/' my.conf
    $ cfg32 -f my.conf set cn=Configuration oru-slapdSysLogLevel h 2>/dev/null
    $ sed -n 's/^ *[$] \(cfg32 search .*\)/\1/p' manual | sed 's/cfg32/cfg32 -f my.conf/' >find.sh
    $ sh find.sh
    dn: cn=Front End, cn=Configuration
    oru-slapdInvalidLine: oru-slapdWorkers: many
    
