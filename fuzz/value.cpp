#include <cstdint>
#include <cstring>
#include <optional>
#include <utility>

#include "LDIF_AttrType.h"
#include "LDIF_Exception.h"
#include "LDIF_Value.h"
#include "exempt_dn.h"
#include "order.h"

namespace cfg32::fuzz {

namespace {

constexpr size_t most_values = 24;  // more than a list does without an index
constexpr size_t most_ordered = 6;  // each with each and each

/// What an accepted text gives, that can be compared: a stored password that can't be decoded is
/// accepted, too.
template <class Make>
std::optional<LDIF_Value> comparable(Make make) {
    std::optional<LDIF_Value> value;
    try {
        value = make();
        static_cast<void>(value->compare(*value));
        return value;
    } catch (const LDIF_Exception& e) {
        require_refusal(e);
        require(!value || (value->attrType->match == pwCompare && e.ldapErr == 84),
                "what is accepted can be compared");
        return {};
    }
}

std::optional<LDIF_Value> accepted(const _AttrType* type, const std::string& text) {
    // As C callers and lines give it, which a NUL ends.
    return comparable([&] { return LDIF_Value(type, text.c_str(), nullptr); });
}

/// KEPT: of a text only 32 bits are accepted, of bytes 64; a large integer's text may have more.
bool is_beyond_text(const _AttrType* type, int64_t number) {
    return type->fromStr != kiloFromStr && number != static_cast<int32_t>(number);
}

std::optional<LDIF_Value> accepted_bytes(const _AttrType* type, const std::string& bytes) {
    int64_t number = 0;
    if (bytes.size() != sizeof number) {
        return {};  // an integer's bytes are so many
    }
    memcpy(&number, bytes.data(), sizeof number);
    if (is_beyond_text(type, number)) {
        return {};
    }
    return comparable([&] { return LDIF_Value(type, bytes.data(), sizeof number, nullptr); });
}

void require_print(const LDIF_Value& value) {
    if (is_exempt(value)) {
        return;
    }
    const std::string printed = value.str();
    require_equal(std::string(value.shown()), printed, "a value is shown as it is printed");
    const std::optional<LDIF_Value> again = accepted(value.attrType, printed);
    require(again.has_value(), "a value is accepted again as it is printed");
    require_equal(again->str(), printed, "a value is printed alike again");
    require_equal(value.compare(*again), 0, "a value is equal to what reads back");
    const LDIF_Value stored = LDIF_Value::stored(value.attrType, value.text, nullptr);
    require_equal(value.compare(stored), 0, "a value is equal to what is made of its stored text");
}

void require_equality(const LDIF_Value& left, const LDIF_Value& right) {
    const bool is_equal = left.compare(right) == 0;
    if (equal_texts* equal = equal_texts_of(*left.attrType)) {
        require_equal(equal(left.text, right.text), is_equal, "texts are equal when values are");
    }
    if (is_equal) {
        require_equal(hash_of(left), hash_of(right), "equal values have equal hashes");
    }
}

/// A list holds the first of equal values, however many there are.
void require_list(const std::string& name, const std::vector<std::string>& texts) {
    LDIF_Values list(name, nullptr);
    std::vector<std::string> expected;
    for (const std::string& text : texts) {
        const std::optional<LDIF_Value> value = accepted(list.type(), text);
        if (!value || is_exempt(*value)) {
            continue;
        }
        bool is_there = false;
        for (const std::string& known : expected) {
            is_there |= value->compare(LDIF_Value::stored(list.type(), known, nullptr)) == 0;
        }
        if (!is_there) {
            expected.emplace_back(value->text);
        }
        require_equal(list.find(*value) != list.end(), is_there, "a list finds what it holds");
        list += *value;
    }
    require_equal(list.size(), expected.size(), "a list holds one of equal values");
    for (size_t i = 0; i < expected.size(); ++i) {
        require_equal(std::string_view(list.texts()[i]), expected[i],
                      "a list holds the first of equal values");
    }
    for (const std::string& text : expected) {
        list -= text;
    }
    require(list.empty(), "a list gives back what it holds");
}

}  // namespace

void value_property(std::string_view input) {
    std::vector<std::string> texts = parts_of(input, most_values);
    const std::string name = std::move(texts.front());
    texts.erase(texts.begin());
    const _AttrType* type = getAttrType(name.c_str());
    std::vector<LDIF_Value> values;
    for (const std::string& text : texts) {
        for (const auto& make : {accepted, accepted_bytes}) {
            if (std::optional<LDIF_Value> value = make(type, text)) {
                require_print(*value);
                values.push_back(std::move(*value));
            }
        }
    }
    for (const LDIF_Value& left : values) {
        for (const LDIF_Value& right : values) {
            require_equality(left, right);
        }
    }
    require_list(name, texts);
    if (values.size() > most_ordered) {
        values.erase(values.begin() + most_ordered, values.end());
    }
    require_order(values, [](const auto& a, const auto& b) { return a.compare(b); });
}

}  // namespace cfg32::fuzz
