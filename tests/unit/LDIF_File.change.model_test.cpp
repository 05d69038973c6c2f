// Generated modifications do to an entry what their rules say literally, refusals and their reports
// included.

#include <gmock/gmock.h>

#include <algorithm>
#include <cctype>
#include <cstdlib>
#include <iterator>
#include <map>
#include <memory>
#include <string>
#include <vector>

#include "LDIF_Exception.h"
#include "LDIF_File.h"
#include "modifications.h"
#include "modified_store.h"
#include "random_names.h"

using namespace cfg32::tests;
using namespace cfg32::tests::operations;
using testing::PrintToString;

namespace {

struct refusal {
    int code = 0;
    int extended = 0;
    std::string attribute;
    std::string value;
};

std::string shown(const refusal& r) {
    return std::to_string(r.code) + "/" + std::to_string(r.extended) + " " + r.attribute + "=" +
           r.value;
}

std::string lower_case(std::string text) {
    std::transform(text.begin(), text.end(), text.begin(),
                   [](unsigned char c) { return static_cast<char>(tolower(c)); });
    return text;
}

/// The attributes of the schema that the test uses; every other is case-exact text.
bool is_single(const std::string& name) {
    return name == "cn" || name == "oru-slapdport" || name == "oru-slapdreadonly";
}

/// What a value is stored as.
std::string stored(const std::string& name, const std::string& value) {
    if (name == "oru-slapdport") {
        char* end = nullptr;
        const long number = strtol(value.c_str(), &end, 10);
        if (value.empty() || *end != '\0') {
            throw refusal{21, 1016, "oru-slapdPort", value};
        }
        if (number < 1 || number > 65535) {
            throw refusal{21, 1015, "oru-slapdPort", value};
        }
        return std::to_string(number);
    }
    if (name == "oru-slapdreadonly" && lower_case(value) != "true" &&
        lower_case(value) != "false") {
        throw refusal{21, 1017, "oru-slapdReadOnly", value};
    }
    return value;
}

/// Two stored values are equal when this is.
std::string compared(const std::string& name, const std::string& value) {
    const bool ignores_case = name == "cn" || name == "objectclass" || name == "oru-slapdreadonly";
    return ignores_case ? lower_case(value) : value;
}

/// An attribute with its values.
struct model_attribute {
    std::string name;
    std::vector<std::string> values;

    std::string key() const { return lower_case(name); }

    std::vector<std::string>::iterator find(const std::string& value) {
        return std::find_if(values.begin(), values.end(), [&](const std::string& own) {
            return compared(key(), own) == compared(key(), value);
        });
    }

    void add(const std::string& value) {
        if (find(value) == values.end()) {
            values.push_back(value);
        }
    }
};

/// The entry, by its attributes' names in lower case.
class model {
  public:
    void apply(const change& what);
    void add_entry(const std::vector<change>& changes);

    /// The lines that are written of it; "-" stands in the place of values when all are asked for.
    std::string lines(bool with_empty) const;

  private:
    static model_attribute made_of(const change& what);
    static void require_readable(const model_attribute& added);
    static void require_one(const model_attribute& added, const model_attribute& present);

    model_attribute present(const std::string& name) const {
        const auto found = attributes_.find(lower_case(name));
        return found == attributes_.end() ? model_attribute{name, {}} : found->second;
    }
    void merge(const model_attribute& added);
    void add_values(const change& what);
    void delete_values(const change& what);
    void replace_values(const change& what);

    std::map<std::string, model_attribute> attributes_;
};

model_attribute model::made_of(const change& what) {
    model_attribute made{what.name, {}};
    for (const std::string& value : what.values) {
        made.add(stored(made.key(), value));
    }
    return made;
}

void model::require_readable(const model_attribute& added) {
    const bool is_bad_name = added.key() == "dn" || added.name.find(':') != std::string::npos;
    for (const std::string& value : added.values) {
        const bool is_bad_value = !value.empty() && (value.front() == ' ' || value.back() == ' ' ||
                                                     value.find('\n') != std::string::npos);
        if (is_bad_name || is_bad_value) {
            throw refusal{21, 1005, added.name, value};
        }
    }
}

void model::require_one(const model_attribute& added, const model_attribute& present) {
    if (!is_single(added.key())) {
        return;
    }
    model_attribute both = present;
    for (const std::string& value : added.values) {
        const bool is_there = both.find(value) != both.values.end();
        if (!is_there && !both.values.empty()) {
            throw refusal{19, 1006, added.name, value};
        }
        both.add(value);
    }
}

void model::merge(const model_attribute& added) {
    const auto [place, is_new] =
        attributes_.try_emplace(added.key(), model_attribute{added.name, {}});
    for (const std::string& value : added.values) {
        place->second.add(value);
    }
}

void model::add_values(const change& what) {
    if (what.values.empty()) {
        return;
    }
    const model_attribute added = made_of(what);
    require_readable(added);
    require_one(added, present(what.name));
    merge(added);
}

void model::delete_values(const change& what) {
    const auto found = attributes_.find(lower_case(what.name));
    if (found == attributes_.end()) {
        throw refusal{16, 16, what.name, what.values.empty() ? "<NULL>" : what.name};
    }
    model_attribute& attribute = found->second;
    for (const std::string& value : what.values) {
        if (attribute.values.empty()) {
            break;
        }
        const auto deleted = attribute.find(stored(found->first, value));
        if (deleted != attribute.values.end()) {
            attribute.values.erase(deleted);
        }
    }
    if (what.values.empty() || attribute.values.empty()) {
        attributes_.erase(found);
    }
}

void model::replace_values(const change& what) {
    const auto found = attributes_.find(lower_case(what.name));
    if (found == attributes_.end()) {
        return add_values(what);
    }
    if (what.values.empty()) {
        attributes_.erase(found);
        return;
    }
    model_attribute replacement;
    try {
        replacement = made_of(what);
    } catch (const refusal&) {
        found->second.values.clear();
        throw;
    }
    require_readable(replacement);
    require_one(replacement, {what.name, {}});
    found->second.values = replacement.values;
}

void model::apply(const change& what) {
    switch (what.operation) {
        case add:
            return add_values(what);
        case del:
            return delete_values(what);
        case replace:
            return replace_values(what);
        default:
            throw refusal{89, 1010, "", ""};
    }
}

/// All or nothing: the new attributes are an entry of their own until all are known to fit.
void model::add_entry(const std::vector<change>& changes) {
    model added;
    for (const change& what : changes) {
        added.add_values(what);
    }
    for (const auto& [key, attribute] : added.attributes_) {
        require_one(attribute, present(key));
    }
    for (const auto& [key, attribute] : added.attributes_) {
        merge(attribute);
    }
}

std::string model::lines(bool with_empty) const {
    std::string text;
    for (const auto& [key, attribute] : attributes_) {
        for (const std::string& value : attribute.values) {
            text += attribute.name + ": " + value + "\n";
        }
        text += with_empty && attribute.values.empty() ? attribute.name + " -\n" : "";
    }
    return text;
}

struct LDIF_File_model : modified_store_test {
    random_names random{71};

    change generated_change() {
        static const char* const names[] = {"sn",
                                            "SN",
                                            "cn",
                                            "CN",
                                            "oru-slapdPort",
                                            "ORU-slapdport",
                                            "objectclass",
                                            "objectClass",
                                            "oru-slapdReadOnly",
                                            "ou",
                                            "zz",
                                            "dn",
                                            "a:b"};
        static const char* const values[] = {"a",    "A",    "b",    "B",     "c",   "1",  "01",
                                             "2",    "+2",   "0",    "70000", "x y", " x", "x ",
                                             "x\ny", "true", "TRUE", "false", ""};
        static const int operations[] = {add, del, replace};
        change what;
        const bool is_unknown = random.below(40) == 0;
        what.operation = is_unknown ? 3 : operations[random.below(std::size(operations))];
        what.name = names[random.below(std::size(names))];
        for (unsigned count = random.below(4); count > 0; --count) {
            what.values.emplace_back(values[random.below(std::size(values))]);
        }
        return what;
    }

    /// The lines of the entry in memory, in the model's form.
    static std::string all_lines(const LDIF_File& file) {
        std::string text;
        for (const LDIF_Attribute& attribute : attributes(file)) {
            text += attribute.values().empty() ? attribute.name().text() + " -\n" : attribute.str();
        }
        return text;
    }
};

template <class Body>
refusal refusal_of_model(Body&& body) {
    try {
        body();
    } catch (const refusal& r) {
        return r;
    }
    return {};
}

template <class Body>
refusal refusal_of_store(Body&& body) {
    try {
        body();
    } catch (const LDIF_Exception& e) {
        return {e.ldapErr, e.extErr, e.attribute, e.value};
    }
    return {};
}

std::string description(bool is_entry, const std::vector<change>& changes) {
    std::string text = is_entry ? "an entry is added:" : "an entry is modified:";
    for (const change& what : changes) {
        text += " " + std::to_string(what.operation) + " " + what.name + " " +
                PrintToString(what.values);
    }
    return text;
}

}  // namespace

TEST_F(LDIF_File_model, GeneratedModificationsDoWhatTheRulesSayLiterally) {
    std::map<int, int> outcomes;
    for (int round = 0; round < 400; ++round) {
        SCOPED_TRACE(round);
        auto file = store_with("cn: A\noru-slapdPort: 1\nsn: a\n");
        model expected;
        expected.apply({add, "cn", {"A"}});
        expected.apply({add, "oru-slapdPort", {"1"}});
        expected.apply({add, "sn", {"a"}});
        for (int step = 0; step < 6; ++step) {
            std::vector<change> changes(1 + random.below(3));
            std::generate(changes.begin(), changes.end(), [&] { return generated_change(); });
            const bool is_entry = random.below(4) == 0;
            SCOPED_TRACE(description(is_entry, changes));
            const refusal literal = refusal_of_model([&] {
                if (is_entry) {
                    return expected.add_entry(changes);
                }
                for (const change& what : changes) {
                    expected.apply(what);
                }
            });
            const refusal given = refusal_of_store([&] {
                modifications mods(changes);
                is_entry ? file->add(dn_of("cn=a,o=b"), mods.records())
                         : file->modify(dn_of("cn=a,o=b"), mods.records());
            });
            ASSERT_EQ(shown(given), shown(literal));
            ASSERT_EQ(all_lines(*file), expected.lines(true));
            ++outcomes[literal.code];
        }
        file->flush();
        file = std::make_unique<LDIF_File>(path, "", nullptr);
        ASSERT_EQ(lines(*file), expected.lines(false)) << "read back";
    }
    for (const int code : {0, 16, 19, 21, 89}) {
        EXPECT_GT(outcomes[code], 50) << code << " is hardly tested";
    }
}
