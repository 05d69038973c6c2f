// The lists of values.

#include <gtest/gtest.h>

#include <algorithm>
#include <functional>
#include <memory>
#include <random>
#include <stdexcept>
#include <string>
#include <vector>

#include "LDIF_AttrType.h"
#include "LDIF_DN.h"
#include "LDIF_Exception.h"
#include "LDIF_Value.h"
#include "cfg32_platform.h"
#include "changed_row.h"
#include "failing_new.h"
#include "failures.h"

using namespace cfg32::tests;
using namespace std::string_literals;

namespace {

const char* const source_file = "src/libraries/cfg32stl/LDIF_Value";
const std::string no_to_str = "80/1000 Invalid LDIF_Value detected: attrType->toStr == NULL";

LDIF_Value value_of(const char* attribute, const std::string& text) {
    return LDIF_Value(getAttrType(attribute), text, nullptr);
}

/// Where in the list the value equal to the text stands; the list's length for none.
ptrdiff_t position_of(const LDIF_Values& values, const std::string& text) {
    return std::distance(values.begin(), values.find(text));
}

std::vector<std::string> texts(const LDIF_Values& values) {
    std::vector<std::string> result;
    for (const LDIF_Value& value : values) {
        result.push_back(value.str());
    }
    return result;
}

LDIF_Values list_of(const std::string& name, const std::vector<std::string>& added) {
    LDIF_Values values(name, nullptr);
    for (const std::string& text : added) {
        values += text;
    }
    return values;
}

using strings = std::vector<std::string>;

[[noreturn]] void unexpected() { throw std::runtime_error("unexpected"); }
std::string unexpected_to_str(const LDIF_Value&) { unexpected(); }
int unexpected_match(const LDIF_Value&, const LDIF_Value&) { unexpected(); }

/// Fails in a way that the library does not know for the text "unexpected".
void picky_from_str(LDIF_Value& value, const cfg32::given_text& text) {
    if (text.view() == "unexpected") {
        unexpected();
    }
    cesFromStr(value, text);
}

void expect_position(const LDIF_Exception& e) {
    EXPECT_EQ(e.srcFile, source_file);
    EXPECT_GT(e.srcLine, 0);
}

}  // namespace

TEST(LDIF_Values, AnEmptyListHasNameTypeAndNoText) {
    const LDIF_Values values("ObjectClass", nullptr);
    EXPECT_TRUE(values.empty());
    EXPECT_EQ(values.name().text(), "ObjectClass");
    EXPECT_EQ(values.type(), getAttrType("objectclass"));
    EXPECT_EQ(values.str(), "");
    EXPECT_EQ(values.find("a"), values.end());
    EXPECT_EQ(LDIF_Values("", nullptr).type(), getAttrType(nullptr));
}

TEST(LDIF_Values, AListForAnUnknownNameAcceptsAnyTextAndKeepsTheName) {
    const LDIF_Values values = list_of("No-Such-Thing", {"any", " text ", ""});
    EXPECT_EQ(values.type(), getAttrType(nullptr));
    EXPECT_EQ(values.str(), "No-Such-Thing: any\nNo-Such-Thing:  text \nNo-Such-Thing: \n");
}

TEST(LDIF_Values, PrintsALineForEachValueInTheOrderOfAdding) {
    EXPECT_EQ(list_of("cn", {"a", "b"}).str(), "cn: a\ncn: b\n");
    EXPECT_EQ(list_of("CN", {"b", "a"}).str(), "CN: b\nCN: a\n");
}

TEST(LDIF_Values, EqualValuesAreDroppedByTheSyntax) {
    const struct {
        const char* name;
        strings added;
        strings kept;
    } rows[] = {
        {"cn", {"a", "a"}, {"a"}},
        {"oru-slapdReadOnly", {"true", "True", "TRUE", "false"}, {"true", "false"}},
        {"unknown", {"a", "A", "a"}, {"a", "A"}},
        {"unknown", {"", "", "a"}, {"", "a"}},
        {"oru-slapdPort", {"389", " +0389 ", "636"}, {"389", "636"}},
        {"oru-slapdSuffix", {"cn=a;o=b", "CN=A, O=B", "cn=\"a\",o=b", "o=b"}, {"cn=a, o=b", "o=b"}},
    };
    for (const auto& row : rows) {
        EXPECT_EQ(texts(list_of(row.name, row.added)), row.kept) << row.name;
    }
}

TEST(LDIF_Values, SingleValuedAttributesMayHaveSeveralHere) {
    EXPECT_EQ(texts(list_of("oru-slapdPort", {"1", "2"})), (strings{"1", "2"}));
}

TEST(LDIF_Values, EqualPasswordsAreDropped) {
    const unsigned char bytes[32] = {1};
    aes_key_data* key = aes_key_data_from_bytes(bytes, sizeof bytes);
    {
        LDIF_Values values("oru-slapdAdminPW", key);
        values += "secret"s;
        const std::string stored = values.begin()->str();
        EXPECT_TRUE(stored.starts_with("{AES256}"));
        values += "secret"s;
        values += stored;
        EXPECT_EQ(texts(values), strings{stored});
        EXPECT_EQ(values.find("secret"), values.begin());
        values -= "Secret"s;
        EXPECT_EQ(values.size(), 1U);
        values -= "secret"s;
        EXPECT_TRUE(values.empty());
    }
    aes_key_data_free(key);
}

TEST(LDIF_Values, RemovingErasesTheFirstEqualValueAndKeepsTheOrder) {
    LDIF_Values values = list_of("cn", {"a", "b", "c"});
    values -= "B"s;
    EXPECT_EQ(texts(values), (strings{"a", "c"}));
    values -= "not there"s;
    EXPECT_EQ(texts(values), (strings{"a", "c"}));
    values -= "a"s;
    values -= "c"s;
    EXPECT_TRUE(values.empty());
    values -= "c"s;
    EXPECT_TRUE(values.empty());
}

TEST(LDIF_Values, ARefusedTextLeavesTheListUnchanged) {
    LDIF_Values values = list_of("oru-slapdPort", {"389", "636"});
    const LDIF_Exception added = failure_of([&] { values += " 0 "s; });
    EXPECT_EQ(summary(added), "21/1015 Integer value out of range");
    EXPECT_EQ(added.value, " 0 ");
    EXPECT_EQ(added.attrType, values.type());
    EXPECT_EQ(added.attribute, "oru-slapdPort");
    expect_position(added);
    EXPECT_TRUE(added.cause);
    const LDIF_Exception removed = failure_of([&] { values -= "x"s; });
    EXPECT_EQ(summary(removed), "21/1016 Value is not valid integer syntax");
    EXPECT_EQ(removed.value, "x");
    EXPECT_EQ(removed.attrType, values.type());
    expect_position(removed);
    EXPECT_TRUE(removed.cause);
    EXPECT_THROW(values.find("x"), LDIF_Exception);
    EXPECT_EQ(texts(values), (strings{"389", "636"}));
}

// An empty list compares nothing, so it refuses nothing.
TEST(LDIF_Values, NothingIsCheckedInAnEmptyListUnlessItIsAdded) {
    LDIF_Values values("oru-slapdPort", nullptr);
    EXPECT_NO_THROW(values -= "x"s);
    EXPECT_EQ(values.find("x"), values.end());
    EXPECT_THROW(values += "x"s, LDIF_Exception);
    EXPECT_TRUE(values.empty());
}

TEST(LDIF_Values, AValueIsAddedAsTextAndParsedAgain) {
    LDIF_Values values("oru-slapdPort", nullptr);
    values += value_of("cn", " 0389 ");
    EXPECT_EQ(texts(values), strings{"389"});
    EXPECT_EQ(values.begin()->attrType, getAttrType("oru-slapdPort"));
    EXPECT_EQ(values.begin()->binaryLength, 8);
    const LDIF_Exception e = failure_of([&] { values += value_of("cn", "x"); });
    EXPECT_EQ(summary(e), "21/1016 Value is not valid integer syntax");
    EXPECT_EQ(e.value, "x");
    EXPECT_EQ(e.attrType, values.type());
    expect_position(e);
}

TEST(LDIF_Values, AListIsAddedInItsOrder) {
    LDIF_Values values = list_of("cn", {"a", "b"});
    values += list_of("unknown", {"B", "d", "c", "A"});
    EXPECT_EQ(values.str(), "cn: a\ncn: b\ncn: d\ncn: c\n");
    values += values;
    EXPECT_EQ(values.size(), 4U);
}

TEST(LDIF_Values, AValueThatFailsLeavesTheOnesBeforeItAdded) {
    LDIF_Values values = list_of("oru-slapdPort", {"1"});
    const LDIF_Exception e = failure_of([&] {
        values += list_of("unknown", {"1", "2", "x", "3"});
    });
    EXPECT_EQ(summary(e), "21/1016 Value is not valid integer syntax");
    EXPECT_EQ(e.value, "x");
    EXPECT_EQ(e.attrType, values.type());
    expect_position(e);
    EXPECT_EQ(texts(values), (strings{"1", "2"}));
}

TEST(LDIF_Values, AssignmentReplacesNameTypeAndValues) {
    LDIF_Values values = list_of("cn", {"a", "b"});
    values = list_of("Oru-SlapdPort", {"389", "636"});
    EXPECT_EQ(values.str(), "Oru-SlapdPort: 389\nOru-SlapdPort: 636\n");
    EXPECT_EQ(values.type(), getAttrType("oru-slapdPort"));
    const LDIF_Values empty("cn", nullptr);
    values = empty;
    EXPECT_TRUE(values.empty());
    EXPECT_EQ(values.name().text(), "cn");
}

TEST(LDIF_Values, AssignmentChecksEveryValueAgain) {
    const LDIF_Values source = list_of("oru-slapdPort", {"1", "2", "3"});
    changed_row row("oru-slapdPort");
    row->maximum = 1;
    LDIF_Values values = list_of("cn", {"a"});
    const LDIF_Exception e = failure_of([&] { values = source; });
    EXPECT_EQ(summary(e), "21/1015 Integer value out of range");
    EXPECT_EQ(e.value, "2");
    EXPECT_EQ(e.attrType, source.type());
    expect_position(e);
    EXPECT_EQ(values.str(), "oru-slapdPort: 1\n");  // emptied and partly refilled
    row->maximum = 3;
    values = source;
    EXPECT_EQ(texts(values), (strings{"1", "2", "3"}));
}

TEST(LDIF_Values, APlainCopyChecksAndChangesNothing) {
    const LDIF_Values source = list_of("oru-slapdPort", {"1", "2"});
    changed_row row("oru-slapdPort");
    row->maximum = 1;
    LDIF_Values copy(source);
    EXPECT_EQ(copy.str(), "oru-slapdPort: 1\noru-slapdPort: 2\n");
    copy -= "1"s;
    EXPECT_EQ(source.size(), 2U);
}

TEST(LDIF_Values, WhatNobodyExpectedIsTheSystemErrorOfTheOperation) {
    const std::string of_add = "80/1000 System error in LDIF_Values::operator +=";
    changed_row row("charset");
    row->match = unexpected_match;
    LDIF_Values values = list_of("charset", {"a"});
    const LDIF_Exception added = failure_of([&] { values += "b"s; });
    EXPECT_EQ(summary(added), of_add);
    EXPECT_EQ(added.value, "b");
    EXPECT_EQ(added.attrType, values.type());
    expect_position(added);
    EXPECT_EQ(summary(failure_of([&] { values += value_of("cn", "b"); })), of_add);
    const LDIF_Exception removed = failure_of([&] { values -= "b"s; });
    EXPECT_EQ(summary(removed), "80/1000 System error in LDIF_Values::operator -=");
    EXPECT_EQ(removed.value, "b");
    EXPECT_EQ(removed.attrType, values.type());
    expect_position(removed);
    LDIF_Values target("cn", nullptr);
    const LDIF_Values two = list_of("charset", {"a"});
    row->toStr = unexpected_to_str;
    const LDIF_Exception assigned = failure_of([&] { target = two; });
    EXPECT_EQ(summary(assigned), "80/1000 System error in LDIF_Values::operator =");
    expect_position(assigned);
}

// The first value is named, whichever failed.
TEST(LDIF_Values, ASystemErrorOfAddingAListNamesTheFirstValue) {
    changed_row row("charset");
    row->match = unexpected_match;
    LDIF_Values values("charset", nullptr);
    const LDIF_Exception e = failure_of([&] {
        values += list_of("unknown", {"first", "second", "third"});
    });
    EXPECT_EQ(summary(e), "80/1000 System error in LDIF_Values::operator +=");
    EXPECT_EQ(e.value, "first");
    EXPECT_EQ(e.attrType, values.type());
    EXPECT_EQ(texts(values), strings{"first"});
    expect_position(e);
}

TEST(LDIF_Values, ASystemErrorInsideAValueIsTheValuesOwn) {
    changed_row row("charset");
    row->fromStr = picky_from_str;
    LDIF_Values values = list_of("charset", {"a"});
    const LDIF_Exception e = failure_of([&] {
        values += list_of("unknown", {"first", "unexpected"});
    });
    EXPECT_EQ(summary(e), "80/1000 System error in LDIF_Value( string ) constructor");
    EXPECT_EQ(e.value, "unexpected");
    EXPECT_EQ(texts(values), (strings{"a", "first"}));
}

// Also when the failure comes from the value that is to be added.
TEST(LDIF_Values, AValueWithoutTextIsReportedByTheList) {
    _AttrType type = *getAttrType("cn");
    type.toStr = nullptr;
    const LDIF_Value without_text(&type, "a", nullptr);
    LDIF_Values values("charset", nullptr);
    const LDIF_Exception e = failure_of([&] { values += without_text; });
    EXPECT_EQ(summary(e), no_to_str);
    EXPECT_EQ(e.attrType, values.type());
    EXPECT_TRUE(e.cause);
    type.toStr = unexpected_to_str;
    try {
        values += without_text;
        ADD_FAILURE() << "nothing was thrown";
    } catch (const LDIF_Exception& unexpected) {
        EXPECT_EQ(summary(unexpected), "80/1000 System error in LDIF_Values::operator +=");
    } catch (...) {
        ADD_FAILURE() << "the exception of the syntax passed the list";
    }
}

// --- long lists -----------------------------------------------------------------------------

namespace {

/// The list as its promises describe it: every search is a scan from the first value.
class scanned_list {
  public:
    scanned_list(const _AttrType* type, aes_key_data* key) : type_(type), key_(key) {}

    size_t find(const std::string& text) const {
        size_t position = 0;
        while (position < values_.size() && !(values_[position] == text)) {
            ++position;
        }
        return position;
    }
    void add(const std::string& text) {
        if (find(text) == values_.size()) {
            values_.emplace_back(type_, text, key_);
        }
    }
    void remove(const std::string& text) {
        if (const size_t position = find(text); position < values_.size()) {
            values_.erase(values_.begin() + static_cast<ptrdiff_t>(position));
        }
    }
    strings texts() const {
        strings result;
        for (const LDIF_Value& value : values_) {
            result.push_back(value.str());
        }
        return result;
    }

  private:
    const _AttrType* type_;
    aes_key_data* key_;
    std::vector<LDIF_Value> values_;
};

/// The failure that ended body; empty for none.
template <class Body>
std::string failure_text(Body body) {
    try {
        body();
    } catch (const LDIF_Exception& e) {
        return summary(first_cause(e));
    }
    return "";
}

using text_maker = std::function<std::string(std::mt19937&)>;

/// The same random additions, removals and searches, on a list and on a scanned one.
void expect_same_as_scan(const char* name, int steps, unsigned seed, const text_maker& make) {
    SCOPED_TRACE(name);
    std::mt19937 random(seed);
    LDIF_Values values(name, nullptr);
    scanned_list scanned(values.type(), nullptr);
    size_t longest = 0;
    for (int step = 0; step < steps; ++step) {
        const std::string text = make(random);
        // Growing and shrinking in turns, across the length from which an index is used.
        const bool is_growing = step / 60 % 2 == 0;
        const unsigned choice = random() % 10;
        if (choice < 2) {
            size_t position = 0;
            size_t expected = 0;
            const std::string failure =
                failure_text([&] { position = static_cast<size_t>(position_of(values, text)); });
            ASSERT_EQ(failure, failure_text([&] { expected = scanned.find(text); })) << text;
            ASSERT_EQ(position, expected) << text;
        } else if ((choice < 9) == is_growing) {
            const std::string failure = failure_text([&] { values += text; });
            ASSERT_EQ(failure, failure_text([&] { scanned.add(text); })) << text;
        } else {
            const std::string failure = failure_text([&] { values -= text; });
            ASSERT_EQ(failure, failure_text([&] { scanned.remove(text); })) << text;
        }
        ASSERT_EQ(values.size(), scanned.texts().size()) << text;
        longest = std::max(longest, values.size());
    }
    // A password's text differs from one encoding to the next.
    if (values.type()->match != pwCompare) {
        EXPECT_EQ(texts(values), scanned.texts());
    }
    EXPECT_GT(longest, 20U);
}

std::string word(std::mt19937& random, const std::string& letters, size_t longest) {
    std::string text;
    for (size_t n = random() % (longest + 1); n > 0; --n) {
        text += letters[random() % letters.size()];
    }
    return text;
}

}  // namespace

TEST(LDIF_Values, LongListsGiveWhatAScanGives) {
    const auto letters = [](std::mt19937& r) { return word(r, "aAbB\xc3", 3); };
    const auto number = [](std::mt19937& r) {
        const char* const forms[] = {"", " ", "+", "00"};
        return r() % 20 == 0 ? word(r, "1x", 2) : forms[r() % 4] + std::to_string(r() % 60);
    };
    const auto mask = [](std::mt19937& r) {
        return std::to_string(r() % 50 * 256 + r() % 20 / 19);
    };
    const auto dn = [](std::mt19937& r) {
        const char* const forms[] = {"cn=", "CN=", "oid.2.5=", "cn=\"", "o=b+cn="};
        const char* const roots[] = {"", "; o=c", ",O=C"};
        std::string text = forms[r() % 5] + word(r, "aAbB", 2);
        text += text.find('"') != text.npos ? "\"" : "";
        return r() % 20 == 0 ? "cn=a\\q" : text + roots[r() % 3];
    };
    expect_same_as_scan("unknown", 600, 1, letters);
    expect_same_as_scan("charset", 600, 2, letters);
    expect_same_as_scan("oru-slapdIncludeSchema", 600, 3, letters);
    expect_same_as_scan("cn", 600, 4, [](std::mt19937& r) { return word(r, "aAbBcC", 4); });
    expect_same_as_scan("oru-slapdReferral", 600, 5,
                        [](std::mt19937& r) { return word(r, "aAbBcC", 4); });
    expect_same_as_scan("oru-slapdSizeLimit", 600, 6, number);
    expect_same_as_scan("oru-slapdCachedAttributeSize", 600, 7, number);
    expect_same_as_scan("oru-slapdSslCipherSpecs", 600, 8, mask);
    expect_same_as_scan("oru-slapdSuffix", 600, 9, dn);
    expect_same_as_scan("oru-slapdAdminPW", 240, 10,
                        [](std::mt19937& r) { return "p" + word(r, "aAbB", 3); });
}

TEST(LDIF_Values, APasswordThatCannotBeDecodedIsReportedTheSameInLongLists) {
    LDIF_Values values("oru-slapdAdminPW", nullptr);
    values += "some password"s;
    const std::string undecodable = "{SHA}hash";
    const LDIF_Exception in_short_list = failure_of([&] { values += undecodable; });
    for (int i = 0; i < 20; ++i) {
        values += "password" + std::to_string(i);
    }
    const LDIF_Exception in_long_list = failure_of([&] { values += undecodable; });
    EXPECT_EQ(summary(in_short_list), "84/1000 unformat_password(right);");
    EXPECT_EQ(summary(in_long_list), "84/1000 unformat_password(right);");
    EXPECT_EQ(summary(failure_of([&] { values.find(undecodable); })),
              "84/1000 unformat_password(right);");
}

TEST(LDIF_Values, ALongListIsCopiedMovedAndAssignedWhole) {
    LDIF_Values values("cn", nullptr);
    for (int i = 0; i < 40; ++i) {
        values += "value " + std::to_string(i);
    }
    EXPECT_EQ(position_of(values, "VALUE 39"), 39);
    LDIF_Values copy(values);
    copy += "VALUE 20"s;
    EXPECT_EQ(copy.size(), 40U);
    copy -= "value 0"s;
    EXPECT_EQ(copy.find("value 1"), copy.begin());
    EXPECT_EQ(position_of(values, "value 1"), 1);
    LDIF_Values moved(std::move(copy));
    EXPECT_EQ(position_of(moved, "value 39"), 38);
    LDIF_Values assigned("charset", nullptr);
    assigned = moved;
    EXPECT_EQ(position_of(assigned, "Value 39"), 38);
    assigned = std::move(moved);
    assigned += "VALUE 39"s;
    EXPECT_EQ(assigned.size(), 39U);
    assigned.clear();
    EXPECT_EQ(assigned.find("value 1"), assigned.end());
    assigned += "value 1"s;
    EXPECT_EQ(assigned.size(), 1U);
}

TEST(LDIF_Values, TenThousandValuesStayInOrderAndUnique) {
    constexpr int count = 10000;
    LDIF_Values values("cn", nullptr);
    for (int round = 0; round < 2; ++round) {
        for (int i = 0; i < count; ++i) {
            values += (round == 0 ? "value " : "VALUE ") + std::to_string(i);
        }
    }
    ASSERT_EQ(values.size(), static_cast<size_t>(count));
    for (int i = 0; i < count; i += 7) {
        ASSERT_EQ(position_of(values, "Value " + std::to_string(i)), i);
    }
    EXPECT_EQ(values.find("value 10000"), values.end());
    values -= "value 5000"s;
    EXPECT_EQ(values.find("value 5000"), values.end());
    EXPECT_EQ(position_of(values, "value 9999"), 9998);
    values += "value 5000"s;
    EXPECT_EQ(position_of(values, "value 5000"), 9999);
}

TEST(LDIF_Values, ExhaustedMemoryLeavesTheListAsItWasAndWithoutDuplicatesLater) {
    // Lengths before, at and after the one from which an index is used.
    for (const int length : {1, 15, 16, 17, 18, 32}) {
        for (long which = 0;; ++which) {
            SCOPED_TRACE(std::to_string(length) + " values, allocation " + std::to_string(which));
            LDIF_Values values("cn", nullptr);
            for (int i = 0; i < length; ++i) {
                values += "a value that is longer than a short string " + std::to_string(i);
            }
            const std::string text = "another value that is longer than a short string";
            const std::string first = values.begin()->str();
            const strings before = texts(values);
            std::unique_ptr<LDIF_Exception> failure;
            failing_allocation failing(which);
            try {
                values += text;
            } catch (const LDIF_Exception& e) {
                failure = std::make_unique<LDIF_Exception>(e);
            }
            if (!failing.happened()) {
                break;
            }
            ASSERT_TRUE(failure);
            EXPECT_EQ(failure->ldapErr, 80);
            EXPECT_EQ(failure->extErr, 1000);
            EXPECT_EQ(texts(values), before);
            for (const std::string& again : before) {
                values += again;
            }
            values += text;
            values += text;
            ASSERT_EQ(values.size(), before.size() + 1);
        }
    }
}

TEST(LDIF_Values, ErasedValuesAreGoneBeforeTheirGapsAreClosed) {
    for (const int count : {2, 5, 40}) {
        LDIF_Values values("cn", nullptr);
        for (int i = 0; i < count; ++i) {
            values += std::to_string(i);
        }
        values -= "0";
        EXPECT_EQ(values.size(), static_cast<size_t>(count - 1));
        EXPECT_EQ(values.find("0"), values.end());
        EXPECT_EQ(values.begin()->str(), "1");
        values += "0";
        values -= "1";
        values += "0";
        const LDIF_Values copy(values);
        EXPECT_EQ(texts(copy), texts(values));
        EXPECT_EQ(texts(values).back(), "0");
        EXPECT_EQ(std::distance(values.begin(), values.end()), count - 1);
        for (auto value = values.begin(); value != values.end();) {
            value = values.erase(value);
        }
        EXPECT_TRUE(values.empty());
        EXPECT_EQ(values.str(), "");
    }
}

TEST(LDIF_Values, AreTheSameAfterTheyWereAssignedToThemselves) {
    LDIF_Values values = list_of("cn", {"a", "b"});
    const LDIF_Values& self = values;
    values = self;
    EXPECT_EQ(texts(values), (strings{"a", "b"}));
}

TEST(LDIF_Values, AWalkThatStepsOnGivesThePlaceBefore) {
    const LDIF_Values values = list_of("cn", {"a"});
    auto place = values.begin();
    const auto before = place++;
    EXPECT_EQ(before, values.begin());
    EXPECT_EQ(place, values.end());
}
