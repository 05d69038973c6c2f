It copies the file, with its mode, beside it or to another name:

    $ . "$TOOLS/scratch.sh"
    $ chmod 640 oruslapd.conf
    $ cfg32 -f oruslapd.conf backup
    $ cmp oruslapd.conf oruslapd.conf.bak && stat --format=%a oruslapd.conf.bak
    640
    $ cfg32 -f oruslapd.conf backup copy && cmp oruslapd.conf copy
    $ cfg32 -f oruslapd.conf --backup other backup && cmp oruslapd.conf other

What is no place for a copy is a failure, and changes nothing:

    $ cfg32 -f oruslapd.conf backup no/such/folder
    cfg32: oruslapd.conf can't be copied to no/such/folder: No such file or directory
    [3]
    $ cfg32 -f oruslapd.conf --no-backup backup
    cfg32: --no-backup leaves nothing to do
    [2]
    $ cfg32 -f nowhere backup
    cfg32: nowhere: No such file or directory [Connection error (91)]
    [3]

A file that can't be loaded doesn't take the place of a backup, which may be the last good version;
under another name it is copied:

    $ echo "dn: no name" >> oruslapd.conf
    $ cfg32 -f oruslapd.conf backup
    cfg32: oruslapd.conf:850: Invalid character in RDN attribute: n; oruslapd.conf.bak stays as it is (name another file to copy to)
    [1]
    $ cfg32 -f oruslapd.conf backup broken && cmp oruslapd.conf broken

It waits for one who is writing, but not for ever:

    $ cfg32 -f oruslapd.conf --no-backup restore --yes copy > diff
    $ flock oruslapd.conf cfg32 -f oruslapd.conf backup late
    cfg32: oruslapd.conf: in use by another process [DSA is busy (51)]
    [3]
    $ ls late
    ls: cannot access 'late': No such file or directory
    [2]
