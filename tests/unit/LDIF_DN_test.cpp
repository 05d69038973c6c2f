#include "LDIF_DN.h"

#include <gtest/gtest.h>

#include <memory>
#include <random>
#include <set>
#include <sstream>
#include <string>
#include <vector>

#include "failing_new.h"
#include "failures.h"
#include "utf8_locale.h"

using namespace cfg32::tests;

namespace {

const char* const source_file = "src/libraries/cfg32stl/LDIF_DN";

/// What a DN stores, root first: "O=[Lab]plain / CN=[Print Server]plain".
std::string stored(const LDIF_RDN& rdn) {
    const char* const forms[] = {"hex", "quoted", "plain"};
    std::string text;
    for (const LDIF_RDN_pair& pair : rdn.pairs()) {
        text += (text.empty() ? "" : " & ") + pair.attribute.text() + "=[" + pair.value.text() +
                "]" + forms[pair.value.form];
    }
    return text;
}

std::string stored(const LDIF_DN& dn) {
    std::string text;
    for (const LDIF_RDN& rdn : dn.rdns()) {
        text += (text.empty() ? "" : " / ") + stored(rdn);
    }
    return text;
}

LDIF_DN dn(const std::string& text) { return LDIF_DN(cisString(text)); }

int sign(int number) { return (number > 0) - (number < 0); }

int depth(const LDIF_Exception& e) { return e.cause ? 1 + depth(*e.cause) : 1; }

void expect_positions(const LDIF_Exception& e) {
    for (const LDIF_Exception* level = &e; level; level = level->cause.get()) {
        EXPECT_EQ(level->srcFile, source_file);
        EXPECT_GT(level->srcLine, 0);
    }
}

}  // namespace

TEST(LDIF_DN, FormsHaveTheirNumbers) {
    EXPECT_EQ(LDIF_RDN_value::hex, 0);
    EXPECT_EQ(LDIF_RDN_value::quoted, 1);
    EXPECT_EQ(LDIF_RDN_value::plain, 2);
}

TEST(LDIF_DN, ParsesTheGrammarAndPrintsTheCanonicalForm) {
    const struct {
        const char* text;
        const char* canonical;
        const char* parts;
    } rows[] = {
        {"", "", ""},
        {" \t ", "", ""},
        {"CN=Print Server,O=Lab", "CN=Print Server, O=Lab",
         "O=[Lab]plain / CN=[Print Server]plain"},
        {"cn=a;o=b", "cn=a, o=b", "o=[b]plain / cn=[a]plain"},
        {"cn=a, o=b", "cn=a, o=b", "o=[b]plain / cn=[a]plain"},
        {"  cn=a;\t o=b", "cn=a, o=b", "o=[b]plain / cn=[a]plain"},
        {"cn=a,ou=b;o=c", "cn=a, ou=b, o=c", "o=[c]plain / ou=[b]plain / cn=[a]plain"},
        // several pairs
        {"cn=b+sn=a", "cn=b + sn=a", "cn=[b]plain & sn=[a]plain"},
        {"sn=a+cn=b", "cn=b + sn=a", "cn=[b]plain & sn=[a]plain"},
        {"sn=a+ \tcn=b", "cn=b + sn=a", "cn=[b]plain & sn=[a]plain"},
        {"cn=a+CN=A", "cn=a", "cn=[a]plain"},
        {"cn=c+cn=B+cn=a", "cn=a + cn=B + cn=c", "cn=[a]plain & cn=[B]plain & cn=[c]plain"},
        // attributes
        {"oid.2.5.4.3=x", "2.5.4.3=x", "2.5.4.3=[x]plain"},
        {"OID.2.5.4.3=x", "2.5.4.3=x", "2.5.4.3=[x]plain"},
        {"2.5.4.3=x", "2.5.4.3=x", "2.5.4.3=[x]plain"},
        {"oid=x", "oid=x", "oid=[x]plain"},
        {"a-b-9=x", "a-b-9=x", "a-b-9=[x]plain"},
        {"cn =x", "cn=x", "cn=[x]plain"},
        {"cn= x", "cn=x", "cn=[x]plain"},
        // hexadecimal values
        {"cn=#414243", "cn=#414243", "cn=[ABC]hex"},
        {"cn=#4a4B", "cn=#4A4B", "cn=[JK]hex"},
        {"cn=#41 \t,o=x", "cn=#41, o=x", "o=[x]plain / cn=[A]hex"},
        // quoted values
        {"cn=\"a,b\"", "cn=\"a,b\"", "cn=[a,b]quoted"},
        {"cn=\"a+b;c=d\" ,o=x", "cn=\"a+b;c=d\", o=x", "o=[x]plain / cn=[a+b;c=d]quoted"},
        {"cn=\"a=b", "cn=\"a=b\"", "cn=[a=b]quoted"},
        {"cn=\"a\\\"b\\\\c\"", "cn=\"a\\\"b\\\\c\"", "cn=[a\"b\\c]quoted"},
        {"cn=\"a\\2Cb\"", "cn=\"a,b\"", "cn=[a,b]quoted"},
        {"cn=\"\\ a  \"", "cn=\" a  \"", "cn=[ a  ]quoted"},
        {"cn=\"#a\"", "cn=\"#a\"", "cn=[#a]quoted"},
        // plain values
        {"cn=a\\,b", "cn=a\\,b", "cn=[a,b]plain"},
        {"cn=a\\2Cb", "cn=a\\,b", "cn=[a,b]plain"},
        {"cn=a\\2cb", "cn=a\\,b", "cn=[a,b]plain"},
        {"cn=\\,\\=\\+\\<\\>\\#\\;\\\\\\\"", "cn=\\,\\=\\+\\<\\>\\#\\;\\\\\\\"",
         "cn=[,=+<>#;\\\"]plain"},
        {"cn=\\ a", "cn=\\20a", "cn=[ a]plain"},
        {"cn=\\20\\09a", "cn=\\20\\09a", "cn=[ \ta]plain"},
        {"cn=a\\ b", "cn=a b", "cn=[a b]plain"},
        {"cn=a \t b", "cn=a \t b", "cn=[a \t b]plain"},
        {"cn=a\tb\\0A", "cn=a\tb\\0A", "cn=[a\tb\n]plain"},
        {"cn=\\20", "cn=\\20", "cn=[ ]plain"},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.text);
        const LDIF_DN parsed = dn(row.text);
        EXPECT_EQ(parsed.str(), row.canonical);
        EXPECT_EQ(stored(parsed), row.parts);
    }
}

// The oddity of plain values that end with unescaped spaces.
TEST(LDIF_DN, TrailingSpacesCutTheCharacterBeforeThemAndKeepOneSpace) {
    const struct {
        const char* text;
        const char* value;
        const char* canonical;
    } rows[] = {
        {"cn=ab ,o=x", "a ", "cn=a\\20, o=x"},
        {"cn=ab  ,o=x", "a ", "cn=a\\20, o=x"},
        {"cn=ab    ", "a ", "cn=a\\20"},
        {"cn=ab +sn=c", "a ", "cn=a\\20 + sn=c"},
        {"cn=b + sn=a", " ", "cn=\\20 + sn=a"},  // what a DN of several pairs prints
        {"cn=a ", " ", "cn=\\20"},
        {"cn=a b ", "a  ", "cn=a\\20\\20"},
        {"cn=ab\\ ", "ab ", "cn=ab\\20"},
        {"cn=ab\\20", "ab ", "cn=ab\\20"},
        {"cn=ab\\  ", "ab ", "cn=ab\\20"},
        {"cn=ab\t", "ab\t", "cn=ab\\09"},
        {"cn=ab \t", "ab \t", "cn=ab\\20\\09"},
        {"cn=ab\t ", "ab ", "cn=ab\\20"},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.text);
        const LDIF_DN parsed = dn(row.text);
        EXPECT_EQ(parsed.rdns().back().pairs().front().value.text(), row.value);
        EXPECT_EQ(parsed.str(), row.canonical);
    }
}

TEST(LDIF_DN, TrailingSpacesCutAWholeMultibyteCharacter) {
    REQUIRE_UTF8();
    EXPECT_EQ(dn("cn=a\u00e9 ").str(), "cn=a\\20");
    EXPECT_EQ(dn("cn=a\\C3\\A9  ").str(), "cn=a\\20");
    EXPECT_EQ(dn("cn=\u20ac ,o=x").str(), "cn=\\20, o=x");
}

TEST(LDIF_DN, AnEmptyValueParsesButDoesNotPrint) {
    const struct {
        const char* text;
        const char* parts;
    } rows[] = {
        {"cn=", "cn=[]quoted"},
        {"cn=  ", "cn=[]quoted"},
        {"cn=\"\"", "cn=[]quoted"},
        {"cn=#", "cn=[]hex"},
        {"cn=#,o=x", "o=[x]plain / cn=[]hex"},
        {"cn=+sn=a", "cn=[]plain & sn=[a]plain"},
        {"cn=,o=x", "o=[x]plain / cn=[]plain"},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.text);
        const LDIF_DN parsed = dn(row.text);
        EXPECT_EQ(stored(parsed), row.parts);
        const LDIF_Exception e = failure_of([&] { parsed.str(); });
        EXPECT_EQ(summary(e), "34/1013 Missing RDN attribute value");
        EXPECT_EQ(e.srcFile, source_file);
    }
}

TEST(LDIF_DN, RefusesWhatBreaksTheGrammar) {
    const std::string in_attribute = "34/1012 Invalid character in RDN attribute: ";
    const std::string attribute_syntax = "34/1012 Invalid attribute sytax: ";
    const std::string in_value = "34/1014 Invalid character in RDN value: ";
    const std::string escape = "34/1014 Invalid escape sequence: ";
    const struct {
        const char* text;
        std::string summary;
        int depth;  // the throw, and a step for each of value, pair, RDN and DN around it
    } rows[] = {
        {"cn=a,", "34/1011 Missing RDN attribute", 3},
        {"cn=a; ", "34/1011 Missing RDN attribute", 3},
        {"cn=a+", "34/1011 Missing RDN attribute", 4},
        {"=x", attribute_syntax, 4},
        {"-cn=x", attribute_syntax + "-cn", 4},
        {",cn=a", attribute_syntax + ",cn", 4},
        {"cn=a,,o=b", attribute_syntax + ",o", 4},
        {"_cn", attribute_syntax + "_cn", 4},
        {"_2345678901234567890", attribute_syntax + "_2345678901234567890", 4},
        {"_23456789012345678901", attribute_syntax + "_2345678901234567890", 4},
        {"_2345678901234567890123=x", attribute_syntax + "_2345678901234567890123", 4},
        {"cn", "34/1013 Missing RDN value: cn", 4},
        {"cn \t", "34/1013 Missing RDN value: cn", 4},
        {"oid.2.5", "34/1013 Missing RDN value: 2.5", 4},
        {"Oid.2.5.4.3=x", in_attribute + ".", 4},
        {"oid.cn=x", in_attribute + ".", 4},
        {"oid.", in_attribute + ".", 4},
        {"cn x=1", in_attribute + "x", 4},
        {"c_n=1", in_attribute + "_", 4},
        {"2.5a=x", in_attribute + "a", 4},
        {"cn,o=x", in_attribute + ",", 4},
        {"cn=a=b", in_value + "=", 3},
        {"cn=a<b", in_value + "<", 3},
        {"cn=a>b", in_value + ">", 3},
        {"cn=a#b", in_value + "#", 3},
        {"cn=a\"b", in_value + "\"", 3},
        {"cn=\"a\"x", in_value + "x", 3},
        {"cn=#41zz", in_value + "z", 3},
        {"cn=#414", in_value + "4", 3},
        {"cn=#41 42", in_value + "4", 3},
        {"cn=a\\q", escape + "\\q", 5},
        {"cn=a\\qrst", escape + "\\qr", 5},
        {"cn=a\\4", escape + "\\4", 5},
        {"cn=a\\4g", escape + "\\4g", 5},
        {"cn=a\\", escape + "\\", 5},
        {"cn=\"a\\q", escape + "\\q", 5},
        {"cn=\"a\\q\"", escape + "\\q\"", 5},
        {"cn=\"a\\", escape + "\\", 5},
        {"cn=b,o=a\\q", escape + "\\q", 5},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.text);
        const LDIF_Exception e = failure_of([&] { dn(row.text); });
        EXPECT_EQ(summary(e), row.summary);
        EXPECT_EQ(depth(e), row.depth);
        EXPECT_EQ(e.value, row.text);
        EXPECT_EQ(summary(first_cause(e)), row.summary);
        expect_positions(e);
    }
}

TEST(LDIF_DN, ReportsWholeCharactersOfAnInvalidEscape) {
    REQUIRE_UTF8();
    EXPECT_EQ(failure_of([] { dn("cn=a\\\u00e9\u00e8\u00ea"); }).msg,
              "Invalid escape sequence: \\\u00e9\u00e8");
    EXPECT_EQ(failure_of([] { dn("\u00e9n=x"); }).msg, "Invalid attribute sytax: \u00e9n");
    EXPECT_EQ(failure_of([] { dn("cn=#\u00e9"); }).msg, "Invalid character in RDN value: \u00e9");
}

TEST(LDIF_DN, TextThatIsInvalidInTheLocaleIsRefusedWithItsText) {
    REQUIRE_UTF8();
    const LDIF_Exception e = failure_of([] { dn("cn=a\xff"); });
    EXPECT_EQ(e.ldapErr, 162);
    EXPECT_EQ(e.extErr, 162);
    EXPECT_EQ(e.value, "cn=a\xff");
}

TEST(LDIF_DN, ExhaustedMemoryIsTheSystemErrorOfTheLevelItHappensAt) {
    const std::string attribute(100, 'a');
    const cisString text(attribute + "=" + std::string(100, 'v') + "+b=\"" + std::string(100, 'w') +
                         "\"," + attribute + "=#" + std::string(100, '4'));
    std::set<std::string> levels;
    for (long which = 0;; ++which) {
        LDIF_DN parsed;
        std::unique_ptr<LDIF_Exception> failure;
        failing_allocation failing(which);
        try {
            parsed = text;
        } catch (const LDIF_Exception& e) {
            failure = std::make_unique<LDIF_Exception>(e);
        }
        if (!failing.happened()) {
            break;
        }
        if (failure) {  // a sort does without its buffer
            EXPECT_EQ(failure->ldapErr, 80);
            EXPECT_EQ(failure->extErr, 1000);
            EXPECT_EQ(failure->value, text.text());
            expect_positions(*failure);
            levels.insert(failure->msg.substr(0, failure->msg.find(':')));
        }
    }
    EXPECT_EQ(levels,
              (std::set<std::string>{"System error parsing rdn value", "System error parsing rdn",
                                     "System error parsing dn"}));
}

TEST(LDIF_DN, APairWithoutAttributeIsRefused) {
    const LDIF_Exception e = failure_of([] {
        LDIF_RDN_pair(LDIF_RDN_attribute(std::string()),
                      LDIF_RDN_value(std::string("x,y"), LDIF_RDN_value::plain));
    });
    EXPECT_EQ(summary(e), "34/1011 Missing RDN attribute: <NULL>=x\\,y");
}

TEST(LDIF_DN, ParsingConstructorsConsumeWhatTheyParse) {
    const auto rest_of = [](const char* text, auto parse) {
        cisString rest(text);
        return parse(rest) + " | " + rest.text();
    };
    const auto attribute = [](cisString& s) { return LDIF_RDN_attribute(s).str(); };
    const auto value = [](cisString& s) { return LDIF_RDN_value(s).str(); };
    const auto pair = [](cisString& s) { return LDIF_RDN_pair(s).str(); };
    const auto rdn = [](cisString& s) { return LDIF_RDN(s).str(); };
    EXPECT_EQ(rest_of("oid.1.2 \t=x", attribute), "1.2 | =x");
    EXPECT_EQ(rest_of("cn", attribute), "cn | ");
    EXPECT_EQ(rest_of("ab,  o=x", value), "ab | ,  o=x");
    EXPECT_EQ(rest_of("\"ab\"   x", value), "\"ab\" | x");
    EXPECT_EQ(rest_of("#4142 zz", value), "#4142 | zz");
    EXPECT_EQ(rest_of("cn= a+ b=c", pair), "cn=a | + b=c");
    EXPECT_EQ(rest_of("sn=b+cn=a; o=x", rdn), "cn=a + sn=b | ; o=x");
}

TEST(LDIF_DN, AnInvalidEscapeIsGivenBackToTheCaller) {
    for (const char* text : {"ab\\qrs", "\"ab\\qrs"}) {
        cisString rest(text);
        const LDIF_Exception e = failure_of([&] { LDIF_RDN_value value(rest); });
        EXPECT_EQ(summary(e), "34/1014 Invalid escape sequence: \\qr");
        EXPECT_EQ(depth(e), 2);
        EXPECT_EQ(rest.text(), "\\qrs");
    }
}

TEST(LDIF_DN, EmptyTextHasNoAttributeButAnEmptyValue) {
    cisString empty;
    const std::string missing = "34/1011 Missing RDN attribute";
    EXPECT_EQ(summary(failure_of([&] { LDIF_RDN_attribute part(empty); })), missing);
    EXPECT_EQ(summary(failure_of([&] { LDIF_RDN_pair part(empty); })), missing);
    EXPECT_EQ(summary(failure_of([&] { LDIF_RDN part(empty); })), missing);
    const LDIF_RDN_value value(empty);
    EXPECT_EQ(value.text(), "");
    EXPECT_EQ(value.form, 1);
}

TEST(LDIF_DN, AssignmentPutsTheParsedRdnsOnTheRootSide) {
    LDIF_DN parsed = dn("cn=a, ou=b");
    parsed = cisString("o=c, c=d");
    EXPECT_EQ(parsed.str(), "cn=a, ou=b, o=c, c=d");
    parsed = cisString("  ");
    EXPECT_EQ(parsed.str(), "cn=a, ou=b, o=c, c=d");
}

TEST(LDIF_DN, AFailedParseLeavesTheRdnsBeforeTheFailure) {
    LDIF_DN parsed = dn("uid=u");
    EXPECT_THROW(parsed = cisString("cn=a,o=b,=x"), LDIF_Exception);
    EXPECT_EQ(parsed.str(), "uid=u, cn=a, o=b");
}

TEST(LDIF_DN, AddingAnRdnAppendsItOnTheLeafSide) {
    LDIF_DN parsed = dn("cn=a");
    cisString text("uid=u");
    parsed += LDIF_RDN(text);
    EXPECT_EQ(parsed.str(), "uid=u, cn=a");
}

TEST(LDIF_DN, AddingAPairKeepsThePairsSortedAndUnique) {
    LDIF_RDN rdn;
    for (const char* text : {"sn=c", "cn=b", "SN=C", "cn=a", "CN=B", "sn=d", "cn=a"}) {
        cisString rest(text);
        rdn += LDIF_RDN_pair(rest);
    }
    EXPECT_EQ(stored(rdn), "cn=[a]plain & cn=[b]plain & sn=[c]plain & sn=[d]plain");
}

TEST(LDIF_DN, StreamsWriteTheCanonicalForm) {
    const LDIF_DN parsed = dn("sn=b+cn=a;o=x");
    std::ostringstream out;
    out << parsed << '|' << parsed.rdns()[1] << '|' << parsed.rdns()[1].pairs()[0];
    EXPECT_EQ(out.str(), "cn=a + sn=b, o=x|cn=a + sn=b|cn=a");
}

TEST(LDIF_DN, OrdersFromTheRootAndAncestorsAfterTheirDescendants) {
    const struct {
        const char* left;
        const char* right;
        int order;
    } rows[] = {
        {"o=b", "cn=a, o=b", 1},
        {"cn=a, o=b", "o=b", -1},
        {"", "o=b", 1},
        {"", "", 0},
        {"o=b", "o=b", 0},
        {"CN=A,O=B", "cn=a, o=b", 0},
        {"cn=\"a\"", "cn=a", 0},
        {"cn=#61", "cn=A", 0},
        {"cn=a", "cn=b", -1},
        {"cn=z", "sn=a", -1},
        {"cn=z, o=a", "cn=a, o=b", -1},
        {"cn=a", "cn=a+sn=b", 1},
        {"cn=a+sn=b", "sn=B+CN=A", 0},
        {"cn=b, o=b", "uid=u, cn=a, o=b", 1},
        {"cn=a", "oid.2.5.4.3=a", 1},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(std::string(row.left) + " and " + row.right);
        const LDIF_DN left = dn(row.left);
        const LDIF_DN right = dn(row.right);
        EXPECT_EQ(sign(left.compare(right)), row.order);
        EXPECT_EQ(sign(right.compare(left)), -row.order);
        EXPECT_EQ(left == right, row.order == 0);
        EXPECT_EQ(left != right, row.order != 0);
        EXPECT_EQ(left < right, row.order < 0);
        EXPECT_EQ(left > right, row.order > 0);
        EXPECT_EQ(left <= right, row.order <= 0);
        EXPECT_EQ(left >= right, row.order >= 0);
    }
    EXPECT_EQ(dn("o=b").compare(dn("cn=a, o=b")), 1);
    EXPECT_EQ(dn("cn=a, o=b").compare(dn("o=b")), -1);
}

TEST(LDIF_DN, RdnsAndPairsHaveTheSixRelations) {
    const auto relations = [](const auto& l, const auto& r) {
        return std::string(l == r ? "==" : "") + (l < r ? "<" : "") + (l > r ? ">" : "") +
               (l != r ? "!=" : "") + (l <= r ? "<=" : "") + (l >= r ? ">=" : "");
    };
    const LDIF_DN a = dn("CN=a+sn=b");
    const LDIF_DN same = dn("cn=A+sn=B");
    const LDIF_DN beginning = dn("cn=a");
    EXPECT_EQ(relations(a.rdns()[0], same.rdns()[0]), "==<=>=");
    EXPECT_EQ(relations(a.rdns()[0], beginning.rdns()[0]), "<!=<=");
    EXPECT_EQ(relations(beginning.rdns()[0], a.rdns()[0]), ">!=>=");
    const auto& pairs = a.rdns()[0].pairs();
    EXPECT_EQ(relations(pairs[0], same.rdns()[0].pairs()[0]), "==<=>=");
    EXPECT_EQ(relations(pairs[0], pairs[1]), "<!=<=");
    EXPECT_EQ(relations(pairs[1], pairs[0]), ">!=>=");
}

TEST(LDIF_DN, CommonAncestorsAndRelativeNames) {
    const struct {
        const char* left;
        const char* right;
        const char* common;
        const char* relative;
    } rows[] = {
        {"cn=a, o=b", "cn=c, o=b", "o=b", "cn=a"},
        {"cn=a, o=b", "o=b", "o=b", "cn=a"},
        {"o=b", "cn=a, o=b", "o=b", ""},
        {"cn=a, o=b", "o=x", "", "cn=a, o=b"},
        {"cn=a, o=b", "cn=a, o=x", "", "cn=a, o=b"},
        {"cn=a, o=b", "CN=A, O=B", "cn=a, o=b", ""},
        {"CN=A, OU=B, O=C", "uid=u, ou=b, o=c", "OU=B, O=C", "CN=A"},
        {"cn=a+sn=b, o=c", "cn=a, o=c", "o=c", "cn=a + sn=b"},
        {"", "o=b", "", ""},
        {"o=b", "", "", "o=b"},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(std::string(row.left) + " and " + row.right);
        LDIF_DN left = dn(row.left);
        EXPECT_EQ(left.intersection(dn(row.right)).str(), row.common);
        EXPECT_EQ((left -= dn(row.right)).str(), row.relative);
    }
    LDIF_DN self = dn("cn=a, o=b");
    EXPECT_EQ(self.intersection(self).str(), "cn=a, o=b");
    EXPECT_TRUE((self -= self).empty());
}

TEST(LDIF_DN, AZeroByteIsPrintedInHexadecimalSoThatItReadsBack) {
    for (const std::string text : {"cn=\\00", "cn=\\00b", "cn=a\\00b, o=c", "cn=a\\00, o=c",
                                   "cn=\"\\00b\"", "cn=\"a,\\00b\", o=c", "cn=#0061"}) {
        SCOPED_TRACE(text);
        const LDIF_DN parsed = dn(text);
        EXPECT_EQ(parsed.str(), text);
        EXPECT_EQ(stored(dn(parsed.str())), stored(parsed));
    }
}

TEST(LDIF_DN, BytesThatAreNoCharacterArePrintedInHexadecimal) {
    REQUIRE_UTF8();
    EXPECT_EQ(dn("cn=a\\ffb").str(), "cn=a\\FFb");
    EXPECT_EQ(dn("cn=\"a\\c3b\"").str(), "cn=\"a\\C3b\"");
    EXPECT_EQ(dn("cn=\\C3\\A9").str(), "cn=\u00e9");
}

// --- properties -----------------------------------------------------------------------------

namespace {

class random_names {
  public:
    explicit random_names(unsigned seed) : engine_(seed) {}

    size_t below(size_t limit) {
        return std::uniform_int_distribution<size_t>(0, limit - 1)(engine_);
    }

    std::string text(const std::vector<std::string>& parts, size_t longest) {
        std::string result;
        for (size_t n = below(longest + 1); n > 0; --n) {
            result += parts[below(parts.size())];
        }
        return result;
    }

    LDIF_RDN rdn(size_t most_pairs) {
        static const std::vector<std::string> parts = {
            "a", "B", "b",  " ",  "  ", "\t",       "\n",           ",",    "=",    "+",   "<", ">",
            "#", ";", "\\", "\"", "4",  "\xc3\xa9", "\xe3\x80\x80", "\xff", "\x7f", "\x01"};
        LDIF_RDN result;
        for (size_t n = 1 + below(most_pairs); n > 0; --n) {
            const char* const names[] = {"cn", "CN", "sn", "2.5.4"};
            result += LDIF_RDN_pair(LDIF_RDN_attribute(std::string(names[below(4)])),
                                    LDIF_RDN_value(text(parts, 4) + parts[below(parts.size())],
                                                   static_cast<LDIF_RDN_value::Form>(below(3))));
        }
        return result;
    }

    LDIF_DN dn(size_t most_pairs) {
        LDIF_DN result;
        for (size_t n = below(4); n > 0; --n) {
            result += rdn(most_pairs);
        }
        return result;
    }

    /// A DN from few different RDNs, so that equal beginnings are frequent.
    LDIF_DN near_dn() {
        const char* const steps[] = {"o=a", "O=A", "o=b", "cn=a+o=b", "o=B+CN=A"};
        LDIF_DN result;
        for (size_t n = below(5); n > 0; --n) {
            cisString step(steps[below(5)]);
            result += LDIF_RDN(step);
        }
        return result;
    }

  private:
    std::mt19937 engine_;
};

}  // namespace

TEST(LDIF_DN, APrintedDnOfSinglePairsParsesToAnEqualDn) {
    random_names random(20);
    for (int i = 0; i < 3000; ++i) {
        const LDIF_DN made = random.dn(1);
        const std::string printed = made.str();
        LDIF_DN parsed;
        ASSERT_NO_THROW(parsed = cisString(printed)) << printed;
        ASSERT_EQ(stored(parsed), stored(made)) << printed;
        ASSERT_TRUE(parsed == made) << printed;
        ASSERT_EQ(parsed.str(), printed);
    }
}

TEST(LDIF_DN, TheOrderIsAStrictWeakOrderThatTheHashAgreesWith) {
    random_names random(21);
    for (int i = 0; i < 3000; ++i) {
        const bool near = i % 2 == 0;
        const LDIF_DN a = near ? random.near_dn() : random.dn(2);
        const LDIF_DN b = near ? random.near_dn() : random.dn(2);
        const LDIF_DN c = near ? random.near_dn() : random.dn(2);
        ASSERT_EQ(a.compare(a), 0);
        ASSERT_EQ(sign(a.compare(b)), -sign(b.compare(a)));
        ASSERT_FALSE(a < b && b < c && !(a < c));
        ASSERT_FALSE(a == b && b == c && a != c);
        ASSERT_FALSE(a == b && a.hash() != b.hash());
    }
}

TEST(LDIF_DN, IntersectionAndSubtractionAgree) {
    random_names random(22);
    for (int i = 0; i < 3000; ++i) {
        const LDIF_DN a = random.near_dn();
        const LDIF_DN b = random.near_dn();
        const LDIF_DN common = a.intersection(b);
        LDIF_DN relative = a;
        relative -= b;
        ASSERT_TRUE(common == b.intersection(a));
        LDIF_DN whole = common;
        for (const LDIF_RDN& rdn : relative.rdns()) {
            whole += rdn;
        }
        ASSERT_EQ(stored(whole), stored(a));
        LDIF_DN other = b;
        other -= a;
        ASSERT_TRUE(relative.empty() || other.empty() ||
                    relative.rdns().front() != other.rdns().front());
    }
}

TEST(LDIF_DN, AnyTextIsParsedOrRefused) {
    random_names random(23);
    const std::vector<std::string> parts = {"cn",   "=",   "o=",       ",",    ";", "+",
                                            "\\",   "\"",  "#",        " ",    "4", "a",
                                            "oid.", "2.5", "\xc3\xa9", "\xff", "<", "_"};
    int parsed_count = 0;
    for (int i = 0; i < 20000; ++i) {
        const std::string text = random.text(parts, 12);
        try {
            const LDIF_DN parsed = dn(text);
            ++parsed_count;
            parsed.str();
        } catch (const LDIF_Exception& e) {
            ASSERT_TRUE(e.ldapErr == 34 || e.ldapErr == 162) << text << ": " << e.msg;
        }
    }
    EXPECT_GT(parsed_count, 1000);
}

TEST(LDIF_DN, AssignedPartsAreCopies) {
    const LDIF_DN dn("cn=A+sn=B,o=C");
    LDIF_RDN step = dn.rdns().front();
    ASSERT_EQ(stored(step), "o=[C]plain");
    LDIF_RDN_pair pair = step.pairs().front();
    step = dn.rdns().back();
    pair = step.pairs().back();
    EXPECT_EQ(stored(step), "cn=[A]plain & sn=[B]plain");
    EXPECT_EQ(pair.str(), "sn=B");
    EXPECT_EQ(stored(dn), "o=[C]plain / cn=[A]plain & sn=[B]plain");
}
