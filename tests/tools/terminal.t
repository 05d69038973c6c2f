A terminal gets colours, a pipe does not:

    $ . "$TOOLS/scratch.sh"
    $ printf 'dn: cn=Configuration\noru-slapdPort: 0\n' > doubtful
    $ export TERM=xterm
    $ has_colour() { grep -q $'\e\\[' && echo coloured || echo plain; }
    $ "$TOOLS/in_terminal" -- cfg32 check doubtful | has_colour
    coloured
    $ cfg32 check doubtful | has_colour
    plain

--color says so against what the output is, and NO_COLOR and a dumb terminal are respected:

    $ cfg32 --color always check doubtful | has_colour
    coloured
    $ "$TOOLS/in_terminal" -- cfg32 --color never check doubtful | has_colour
    plain
    $ NO_COLOR=1 "$TOOLS/in_terminal" -- cfg32 check doubtful | has_colour
    plain
    $ NO_COLOR= "$TOOLS/in_terminal" -- cfg32 check doubtful | has_colour
    coloured
    $ TERM=dumb "$TOOLS/in_terminal" -- cfg32 check doubtful | has_colour
    plain
    $ NO_COLOR=1 cfg32 --color always check doubtful | has_colour
    coloured
    $ cfg32 --color sometimes check doubtful
    cfg32: --color: sometimes not in {auto,always,never}
      hint: `cfg32 check --help` tells what there is
    [2]

What takes longer than a second tells a terminal what it is doing, and takes that away again. Here it
is another program that keeps the file:

    $ held() { flock -x oruslapd.conf sleep 3 & sleep 0.2; "$@"; wait; }
    $ held "$TOOLS/in_terminal" -- cfg32 -f oruslapd.conf get cn=Configuration cn |
    >     tr '\r\033' '\n^' | sed 's/[1-9] s$/N s/' | uniq
    
    Reading oruslapd.conf ... N s
    ^[KConfiguration
    $ held cfg32 -f oruslapd.conf get cn=Configuration cn
    Configuration

Output that can't be written is a failure:

    $ cfg32 -f oruslapd.conf search > /dev/full
    cfg32: standard output can't be written
    [3]
    $ cfg32 -f oruslapd.conf get cn=Configuration cn > /dev/full
    cfg32: standard output can't be written
    [3]
