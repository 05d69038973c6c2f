#include "change/ldif_reader.h"

#include <gmock/gmock.h>

#include <string>
#include <vector>

namespace cfg32::tool {

namespace {

using testing::ElementsAre;

constexpr const char* record_names[] = {"add", "modify", "delete"};
constexpr const char* block_names[] = {"add", "delete", "replace"};

/// "kind dn@line | kind attribute@line =value@line ...", or "line: error".
std::string described(const std::variant<change_record, ldif_error>& read) {
    if (const auto* error = std::get_if<ldif_error>(&read)) {
        return std::to_string(error->line) + ": " + error->text;
    }
    const auto& record = std::get<change_record>(read);
    const auto at = [](int line) { return "@" + std::to_string(line); };
    std::string text = std::string(record_names[record.kind]) + " " + record.dn + at(record.line);
    for (const modification& change : record.modifications) {
        text += std::string(" | ") + block_names[change.kind] + " " + change.attribute +
                at(change.line);
        for (size_t i = 0; i < change.values.size(); ++i) {
            text += " =" + change.values[i] + at(change.value_lines.at(i));
        }
    }
    return text;
}

std::vector<std::string> read(const std::string& text, change_record::operation default_kind) {
    std::vector<std::string> all;
    for (const auto& each : read_ldif(text, default_kind)) {
        all.push_back(described(each));
    }
    return all;
}

struct row {
    const char* promise;
    change_record::operation default_kind;
    std::string text;
    std::vector<std::string> expected;
};

constexpr auto add = change_record::add;
constexpr auto modify = change_record::modify;
constexpr auto remove = change_record::remove;

void expect_rows(const std::vector<row>& rows) {
    for (const row& each : rows) {
        SCOPED_TRACE(each.promise);
        EXPECT_EQ(read(each.text, each.default_kind), each.expected);
    }
}

}  // namespace

TEST(ReadLdif, TakesWhatIsWellFormed) {
    expect_rows({
        {"nothing is no record", modify, "", {}},
        {"blank lines and comments are none", modify, "\n\n# x\n y\n\r\n#", {}},
        {"the version alone is none", modify, "version: 1\n\n", {}},
        {"content is added",
         add,
         "dn: cn=a\ncn: a\nx: 1\n",
         {"add cn=a@1 | add cn@2 =a@2 | add x@3 =1@3"}},
        {"values of one attribute come together",
         add,
         "dn: cn=a\nx: 1\ny: 2\nX: 3\n",
         {"add cn=a@1 | add x@2 =1@2 =3@4 | add y@3 =2@3"}},
        {"in the order of their first ones",
         add,
         "dn: cn=a\nz: 1\nY: 2\na: 3\ny: 4\nA: 5\nZ: 6\n",
         {"add cn=a@1 | add z@2 =1@2 =6@7 | add Y@3 =2@3 =4@5 | add a@4 =3@4 =5@6"}},
        {"the version may stand above the first record",
         add,
         "# c\nversion: 1\ndn: cn=a\ncn: a\n",
         {"add cn=a@3 | add cn@4 =a@4"}},
        {"or apart from it", add, "version:1\n\ndn: cn=a\ncn: a\n", {"add cn=a@3 | add cn@4 =a@4"}},
        {"a changetype, in any case",
         remove,
         "dn: cn=a\nchangetype: ADD\ncn: a\n",
         {"add cn=a@1 | add cn@3 =a@3"}},
        {"an entry without attributes, if it is said",
         modify,
         "dn: cn=a\nchangetype: add\n",
         {"add cn=a@1"}},
        {"a changed entry",
         add,
         "dn: cn=a\nchangetype: modify\nreplace: x\nx: 1\nx: 2\n-\ndelete: y\n-\nadd: z\nz: 3\n-\n",
         {"modify cn=a@1 | replace x@3 =1@4 =2@5 | delete y@7 | add z@9 =3@10"}},
        {"blocks without a changetype",
         modify,
         "dn: cn=a\nReplace: x\nX: 1\n-\n",
         {"modify cn=a@1 | replace x@2 =1@3"}},
        {"the end of the last block may be missing, if it has values",
         modify,
         "dn: cn=a\ndelete: x\nx: 1\n\ndn: cn=b\nreplace: y\ny: 2\n",
         {"modify cn=a@1 | delete x@2 =1@3", "modify cn=b@5 | replace y@6 =2@7"}},
        {"a last line without newline, if it is a comment",
         remove,
         "dn: cn=a\n# c",
         {"delete cn=a@1"}},
        {"a replacement by nothing",
         modify,
         "dn: cn=a\nreplace: x\n-\n",
         {"modify cn=a@1 | replace x@2"}},
        {"the lines above all entries",
         modify,
         "dn:\nreplace: version\nversion: 1\n",
         {"modify @1 | replace version@2 =1@3"}},
        {"a deletion", modify, "dn: cn=a\nchangetype: delete\n", {"delete cn=a@1"}},
        {"DNs alone are deleted",
         remove,
         "dn: cn=a\n\n\ndn: cn=b\n",
         {"delete cn=a@1", "delete cn=b@4"}},
        {"base64",
         add,
         "dn:: Y249YQ==\nx:: MQ==\ny::MjM=\nz::\n",
         {"add cn=a@1 | add x@2 =1@2 | add y@3 =23@3 | add z@4 =@4"}},
        {"folded lines",
         add,
         "dn: cn\n =a\nx: 1\n  2\n 3\ny:: M\n Q==\n",
         {"add cn=a@1 | add x@3 =1 23@3 | add y@6 =1@6"}},
        {"a folded name", add, "dn: cn=a\nab\n c: 1\n", {"add cn=a@1 | add abc@2 =1@2"}},
        {"comments between lines, folded as well",
         add,
         "dn: cn=a\n# x\n y: 1\nx: 1\n#\n",
         {"add cn=a@1 | add x@4 =1@4"}},
        {"lines that end as on Windows",
         add,
         "dn: cn=a\r\nx: 1\r\n 2\r\n\r\ndn: cn=b\r\nx: 1\r\n",
         {"add cn=a@1 | add x@2 =12@2", "add cn=b@5 | add x@6 =1@6"}},
        {"blanks before a value are none of it, those behind it are",
         add,
         "dn: cn=a\nx:   1 : 2 \n",
         {"add cn=a@1 | add x@2 =1 : 2 @2"}},
        {"an empty value", add, "dn: cn=a\nx:\ny: \n", {"add cn=a@1 | add x@2 =@2 | add y@3 =@3"}},
        {"text that is not ASCII",
         add,
         "dn: cn=J\xc3\xb6rg\nx: \xc3\x9f\n",
         {"add cn=J\xc3\xb6rg@1 | add x@2 =\xc3\x9f@2"}},
    });
}

TEST(ReadLdif, SaysWhatIsWrongAndWhere) {
    const std::string blocks = "dn: cn=a\nchangetype: modify\n";
    expect_rows({
        {"no dn", add, "\ncn: a\n", {"2: a record begins with \"dn:\""}},
        {"no colon", add, "dn: cn=a\ncn: a\noops\n", {"3: a line without a colon"}},
        {"no colon in the DN line", add, "dn\n", {"1: a line without a colon"}},
        {"no name", add, "dn: cn=a\n: a\n", {"2: an attribute's name is missing"}},
        {"no name of a block", modify, blocks + "add:\n", {"3: an attribute's name is missing"}},
        {"a name with a blank",
         modify,
         blocks + "add: x y\n",
         {"3: \"x ...\" is not an attribute's name"}},
        {"a name without letters",
         modify,
         blocks + "add: ;\n;: 1\n",
         {"3: \";\" is not an attribute's name"}},
        {"a second DN in content",
         add,
         "dn: cn=a\ncn: a\ndn: cn=b\ncn: b\n",
         {"3: a second \"dn:\": a blank line is missing above it"}},
        {"a second DN behind a block",
         modify,
         blocks + "add: x\nx: 1\n-\ndn: cn=b\n",
         {"6: a second \"dn:\": a blank line is missing above it"}},
        {"a second DN in a block",
         modify,
         blocks + "add: x\nx: 1\ndn: cn=b\n",
         {"5: a second \"dn:\": a blank line is missing above it"}},
        {"a fold that was cut off",
         modify,
         blocks + "add: x\nx: 1\n ",
         {"5: the last line has no newline at its end, as if it were cut off"}},
        {"a tab is no fold", add, "dn: cn=a\n\tx: 1\n", {"2: \"\tx\" is not an attribute's name"}},
        {"a continuation of nothing",
         add,
         " x\n",
         {"1: a line that begins with a blank, and none before it that it could continue"}},
        {"a continuation below a blank line",
         add,
         "dn: cn=a\ncn: a\n\n x\n",
         {"add cn=a@1 | add cn@2 =a@2",
          "4: a line that begins with a blank, and none before it that it could continue"}},
        {"another version",
         add,
         "version: 2\ndn: cn=a\ncn: a\n",
         {"1: only version 1 of LDIF is supported"}},
        {"a version further below",
         add,
         "dn: cn=a\ncn: a\n\nversion: 1\ndn: cn=b\ncn: b\n",
         {"add cn=a@1 | add cn@2 =a@2", "4: a record begins with \"dn:\""}},
        {"an unknown changetype",
         add,
         "dn: cn=a\nchangetype: replace\n",
         {"2: \"replace\" is no changetype: add, modify and delete are"}},
        {"a misplaced changetype",
         add,
         "dn: cn=a\ncn: a\nchangetype: add\n",
         {"3: \"changetype:\" stands only right below \"dn:\""}},
        {"renaming",
         modify,
         "dn: cn=a\nchangetype: modrdn\nnewrdn: cn=b\n",
         {"2: changetype modrdn is not supported"}},
        {"moving",
         modify,
         "dn: cn=a\nchangetype: ModDN\n",
         {"2: changetype moddn is not supported"}},
        {"controls",
         modify,
         "dn: cn=a\ncontrol: 1.2.3 true\nchangetype: delete\n",
         {"2: \"control:\" is not supported"}},
        {"URLs",
         add,
         "dn: cn=a\nx:< file:///etc/passwd\n",
         {"2: values from URLs (\":<\") are not supported"}},
        {"a value outside of a block",
         modify,
         blocks + "x: 1\n",
         {"3: a value outside of a block: \"add:\", \"replace:\" or \"delete:\" begins one"}},
        {"a value behind a block's end",
         modify,
         blocks + "add: x\nx: 1\n-\nx: 2\n",
         {"6: a value outside of a block: \"add:\", \"replace:\" or \"delete:\" begins one"}},
        {"a mistyped block",
         modify,
         blocks + "repalce: x\nx: 1\n-\n",
         {"3: a value outside of a block: \"add:\", \"replace:\" or \"delete:\" begins one"}},
        {"an end without a block", modify, blocks + "-\n", {"3: a line without a colon"}},
        {"another attribute in a block",
         modify,
         blocks + "add: x\ny: 1\n-\n",
         {"4: \"y\" in the block of x, which a line \"-\" ends"}},
        {"a block that is not ended",
         modify,
         blocks + "add: x\nx: 1\nadd: y\ny: 1\n",
         {"5: \"add\" in the block of x, which a line \"-\" ends"}},
        {"text behind the end of a block",
         modify,
         blocks + "delete: x\n- \n",
         {"4: text after the \"-\" that ends a block"}},
        {"an addition of nothing", modify, blocks + "add: x\n-\n", {"3: no values to add"}},
        {"a replacement by nothing that may be cut off",
         modify,
         blocks + "replace: x\n",
         {"3: a block without values needs the line \"-\" that ends it"}},
        {"a last line that may be cut off",
         add,
         "dn: cn=a\ncn: a",
         {"2: the last line has no newline at its end, as if it were cut off"}},
        {"a modification of nothing", modify, blocks, {"1: a modification without changes"}},
        {"a DN alone is no modification",
         modify,
         "dn: cn=a\n",
         {"1: a modification without changes"}},
        {"a DN alone is no entry",
         add,
         "dn: cn=a\n",
         {"1: an entry without content needs \"changetype: add\""}},
        {"content is no modification",
         modify,
         "dn: cn=a\ncn: a\n",
         {"2: the content of an entry is for `cfg32 add`, or needs \"changetype: add\" below "
          "\"dn:\""}},
        {"a modification is no content",
         add,
         "dn: cn=a\nreplace: x\nx: 1\n",
         {"2: \"replace:\" needs \"changetype: modify\" below \"dn:\""}},
        {"content of a deletion",
         remove,
         "dn: cn=a\ncn: a\n",
         {"2: nothing may follow in a record that deletes"}},
        {"an added entry without name",
         add,
         "dn:\ncn: a\n",
         {"1: an empty DN, which stands for the lines above all entries: they can only be "
          "modified"}},
        {"a deleted entry without name",
         remove,
         "dn:\n",
         {"1: an empty DN, which stands for the lines above all entries: they can only be "
          "modified"}},
        {"a NUL",
         add,
         std::string("dn: cn=a\nx: 1\0002\n", 16),
         {"2: a value may not hold a NUL byte"}},
        {"a NUL in base64", add, "dn: cn=a\nx:: MQAy\n", {"2: a value may not hold a NUL byte"}},
        {"a line feed", add, "dn: cn=a\nx:: MQoy\n", {"2: a value may not hold a line feed"}},
        {"a carriage return",
         add,
         "dn: cn=a\nx: 1\r2\n",
         {"2: a value may not hold a carriage return"}},
        {"a line feed in the DN",
         remove,
         "dn:: Y249YQo=\n",
         {"1: a value may not hold a line feed"}},
    });
}

TEST(ReadLdif, DecodesBase64Strictly) {
    for (const char* bad : {"MQ", "MQ=", "MQ===", "M", "MR==", "M Q==", "MQ== ", "MQ==MQ==", "M-Q=",
                            "M_==", "====", "MQ==x", "\xc3\xb6"}) {
        SCOPED_TRACE(bad);
        EXPECT_THAT(read(std::string("dn: cn=a\nx:: ") + bad + "\n", add),
                    ElementsAre("2: not valid base64"));
    }
}

TEST(ReadLdif, GoesOnAtTheNextBlankLine) {
    EXPECT_THAT(
        read("dn: cn=a\noops\nalso oops\n\ndn: cn=b\ndelete: x\n-\n\n\nnor this\n\ndn: cn=c\n"
             "delete: y\n-\n",
             modify),
        ElementsAre("2: a line without a colon", "modify cn=b@5 | delete x@6",
                    "10: a line without a colon", "modify cn=c@12 | delete y@13"));
}

}  // namespace cfg32::tool
