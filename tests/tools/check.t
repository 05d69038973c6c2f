A file of which there is nothing to say:

    $ cat > good.conf <<'END'
    > version: 1
    > charset: UTF-8
    > 
    > # Lindau und München
    > dn: cn=Configuration
    > cn: Configuration
    > oru-slapdAdminDN: cn=root
    > END
    $ cfg32 check good.conf
    $ cfg32 -f good.conf check
    $ cfg32 check --json good.conf
    {
      "files": [
        {
          "file": "good.conf",
          "problems": []
        }
      ]
    }

The example file has none, with its key and without, and is left alone:

    $ . "$TOOLS/scratch.sh"
    $ state_of oruslapd.conf > before
    $ cfg32 -f oruslapd.conf check
    $ cfg32 --key-file oruslapd.key check oruslapd.conf
    $ state_of oruslapd.conf | cmp - before

Twenty problems of many kinds are all found, at their places and in their order, and nothing else is:

    $ cat > twenty.txt <<'END'
    > # Twenty things are wrong with this file.
    > version: 1
    > oru-slapdPort: 389
    > charset: UTF-8
    > charset: ISO-8859-1
    > 
    > dn: cn=Configuration
    > cn: Configuration
    > objectclass: top
    > objectclass: TOP
    > oru-slapdPwEncryption: rot13
    > oru-slapdAdminDN: cn=root
    > oru-slapdAdminPW open sesame
    > 
    > dn: cn=Network, cn=Configuration
    > cn: Network
    > cn: Network of Lindau
    > oru-slapdPort: 70000
    > oru-slapdSecurty: SSL
    > # The line above is mistyped, the one below was kept by a load.
    > oru-slapdInvalidLine: oru-slapdSecurity
    > oru-slapdIpAddress:: MTkyLjAuMi4xMA==
    > 
    > oru-slapdSecurePort: 636
    > 
    > dn: cn=Workers, cn=Front End, cn=Configuration
    > cn: Workers
    > oru-slapdSuffix: dc=example, dc
    > 
    > dn: cn=Lindau , cn=Configuration
    > nuv-instanceDesc: Lindau und München, beide
    >  am Wasser
    > oru-slapdSetenv: GREETING=Gr@FC@@DF@e
    > 
    > dn: cn=Suppliers cn=Configuration
    > cn: Suppliers
    > oru-slapdMasterDN: cn=replica, ou=services
    > 
    > dn: cn=network, cn=configuration
    > cn: Network
    > 
    > dn: cn=a+ou=Sites, cn=Configuration
    > cn: a
    > 
    > dn: cn=Proxy, cn=Configuration
    > oru-slapdProxySplitName: dc=a@00@, dc=b
    > oru-slapdProxyTargetUrl: ldap://192.0.2.8
    > END
    $ LC_ALL=C sed 's/@FC@/\xfc/; s/@DF@/\xdf/; s/@00@/\x00/' twenty.txt | head -c -1 > twenty.conf
    $ ls --full-time twenty.conf > before; sha256sum twenty.conf >> before
    $ places() { sed -nE 's/^[^:]*:([0-9]+:[0-9]+): (error|warning): .* \[(.*)\]$/\1 \2 \3/p'; }
    $ cfg32 check twenty.conf > report
    [1]
    $ places < report
    3:1 error attribute-outside-entry
    5:1 error repeated-header
    10:14 warning duplicate-value
    11:24 error invalid-value
    13:1 error missing-separator
    17:5 error second-value
    18:16 error invalid-value
    19:1 warning unknown-attribute
    21:23 warning kept-line
    22:22 warning literal-base64
    24:1 error attribute-outside-entry
    26:5 warning missing-ancestor
    28:32 error invalid-value
    30:5 warning dn-changes
    33:29 error invalid-bytes
    35:20 error invalid-dn
    39:5 warning duplicate-entry
    42:5 warning dn-changes
    46:30 error nul-byte
    47:42 error missing-final-newline
    $ places < report | wc -l
    20
    $ tail -n 1 report
    12 errors, 8 warnings

Neither the bytes nor the times of the file have changed, not even the time of the last access:

    $ ls --full-time twenty.conf > after; sha256sum twenty.conf >> after
    $ cmp before after
    $ touch -a -d 2001-02-03 twenty.conf && cfg32 check twenty.conf > /dev/null
    [1]
    $ stat --format=%x twenty.conf | cut -c 1-10
    2001-02-03

The formats for programs say the same:

    $ cat > show.py <<'END'
    > import json, sys
    > report = json.load(sys.stdin)
    > for file in report["files"]:
    >     for p in file["problems"]:
    >         print("%d:%d %s %s" % (p["line"], p["column"], p["severity"], p["rule"]))
    > END
    $ places < report > list
    $ cfg32 check --format json twenty.conf > json; echo $?
    1
    $ /usr/bin/python3 show.py < json | diff list -
    $ cfg32 check --json twenty.conf | cmp json -
    $ "$TOOLS/valid_json" check < json
    valid

    $ cat > sarif.py <<'END'
    > import json, sys
    > log = json.load(sys.stdin)
    > assert log["version"] == "2.1.0" and log["$schema"].endswith("/sarif-schema-2.1.0.json")
    > (run,) = log["runs"]
    > driver = run["tool"]["driver"]
    > assert driver["name"] == "cfg32" and driver["version"]
    > assert len({rule["id"] for rule in driver["rules"]}) == len(driver["rules"])
    > for result in run["results"]:
    >     assert driver["rules"][result["ruleIndex"]]["id"] == result["ruleId"]
    >     assert result["level"] in ("error", "warning") and result["message"]["text"]
    >     (place,) = result["locations"]
    >     place = place["physicalLocation"]
    >     assert place["artifactLocation"]["uri"] == "twenty.conf"
    >     region = place["region"]
    >     assert region["endColumn"] > region["startColumn"] >= 1
    >     print("%d:%d %s %s" % (region["startLine"], region["startColumn"], result["level"],
    >                            result["ruleId"]))
    > END
    $ cfg32 check --format sarif twenty.conf > sarif; echo $?
    1
    $ /usr/bin/python3 sarif.py < sarif | diff list -

    $ cfg32 check --format github twenty.conf > github; echo $?
    1
    $ sed -nE 's/^::(error|warning) file=twenty.conf,line=(.*),col=(.*),title=([a-z0-9-]*)::.+$/\2:\3 \1 \4/p' github |
    > diff list -

In the POSIX locale the file's other text can't be told from what is wrong, but what is printed for
programs is UTF-8 all the same:

    $ LC_ALL=C cfg32 check --json twenty.conf | iconv -f UTF-8 -t UTF-8 > /dev/null

The line is shown with its place marked, passwords hidden:

    $ printf 'version: 1\n\ndn: cn=Configuration\noru-slapdAdminPW open sesame\ncn:\tM\303\274nchen\ncn: \001\n' > shown.conf
    $ printf 'oru-slapdMasterPW: one\noru-slapdMasterPW: two\n\ndn: cn=x, cn=Configuration\ndn: cn=y,\n' >> shown.conf
    $ cfg32 check shown.conf
    shown.conf:4:1: error: no colon after the attribute's name [missing-separator]
        4 | oru-slapdAdminPW ********
          | ^~~~~~~~~~~~~~~~~~~~~~~~~
          = accepted: name: value
    shown.conf:6:5: error: another value of cn, which takes only one; the first one stands on line 5 [second-value]
        6 | cn: ?
          |     ^
          = accepted: one value
    shown.conf:8:20: error: another value of oru-slapdMasterPW, which takes only one; the first one stands on line 7 [second-value]
        8 | oru-slapdMasterPW: ********
          |                    ^~~~~~~~
          = accepted: one value
    shown.conf:11:10: error: Missing RDN attribute [invalid-dn]
       11 | dn: cn=y,
          |          ^
          = accepted: a distinguished name, such as cn=Name, cn=Configuration
    4 errors
    [1]
    $ cfg32 --color always check good.conf shown.conf | head -n 1 | cat -v
    ^[[1mshown.conf:4:1:^[[0m ^[[1m^[[31merror:^[[0m no colon after the attribute's name ^[[1m[missing-separator]^[[0m
    $ cfg32 check --format github shown.conf
    ::error file=shown.conf,line=4,col=1,title=missing-separator::no colon after the attribute's name (accepted: name: value)
    ::error file=shown.conf,line=6,col=5,title=second-value::another value of cn, which takes only one; the first one stands on line 5 (accepted: one value)
    ::error file=shown.conf,line=8,col=20,title=second-value::another value of oru-slapdMasterPW, which takes only one; the first one stands on line 7 (accepted: one value)
    ::error file=shown.conf,line=11,col=10,title=invalid-dn::Missing RDN attribute (accepted: a distinguished name, such as cn=Name, cn=Configuration)
    [1]

No password is in any format:

    $ for format in text json sarif github; do cfg32 check --format $format shown.conf; done |
    > grep -c -E 'sesame|two'
    0
    [1]

That holds of names that are mistyped, go on on the next line, or have bytes in them that a load
does not see, and of what follows them; nor does a place tell how long a password is:

    $ printf '%s\n' 'dn: cn=Configuration' 'oru-slapdAdmin_PW: sesame' 'oru-slapdAdmin PW: sesame' \
    >     'userPassword: sesame' 'oru-slapdAdminPWsesame' 'oru-slapdAdm' ' inPW: sesame' \
    >     'oru-slapdInvalidLine: oru-slapdAdm: inPW: sesame' $'\roru-slapdPeerPW sesame' \
    >     $'oru-slapdP\xffeerPW: sesame' 'oru-slapdMasterPW: {imask}>sesame' \
    >     'oru-slapdMasterPW:' ' ses' ' ame' > names.conf
    $ printf 'oru-slapdProxy\0Pw: sesame\noru-slapdProxyPw: sesame' >> names.conf
    $ for format in text json sarif github; do cfg32 check --format $format names.conf; done |
    > grep -E '\<(ses|ame)\>|sesame'
    [1]
    $ cfg32 check names.conf | tail -n 7
    names.conf:15:15: error: NUL: the rest of the line is not seen [nul-byte]
       15 | oru-slapdProxy?Pw: ********
          |               ^
    names.conf:16:19: error: last line has no newline at its end: its value is not used [missing-final-newline]
       16 | oru-slapdProxyPw: ********
          |                   ^~~~~~~~
    8 errors, 6 warnings
    $ cfg32 check --json names.conf > short
    [1]
    $ sed -i 's/sesame/open sesame/; s/ame$/amen/' names.conf
    $ cfg32 check --json names.conf | cmp short -
    $ cfg32 -f names.conf search --json 2> /dev/null | grep -E -c '\<(ses|amen)\>|sesame'
    0
    [1]

A file with the line ends of other systems is shown without them, and a byte order mark is told:

    $ printf '\357\273\277version: 1\r\n\r\ndn: cn=Configuration\r\noru-slapdPort:\r\n  70000\r\n' > other.conf
    $ cfg32 check other.conf
    other.conf:1:1: error: byte order mark, which becomes part of the first name: remove it [byte-order-mark]
        1 | ?version: 1
          | ^
          = accepted: UTF-8 without a byte order mark
    other.conf:5:3: error: Integer value out of range [invalid-value]
        5 |   70000
          |   ^~~~~
          = accepted: an integer from 1 to 65535
    2 errors
    [1]
    $ cfg32 check --json other.conf | "$TOOLS/valid_json" check
    valid

With the key, stored passwords are tried:

    $ sed '/^oru-slapdPeerPW/s/AES256}E/AES256}X/' oruslapd.conf > damaged.conf
    $ cfg32 check damaged.conf | places
    $ cfg32 check --key-file oruslapd.key damaged.conf | places
    529:18 error undecodable-password
    552:18 error undecodable-password

Several files are checked in their order; one that can't be read does not keep the others from it:

    $ cfg32 check good.conf missing.conf . shown.conf > report
    cfg32: missing.conf: No such file or directory [Connection error (91)]
    cfg32: .: Is a directory [Connection error (91)]
    [3]
    $ tail -n 1 report
    4 errors
    $ cfg32 check good.conf missing.conf --json 2> /dev/null
    {
      "files": [
        {
          "file": "good.conf",
          "problems": []
        }
      ]
    }
    [3]

A file that its writer left unfinished, and the copy of one that did not get that far:

    $ (echo '# This file is being written. If it stays so, its backup is the complete version.'
    > cat good.conf) > unfinished.conf
    $ cfg32 check unfinished.conf
    unfinished.conf:1:1: error: file was not written to its end: restore the backup, which is the complete version [unfinished-write]
        1 | # This file is being written. If it stays so, its backup is the complete version.
          | ^~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~~
    1 error
    [1]
    $ mkdir left && cp good.conf left && touch left/.cfg32-0123456789abcdef.tmp left/.cfg32-x.tmp
    $ cfg32 check left/good.conf
    left/good.conf:1:1: warning: left/.cfg32-0123456789abcdef.tmp was left by a program that was killed: unless a backup is being made now, remove it [leftover-copy]
    1 warning
    [1]

It is found as well beside the file that a symbolic link names:

    $ ln -s left/good.conf link.conf
    $ cfg32 check link.conf | sed 's/warning: .*left/warning: LEFT/'
    link.conf:1:1: warning: LEFTover-copy]
    1 warning

What can't be asked for:

    $ cfg32 check --format xml good.conf
    cfg32: --format: xml not in {text,json,sarif,github}
      hint: `cfg32 check --help` tells what there is
    [2]
    $ cfg32 check --format text --json good.conf
    cfg32: --json excludes --format
      hint: `cfg32 check --help` tells what there is
    [2]
