Help tells the commands, and the options that all of them have:

    $ cfg32 --help
    Reads, checks and changes the configuration file of the directory server.
    Usage: cfg32 [OPTIONS] SUBCOMMAND
    
    Options:
      -h,--help                   Print this help message and exit
      --version                   Display program version information and exit
    
    
    Options of every command:
      -f,--file FILE              the configuration file; else the server's own
      -D,--bind-dn DN             bind as the administrator; else anonymously
      -W,--ask-password           with -D: ask for the password
      -y,--password-file FILE     with -D: the password is the first line of a file
      --key-file FILE             the key of encoded passwords
      --backup FILE               where a change puts the file of before; else FILE.bak
      --no-backup                 make no backup
      --color auto|always|never   else auto, which respects NO_COLOR
    
    
    Subcommands:
      check                       find every problem of a file, without changing it
      search                      print entries as LDIF or JSON
      get                         print the values of an attribute
      tree                        draw the tree of entries
      explain                     tell what an attribute takes
      schema                      list all attributes
      set                         give an attribute these values
      unset                       remove an attribute, or some of its values
      passwd                      set a password from a prompt
      add                         add entries from LDIF
      modify                      carry out the changes of an LDIF text
      delete                      delete entries
      diff                        tell what differs between two files
      apply                       make the configuration the same as another file's
      edit                        edit the file or one entry, and check before it is written
      backup                      copy the file now
      restore                     put a backup back
      keygen                      make a key file for passwords
      completion                  print a completion script for a shell
    

Each command has its own:

    $ cfg32 set --help
    give an attribute these values
    Usage: cfg32 set [OPTIONS] dn attribute value...
    
    Positionals:
      dn DN                       the entry
      attribute ATTR              its attribute
      value VALUE                 all the values it is to have; "--" goes before one like "-x"
    
    Options:
      -h,--help                   Print this help message and exit
      -n,--dry-run                show the change as a diff and leave the file alone
      --json                      print JSON
      --unknown-attribute         take a name that the server does not know
    
    `cfg32 --help` lists the options of every command.

Without a command it says what is missing, and that is a usage error:

    $ cfg32
    cfg32: no command is given
      hint: `cfg32 --help` tells what there is
    [2]

So is a command that is not there, an argument that is missing, an option that is of no use, or is
not there, and an empty value:

    $ cfg32 sett
    cfg32: no command is called sett
      hint: `cfg32 --help` tells what there is
    [2]
    $ cfg32 get cn=Configuration
    cfg32: attribute is required
      hint: `cfg32 get --help` tells what there is
    [2]
    $ cfg32 -n get a b
    cfg32: get takes no -n
    [2]
    $ cfg32 get -n a b
    cfg32: get takes no -n
    [2]
    $ cfg32 -D cn=root check
    cfg32: check takes no -D
    [2]
    $ cfg32 -f '' check
    cfg32: --file: is empty
      hint: `cfg32 check --help` tells what there is
    [2]
    $ cfg32 --file= check
    cfg32: --file= is empty
    [2]
    $ cfg32 -D '' -W get a b
    cfg32: --bind-dn: is empty
      hint: `cfg32 get --help` tells what there is
    [2]

Help that did not arrive is a failure:

    $ cfg32 --help >/dev/full
    cfg32: standard output can't be written
    [3]
    $ cfg32 set --help >/dev/full
    cfg32: standard output can't be written
    [3]
    $ cfg32 --version >/dev/full
    cfg32: standard output can't be written
    [3]

Every word means itself; a list in brackets is no list:

    $ . "$TOOLS/scratch.sh"
    $ entry="cn=Referrals, cn=Network, cn=Configuration"
    $ cfg32 -f oruslapd.conf unset "$entry" oru-slapdReferral '[]' '[a,b]'
    unchanged
    $ cfg32 -f oruslapd.conf set "$entry" oru-slapdReferral '[ldap://a:389,ldap://b:389]' '{}' '%%' -- '[--x]' -n -y set
    $ cfg32 -f oruslapd.conf get "$entry" oru-slapdReferral
    [ldap://a:389,ldap://b:389]
    {}
    %%
    [--x]
    -n
    -y
    set
    $ cfg32 check '[a,b]'
    cfg32: [a,b]: No such file or directory [Connection error (91)]
    [3]
    $ cfg32 explain '[cn]'
    cfg32: no attribute is called [cn]
    [1]
    $ cfg32 -f '[x]' get cn=x cn
    cfg32: [x]: No such file or directory [Connection error (91)]
    [3]
    $ cfg32 keygen k --bits '[128]' 2>&1 | head -1
    cfg32: --bits: [128] not in {128,192,256}

An empty word comes from a variable that is not set: it is no name, no DN and no file. Of commands
that would take another one's place for it, none does anything:

    $ for command in "get XX cn" "get cn=x XX" "set XX charset x" "unset cn=Configuration XX" \
    >     "edit XX" "restore --yes XX" "backup XX" "modify -l XX" "delete XX" "tree XX" "check XX" \
    >     "search -b XX" "search XX" "apply XX" "keygen XX" "-f XX tree" "tree -D XX"; do
    >     words=(); for word in $command; do words+=("${word/XX/}"); done
    >     cfg32 "${words[@]}" 2> message; echo "$? $(head -1 message)"
    > done
    2 cfg32: dn: is empty
    2 cfg32: attribute: is empty
    2 cfg32: dn: is empty
    2 cfg32: attribute: is empty
    2 cfg32: dn: is empty
    2 cfg32: backup: is empty
    2 cfg32: backup: is empty
    2 cfg32: --ldif: is empty
    2 cfg32: dn: is empty
    2 cfg32: base: is empty
    2 cfg32: file: is empty
    2 cfg32: --base: is empty
    2 cfg32: filter: is empty
    2 cfg32: wanted: is empty
    2 cfg32: file: is empty
    2 cfg32: --file: is empty
    2 cfg32: --bind-dn: is empty
