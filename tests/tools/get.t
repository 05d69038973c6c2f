It prints each value of an attribute on a line:

    $ . "$TOOLS/scratch.sh"
    $ cfg32 -f oruslapd.conf get "cn=Client Listener, cn=Network, cn=Configuration" oru-slapdPort
    389
    $ cfg32 -f oruslapd.conf get "cn=Configuration" objectclass
    top
    oruConfigTop

Names and DNs are compared without regard to case, and DNs in any of their forms:

    $ cfg32 -f oruslapd.conf get "CN=client listener,CN=network;CN=configuration" ORU-slapdPORT
    389

Options may stand behind the command as well:

    $ cfg32 get -f oruslapd.conf cn=Configuration cn
    Configuration

A continued value comes in one piece:

    $ cfg32 -f oruslapd.conf get cn=Configuration nuv-instanceDesc
    Directory of the Lindau and München offices; changes are agreed with Jörg Voß, telephone extension 4410

Passwords are seen only when nobody can read them; masked ones are not:

    $ cfg32 -f oruslapd.conf get "cn=jvoss, cn=Administrators, cn=Configuration" oru-slapdAdminPW
    {AES256}EKYCnJOygjgfY9+X+KdRfAj7wgohq5+wxoTFJNccOrZdYD5D/4qHkzX1XgCsAbHO
    $ cfg32 -f oruslapd.conf get cn=Configuration oru-slapdAdminPW
    ********

An attribute or an entry that is not there is the answer no:

    $ cfg32 -f oruslapd.conf get cn=Configuration oru-slapdPrt
    cfg32: oruslapd.conf: cn=Configuration has no attribute oru-slapdPrt; did you mean oru-slapdPort? [No such attribute (16)]
    [1]
    $ cfg32 -f oruslapd.conf get cn=Configuration oru-slapdPort
    cfg32: oruslapd.conf: cn=Configuration has no attribute oru-slapdPort [No such attribute (16)]
    [1]
    $ cfg32 -f oruslapd.conf get cn=Nobody,cn=Configuration cn
    cfg32: oruslapd.conf: no entry cn=Nobody,cn=Configuration [No such object (32)]
    [1]

What is no DN is a failure:

    $ cfg32 -f oruslapd.conf get nobody cn
    cfg32: Missing RDN value: nobody [Invalid DN syntax (34)]
    [3]

JSON says the same:

    $ cfg32 -f oruslapd.conf get "cn=Client Listener, cn=Network, cn=Configuration" oru-slapdPort --json | tee found
    {
      "file": "oruslapd.conf",
      "entries": [
        {
          "dn": "cn=Client Listener, cn=Network, cn=Configuration",
          "attributes": {
            "oru-slapdPort": [
              "389"
            ]
          }
        }
      ],
      "leftOut": []
    }
    $ "$TOOLS/valid_json" search < found
    valid
    $ cfg32 -f oruslapd.conf get cn=Configuration oru-slapdAdminPW --json | grep -A1 PW
            "oru-slapdAdminPW": [
              "********"

With a DN it binds as the administrator; whose password it is has to be right:

    $ echo Correct-Horse-7 > password
    $ cfg32 -f oruslapd.conf --key-file oruslapd.key -D cn=root -y password get cn=Configuration cn
    Configuration
    $ echo wrong > password
    $ cfg32 -f oruslapd.conf --key-file oruslapd.key -D cn=root -y password get cn=Configuration cn
    cfg32: oruslapd.conf: not the administrator's DN and password [Invalid credentials (49)]
    [3]
    $ cfg32 -f oruslapd.conf -D cn=root get cn=Configuration cn
    cfg32: -D needs a password: add -W or -y FILE
    [2]

The password is the first line, of a pipe as well, and what can't be read is told:

    $ cfg32 -f oruslapd.conf --key-file oruslapd.key -D cn=root -y <(printf Correct-; sleep 0.1; printf Horse-7) get cn=Configuration cn
    Configuration
    $ printf 'Correct-Horse-7\nand more\n' > password
    $ cfg32 -f oruslapd.conf --key-file oruslapd.key -D cn=root -y password get cn=Configuration cn
    Configuration
    $ cfg32 -f oruslapd.conf -D cn=root -y nowhere get cn=Configuration cn
    cfg32: nowhere: No such file or directory
    [3]
    $ cfg32 -f oruslapd.conf -D cn=root -y . get cn=Configuration cn
    cfg32: .: Is a directory
    [3]
    $ cfg32 -f oruslapd.conf -D cn=root -y /dev/zero get cn=Configuration cn
    cfg32: /dev/zero: a password has at most 1024 bytes
    [3]

A key that others could read is not used, nor what is no key:

    $ chmod 640 oruslapd.key
    $ cfg32 -f oruslapd.conf --key-file oruslapd.key get cn=Configuration cn
    cfg32: oruslapd.key: a key file that others can read is not used
    [3]
    $ install -m 600 /dev/null empty.key
    $ cfg32 -f oruslapd.conf --key-file empty.key get cn=Configuration cn
    cfg32: empty.key: a key file holds 16, 24 or 32 bytes
    [3]
    $ cfg32 -f oruslapd.conf --key-file no.key get cn=Configuration cn
    cfg32: no.key: No such file or directory
    [3]

A locale that is not there is told, and what is ASCII is read all the same:

    $ printf 'dn: cn=Configuration\ncn: Configuration\n' > ascii.conf
    $ LC_ALL=xx_XX cfg32 -f ascii.conf get cn=Configuration cn
    cfg32: the locale that the environment names is not installed: text is taken for ASCII (LC_ALL=C.UTF-8 is always there)
    Configuration

Without -f it is the server's own file, and without a server that is said:

    $ mkdir -p server/etc && cp oruslapd.conf server/etc/
    $ NUV_INSTALL_PATH=$PWD/server cfg32 get cn=Configuration cn
    Configuration
    $ cfg32 -f nowhere.conf get cn=Configuration cn
    cfg32: nowhere.conf: No such file or directory [Connection error (91)]
    [3]

A missing argument is a usage error:

    $ cfg32 get cn=Configuration
    cfg32: attribute is required
      hint: `cfg32 get --help` tells what there is
    [2]

What a message shows can't control a terminal:

    $ cfg32 -f "$(printf 'a\033[31m')" get cn=x cn
    cfg32: a?[31m: No such file or directory [Connection error (91)]
    [3]

What a value holds can't control a terminal either; a program gets it as it is:

    $ printf 'dn: cn=x\nnuv-instanceDesc: \033[8mx\302\2331m\n' > control.conf
    $ "$TOOLS"/in_terminal -- cfg32 -f control.conf get cn=x nuv-instanceDesc
    ?[8mx?1m
    $ cfg32 -f control.conf get cn=x nuv-instanceDesc | od -An -c | tr -s ' '
     033 [ 8 m x 302 233 1 m \n
    $ cfg32 -f control.conf search -b cn=x
    dn: cn=x
    nuv-instanceDesc:: G1s4bXjCmzFt
    
    $ printf 'dn: cn=x\nnuv-instanceDesc: y\n' > other.conf
    $ cfg32 diff --format text control.conf other.conf
      cn=x
    -   nuv-instanceDesc: ?[8mx?1m
    +   nuv-instanceDesc: y
    [1]
    $ cfg32 -f control.conf restore -n other.conf
    other.conf:2:1: error: no entry "cn=Configuration": nobody can bind as administrator [missing-configuration]
        2 | nuv-instanceDesc: y
          | ^
    1 error
    --- control.conf
    +++ control.conf
    @@ -1,2 +1,2 @@
     dn: cn=x
    -nuv-instanceDesc: ?[8mx?1m
    +nuv-instanceDesc: y
