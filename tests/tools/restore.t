It puts a backup back, byte for byte, after showing what that changes, and keeps what it replaces:

    $ export NO_COLOR=1
    $ . "$TOOLS/scratch.sh"
    $ cp oruslapd.conf original
    $ cfg32 -f oruslapd.conf set cn=Configuration oru-slapdVersion 9
    $ cp oruslapd.conf changed
    $ cfg32 -f oruslapd.conf restore --yes | grep '^[-+]oru-slapdVersion'
    +oru-slapdVersion: 4.2.1
    -oru-slapdVersion: 9
    $ cmp original oruslapd.conf && cmp changed oruslapd.conf.before-restore && cmp original oruslapd.conf.bak

What is there already is not written:

    $ state_of oruslapd.conf > state
    $ cfg32 -f oruslapd.conf restore --yes
    unchanged
    $ state_of oruslapd.conf | cmp - state

A restore is undone by restoring what it kept, and that again:

    $ cfg32 -f oruslapd.conf restore --yes oruslapd.conf.before-restore > diff
    $ cmp changed oruslapd.conf && cmp original oruslapd.conf.before-undo
    $ cfg32 -f oruslapd.conf restore --yes oruslapd.conf.before-undo > diff
    $ cmp original oruslapd.conf

A dry run only shows it:

    $ state_of oruslapd.conf > state
    $ sed 's/^version: 1$/# one\n&/; s/^oru-slapdAdminPW: >.*/oru-slapdAdminPW: sesame/' original > small-change
    $ cfg32 -f oruslapd.conf restore -n small-change
    --- oruslapd.conf
    +++ oruslapd.conf
    @@ -16,6 +16,7 @@
     # or the attribute that follows them.
     # ---------------------------------------------------------------------------
     
    +# one
     version: 1
     # The file is UTF-8 throughout, comments included.
     charset: UTF-8
    @@ -27,7 +28,7 @@
     objectclass: top
     objectclass: oruConfigTop
     oru-slapdAdminDN: cn=root
    -oru-slapdAdminPW: ********
    +oru-slapdAdminPW: ********
     # Assigned once by the installer; two servers must never share it.
     oru-slapdServerID: 7c1f0a52-lindau-01
     oru-slapdVersion: 4.2.1
    $ state_of oruslapd.conf | cmp - state

At a terminal it asks; another answer than yes leaves the file alone:

    $ "$TOOLS"/in_terminal '[y/n]' n -- cfg32 -f oruslapd.conf restore small-change | tail -1; (exit ${PIPESTATUS[0]})
    cfg32: nothing was restored
    [1]
    $ state_of oruslapd.conf | cmp - state
    $ "$TOOLS"/in_terminal '[y/n]' yes -- cfg32 -f oruslapd.conf restore small-change | tail -1; (exit ${PIPESTATUS[0]})
    Restore? [y/n] yes
    $ cmp small-change oruslapd.conf
    $ cfg32 -f oruslapd.conf restore --yes original > diff
    $ cmp original oruslapd.conf

Where nobody can be asked, --yes says that it is meant:

    $ cfg32 -f oruslapd.conf restore small-change > diff
    cfg32: nobody can be asked here: --yes restores
    [2]
    $ cmp original oruslapd.conf

What can't be loaded is not restored, and it is said why; what a load would put aside is told:

    $ printf 'dn: cn=Configuration\ncn: x\n\ndn: no name\n' > broken
    $ cfg32 -f oruslapd.conf restore --yes broken
    broken:4:8: error: Invalid character in RDN attribute: n [invalid-dn]
        4 | dn: no name
          |        ^
          = accepted: a distinguished name, such as cn=Name, cn=Configuration
    1 error
    cfg32: broken can't be loaded; nothing was restored
    [1]
    $ cmp original oruslapd.conf
    $ printf 'dn: cn=Configuration\noru-slapdPort: 0\n' > doubtful
    $ cfg32 -f oruslapd.conf restore --yes doubtful 2>&1 > diff
    doubtful:2:16: error: Integer value out of range [invalid-value]
        2 | oru-slapdPort: 0
          |                ^
          = accepted: an integer from 1 to 65535
    1 error
    $ cmp doubtful oruslapd.conf

A file that can't be loaded is no obstacle:

    $ cp broken oruslapd.conf
    $ cfg32 -f oruslapd.conf restore --yes original > diff
    $ cmp original oruslapd.conf && cmp broken oruslapd.conf.before-restore

Neither is one that was not written to its end. It is not kept: the backup is the complete version.

    $ rm oruslapd.conf.before-restore
    $ printf '# This file is being written. If it stays so, its backup is the complete version.\ndn: cn=C' > oruslapd.conf
    $ cp original oruslapd.conf.bak
    $ cfg32 -f oruslapd.conf restore --yes > diff
    $ cmp original oruslapd.conf && ls oruslapd.conf.before-restore
    ls: cannot access 'oruslapd.conf.before-restore': No such file or directory
    [2]

That version is in what a restore kept, when it was a restore that did not come to its end:

    $ cp original oruslapd.conf.bak && cp changed oruslapd.conf.before-restore
    $ printf '# This file is being written. If it stays so, its backup is the complete version.\ndn: cn=C' > oruslapd.conf
    $ cfg32 -f oruslapd.conf restore --yes > diff
    $ cmp changed oruslapd.conf
    $ rm oruslapd.conf.before-restore && cp original oruslapd.conf

Nor is a file that is gone; the new one has the backup's mode:

    $ rm oruslapd.conf && chmod 640 oruslapd.conf.bak
    $ cfg32 -f oruslapd.conf restore --yes > diff
    $ cmp original oruslapd.conf && stat --format=%a oruslapd.conf
    640

It is made again also when its name is too long for one to keep it by:

    $ name=$(printf '%0243d' 1) && cp original $name.bak
    $ cfg32 -f $name restore --yes > diff
    $ cmp original $name && rm $name*

Where the replaced file goes can be said, but not over what is restored:

    $ cfg32 -f oruslapd.conf --backup kept restore --yes changed > diff
    $ cmp original kept && cmp changed oruslapd.conf
    $ cfg32 -f oruslapd.conf --backup kept restore kept
    cfg32: what is restored can't be overwritten: kept
    [2]
    $ cfg32 -f oruslapd.conf restore --yes nowhere
    cfg32: nowhere: No such file or directory [Connection error (91)]
    [3]
    $ rm -f oruslapd.conf.bak; cfg32 -f oruslapd.conf restore --yes
    cfg32: oruslapd.conf.bak: No such file or directory [Connection error (91)]
    [3]

Without room for it the file stays as it was:

    $ printf 'dn: cn=Configuration\ncn: x\n' > oruslapd.conf
    $ state_of oruslapd.conf > state
    $ (ulimit -f 8; cfg32 -f oruslapd.conf restore --yes original 2>&1 || echo "[$?]") | tail -3
    cfg32: oruslapd.conf: System error writing file [Unknown error (80)]
      system error: File too large
    [3]
    $ state_of oruslapd.conf | cmp - state

What can't be shown is not done:

    $ cp original oruslapd.conf && state_of oruslapd.conf > state
    $ cfg32 -f oruslapd.conf restore --yes changed > /dev/full
    cfg32: standard output can't be written
    [3]
    $ state_of oruslapd.conf | cmp - state

Of a file that is gone the backup knows the administrator:

    $ cp original backup && rm oruslapd.conf && echo wrong > password
    $ cfg32 -f oruslapd.conf --key-file oruslapd.key -D cn=root -y password restore --yes backup
    cfg32: backup: not the administrator's DN and password [Invalid credentials (49)]
    [3]
    $ ls oruslapd.conf
    ls: cannot access 'oruslapd.conf': No such file or directory
    [2]

Where a symbolic link means the file that is gone, it is made there:

    $ mkdir real && ln -s real/link oruslapd.conf && ln -s conf real/link
    $ cfg32 -f oruslapd.conf restore --yes backup > diff
    $ cmp backup real/conf && readlink oruslapd.conf real/link
    real/link
    conf

A name of which it can't be told whether there is such a file is none of a missing one:

    $ ln -s loop loop
    $ cfg32 -f loop restore --yes backup
    cfg32: loop: Too many levels of symbolic links
    [3]
