The scripts are ones that their shells can read:

    $ for shell in bash zsh fish; do cfg32 completion $shell >script.$shell; $shell -n script.$shell; done

Another shell is a usage error:

    $ cfg32 completion tcsh
    cfg32: shell: tcsh not in {bash,zsh,fish}
      hint: `cfg32 completion --help` tells what there is
    [2]

What the scripts use is not in the help:

    $ cfg32 completion --help | grep candidates
    [1]

    $ cp "$EXAMPLES/oruslapd.conf" my.conf

In bash the function answers for the words of the line up to the cursor:

    $ source script.bash
    $ complete_line() {
    >     COMP_LINE=$1 COMP_POINT=${#1} COMP_WORDS=("${@:2}") COMP_CWORD=$(($# - 2))
    >     COMP_WORDBREAKS=$' \t\n"\'><=;|&(:'
    >     _cfg32
    >     printf '<%s>\n' "${COMPREPLY[@]}"
    > }

commands,

    $ complete_line 'cfg32 sc' cfg32 sc
    <schema>

options, also shared ones,

    $ complete_line 'cfg32 schema --f' cfg32 schema --f
    <--format>
    <--file>

their words, also after an equals sign, at which bash breaks words,

    $ complete_line 'cfg32 schema --format ' cfg32 schema --format ''
    <table>
    <json>
    <markdown>
    $ complete_line 'cfg32 schema --format=m' cfg32 schema --format = m
    <markdown>

names of attributes,

    $ complete_line 'cfg32 explain cn oru-slapdSslCipher' cfg32 explain cn oru-slapdSslCipher
    <oru-slapdSslCipherSpec>
    <oru-slapdSslCipherSpecs>

and DNs of the file that the line names: without quotes, where only the end of the word is replaced,

    $ complete_line 'cfg32 -f my.conf get cn=Fr' cfg32 -f my.conf get cn = Fr
    <Front\ End,\ cn=Configuration>
    $ complete_line 'cfg32 -f my.conf get cn=Client\ Listener,\ cn=N' \
    >     cfg32 -f my.conf get cn = 'Client\ Listener,\ cn' = N
    <Network,\ cn=Configuration>

with an equals sign that is escaped,

    $ complete_line 'cfg32 -f my.conf get cn\=Fr' cfg32 -f my.conf get 'cn\=Fr'
    <cn=Front\ End,\ cn=Configuration>

and within quotes of both kinds:

    $ complete_line 'cfg32 -f my.conf get "cn=Client L' cfg32 -f my.conf get '"cn=Client L'
    <cn=Client Listener, cn=Network, cn=Configuration>
    $ complete_line "cfg32 -f my.conf get 'cn=Client L" cfg32 -f my.conf get "'cn=Client L"
    <cn=Client Listener, cn=Network, cn=Configuration>

Without the text of the line its words are taken as they are:

    $ COMP_LINE= COMP_POINT=0 COMP_WORDS=(cfg32 -f my.conf get 'cn=Fr') COMP_CWORD=4
    $ _cfg32; printf '<%s>\n' "${COMPREPLY[@]}"
    <Front\ End,\ cn=Configuration>

What stands after the cursor does not count:

    $ COMP_LINE='cfg32 schxyz' COMP_POINT=8 COMP_WORDS=(cfg32 schxyz) COMP_CWORD=1
    $ _cfg32; printf '<%s>\n' "${COMPREPLY[@]}"
    <schema>

A file that is not there, or can't be loaded, has no DNs and no messages:

    $ complete_line 'cfg32 -f none.conf get cn' cfg32 -f none.conf get cn
    <>
    $ printf 'dn: none\n' >bad.conf
    $ complete_line 'cfg32 -f bad.conf get cn' cfg32 -f bad.conf get cn
    <>

A program that has locked the file is not waited for, and a file that never ends is not read:

    $ mkfifo pipe.conf
    $ complete_locked() {
    >     flock my.conf cfg32 completion bash --candidates
    > }
    $ printf '%s\0' '' cfg32 -f my.conf get cn=Fr | complete_locked
    words
    cn=Front\ End,\ cn=Configuration
    $ complete_line 'cfg32 -f pipe.conf get cn' cfg32 -f pipe.conf get cn
    <>

The DN that binds is one of the administrators:

    $ complete_line 'cfg32 -f my.conf -D ' cfg32 -f my.conf -D ''
    <cn=root>
    <cn=jvoss,\ ou=staff,\ dc=example,\ dc=com>
    <cn=tlindqvist,\ ou=staff,\ dc=example,\ dc=com>
    <cn=helpdesk,\ ou=services,\ dc=example,\ dc=com>
    <cn=auditors,\ ou=guests,\ dc=example,\ dc=com>

A file with lines that a load would rewrite stays as it is:

    $ printf 'dn: cn=Configuration\nobjectclass: top\noru-slapdPort: x\n\n' >lines.conf
    $ cp -p lines.conf before.conf; before=$(stat -c %y:%z:%i lines.conf)
    $ complete_line 'cfg32 -f lines.conf get ' cfg32 -f lines.conf get ''
    <cn=Configuration>
    $ cmp lines.conf before.conf; [ "$before" = "$(stat -c %y:%z:%i lines.conf)" ]

No command of the help is left out:

    $ complete_line 'cfg32 ' cfg32 '' | tr -d '<>' | sort >completed
    $ cfg32 --help | sed -n '/^Subcommands:/,$p' | awk 'NR > 1 && NF { print $1 }' | sort | diff - completed

Fish completes the same:

    $ complete_in_fish() { HOME=$PWD fish --no-config -c "source script.fish; complete -C '$1'"; }
    $ complete_in_fish 'cfg32 sc'
    schema\tlist all attributes (esc)
    $ complete_in_fish 'cfg32 schema --format '
    json
    markdown
    table
    $ complete_in_fish 'cfg32 schema --format=m'
    --format=markdown
    $ complete_in_fish 'cfg32 explain oru-slapdPor'
    oru-slapdPort\tan integer from 1 to 65535 (esc)
    $ complete_in_fish 'cfg32 -f my.conf get "cn=Client L'
    cn=Client Listener, cn=Network, cn=Configuration
    $ complete_in_fish 'cfg32 -f my.c'
    my.conf
    $ complete_in_fish 'cfg32 --file=my.c'
    --file=my.conf

And a line that is typed at a terminal, with a tab where it is completed, gives the command the whole
DN as one word, however it was quoted:

    $ for shell in bash zsh fish; do
    >     echo "$shell:"
    >     "$TOOLS/type_in_shell" $shell 'cfg32 -f my.c\t search -b cn=Front\t --sc\tsu\t'
    >     "$TOOLS/type_in_shell" $shell 'cfg32 -f my.conf get "cn=Client L\t oru-slapdPor\t'
    >     "$TOOLS/type_in_shell" $shell 'cfg32 -f my.conf get cn=Client\ L\t --color=al\t'
    >     "$TOOLS/type_in_shell" $shell 'cfg32 --file=my.c\t -D cn=jv\t'
    > done
    bash:
    <-f>
    <my.conf>
    <search>
    <-b>
    <cn=Front End, cn=Configuration>
    <--scope>
    <sub>
    <-f>
    <my.conf>
    <get>
    <cn=Client Listener, cn=Network, cn=Configuration>
    <oru-slapdPort>
    <-f>
    <my.conf>
    <get>
    <cn=Client Listener, cn=Network, cn=Configuration>
    <--color=always>
    <--file=my.conf>
    <-D>
    <cn=jvoss, ou=staff, dc=example, dc=com>
    zsh:
    <-f>
    <my.conf>
    <search>
    <-b>
    <cn=Front End, cn=Configuration>
    <--scope>
    <sub>
    <-f>
    <my.conf>
    <get>
    <cn=Client Listener, cn=Network, cn=Configuration>
    <oru-slapdPort>
    <-f>
    <my.conf>
    <get>
    <cn=Client Listener, cn=Network, cn=Configuration>
    <--color=always>
    <--file=my.conf>
    <-D>
    <cn=jvoss, ou=staff, dc=example, dc=com>
    fish:
    <-f>
    <my.conf>
    <search>
    <-b>
    <cn=Front End, cn=Configuration>
    <--scope>
    <sub>
    <-f>
    <my.conf>
    <get>
    <cn=Client Listener, cn=Network, cn=Configuration>
    <oru-slapdPort>
    <-f>
    <my.conf>
    <get>
    <cn=Client Listener, cn=Network, cn=Configuration>
    <--color=always>
    <--file=my.conf>
    <-D>
    <cn=jvoss, ou=staff, dc=example, dc=com>

The program that the line names answers, wherever it lies:

    $ mkdir there
    $ cat >there/cfg32 <<'END'
    > #!/bin/bash
    > if [ "$1" = completion ]; then
    >     printf 'words\nfrom-there\n'
    > else
    >     printf '<%s>\n' "$@"; echo end
    > fi
    > END
    $ chmod +x there/cfg32; mkdir there/"a b"; cp there/cfg32 there/"a b"
    $ for shell in bash zsh fish; do
    >     "$TOOLS/type_in_shell" $shell 'there/cfg32 fr\t'
    >     "$TOOLS/type_in_shell" $shell "$PWD/there/cfg32 fr\t"
    >     "$TOOLS/type_in_shell" $shell 'there/a\ b/cfg32 fr\t'
    > done
    <from-there>
    <from-there>
    <from-there>
    <from-there>
    <from-there>
    <from-there>
    <from-there>
    <from-there>
    <from-there>

also from the home folder, and for another name of it the one of PATH:

    $ HOME=$PWD complete_line '~/there/cfg32 fr' '~/there/cfg32' fr
    <from-there>
    $ complete_line 'config sc' config sc
    <schema>
