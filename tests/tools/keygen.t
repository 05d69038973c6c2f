It makes a key file that only its owner can read, whatever the umask is:

    $ umask 0; cfg32 keygen new.key; umask 022
    $ stat --format='%A %s' new.key
    -rw------- 32
    $ umask 777; cfg32 keygen strict.key; umask 022
    $ stat --format='%A %s' strict.key
    -rw------- 32

The size of the key is one that AES has:

    $ cfg32 keygen --bits 128 short.key && stat --format=%s short.key
    16
    $ cfg32 keygen --bits 192 middle.key && stat --format=%s middle.key
    24
    $ cfg32 keygen --bits 100 odd.key
    cfg32: --bits: 100 not in {128,192,256}
      hint: `cfg32 keygen --help` tells what there is
    [2]

No two keys are the same:

    $ cfg32 keygen other.key && cmp new.key other.key > /dev/null
    [1]

A file that is there is never overwritten:

    $ cfg32 keygen new.key
    cfg32: new.key: File exists
    [3]
    $ cfg32 keygen no/such/folder.key
    cfg32: no/such/folder.key: No such file or directory
    [3]

The key serves:

    $ . "$TOOLS/scratch.sh"
    $ cfg32 -f oruslapd.conf --key-file new.key get cn=Configuration cn
    Configuration

A disk that is full leaves no piece of a key:

    $ (ulimit -f 0; cfg32 keygen full.key 2>&1 || echo "[$?]") | cat
    cfg32: full.key: File too large
    [3]
    $ ls full.key
    ls: cannot access 'full.key': No such file or directory
    [2]
