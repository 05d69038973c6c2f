The published schema tells what every command that prints JSON prints. Of each, a text as it is
meant is valid:

    $ while IFS=' ' read -r name text; do
    >     echo "$name: $(echo "$text" | "$TOOLS/valid_json" "$name")"
    > done <<'END'
    > search {"file": "a", "entries": [{"dn": "cn=x", "attributes": {"cn": ["x", "y"]}}], "leftOut": [{"line": 3, "text": "oops"}]}
    > get {"file": "a", "entries": [], "leftOut": []}
    > tree {"file": "a", "entries": [{"dn": "cn=x", "depth": 0, "missingAncestors": ["cn=y"]}], "leftOut": []}
    > explain {"attributes": []}
    > check {"files": [{"file": "a", "problems": [{"rule": "bad-value", "severity": "error", "line": 1, "column": 2, "width": 3, "text": "t", "entry": "", "attribute": "", "accepted": "", "result": 21, "extended": 1015, "consequence": "none"}]}]}
    > changes {"file": "a", "result": "unchanged", "dryRun": false, "skipped": []}
    > changes {"file": "a", "result": "changed", "dryRun": true, "diff": "--- a", "skipped": [{"line": 1, "dn": "cn=x", "reason": "r"}]}
    > diff {"from": "a", "to": "b", "entries": [{"dn": "cn=x", "change": "changed", "attributes": [{"name": "cn", "removed": [], "added": ["x"]}]}]}
    > END
    search: valid
    get: valid
    tree: valid
    explain: valid
    check: valid
    changes: valid
    changes: valid
    diff: valid

and one that lacks something, or has something else, is not:

    $ while IFS=' ' read -r name text; do
    >     echo "$name: $(echo "$text" | "$TOOLS/valid_json" "$name")"
    > done <<'END'
    > search {"file": "a", "entries": [{"dn": "cn=x", "attributes": {"cn": "x"}}], "leftOut": []}
    > get {"file": "a", "entries": []}
    > tree {"file": "a", "entries": [{"dn": "cn=x", "depth": -1, "missingAncestors": []}], "leftOut": []}
    > explain {"attributes": [{"name": "cn"}]}
    > schema {"attributes": []}
    > check {"files": [{"file": "a", "problems": [{"rule": "Bad", "severity": "fatal", "line": 0, "column": 2, "width": 3, "text": "t", "entry": "", "attribute": "", "accepted": "", "result": 21, "extended": 1015, "consequence": "none"}]}]}
    > changes {"file": "a", "result": "done", "dryRun": false, "skipped": []}
    > diff {"from": "a", "to": "b", "entries": [{"dn": "cn=x", "change": "changed"}]}
    > END
    search: $.entries[0].attributes.cn: 'x' is not of type 'array'
    get: $: 'leftOut' is a required property
    tree: $.entries[0].depth: -1 is less than the minimum of 0
    explain: $.attributes[0]: 'syntax' is a required property
    $.attributes[0]: 'description' is a required property
    $.attributes[0]: 'accepted' is a required property
    $.attributes[0]: 'singleValued' is a required property
    $.attributes[0]: 'example' is a required property
    schema: $.attributes: [] is too short
    check: $.files[0].problems[0].line: 0 is less than the minimum of 1
    $.files[0].problems[0].rule: 'Bad' does not match '^[a-z][a-z0-9]*(-[a-z0-9]+)*$'
    $.files[0].problems[0].severity: 'fatal' is not one of ['error', 'warning']
    changes: $.result: 'done' is not one of ['changed', 'unchanged']
    diff: $.entries[0]: 'attributes' is a required property

What is no JSON is told as well:

    $ echo '{"attributes": 1, "attributes": []}' | "$TOOLS/valid_json" explain
    not JSON: a member is there twice: ['attributes', 'attributes']
    [1]
    $ echo 'valid' | "$TOOLS/valid_json" explain
    not JSON: Expecting value: line 1 column 1 (char 0)
    [1]
