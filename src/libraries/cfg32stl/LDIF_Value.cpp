#include "LDIF_Value.h"

#include <algorithm>
#include <cstring>
#include <ostream>

#include "LDIF_Util.h"
#include "failure.h"

using namespace cfg32;

namespace {

constexpr failure no_type_for_text{80, 1000,
                                   "Illegal LDIF_Value( string ) constructor: attrType undefined"};
constexpr failure no_text{80, 1000, "System error in LDIF_Value( string ) constructor"};
constexpr failure no_type_for_bytes{80, 1000,
                                    "Illegal LDIF_Value( binary ) constructor: attrType undefined"};
constexpr failure form_without_length{80, 1000, "Invalid LDIF_Value detected: binaryLength < 1"};
constexpr failure length_without_form{80, 1000, "Invalid LDIF_Value detected: binaryLength != 0"};
constexpr failure no_buffer{90, 1000, "Allocation failed"};
constexpr failure no_to_str{80, 1000, "Invalid LDIF_Value detected: attrType->toStr == NULL"};
constexpr failure no_match{80, 1000, "Invalid LDIF_Value detected: attrType->match == NULL"};

/// Lists longer than this are searched through an index.
constexpr size_t longest_scan = 16;

}  // namespace

LDIF_Value::LDIF_Value(const _AttrType* type, const char* text, aes_key_data* key)
    : attrType(type), key(key) {
    text ? check(text) : raise_with(no_text, {}, [&](LDIF_Exception& e) { e.attrType = type; });
}

LDIF_Value::LDIF_Value(const _AttrType* type, const std::string& text, aes_key_data* key)
    : attrType(type), key(key) {
    check(text);
}

void LDIF_Value::check(const std::string& given) {
    const auto details = [&](LDIF_Exception& e) {
        e.value = given;
        if (attrType && attrType->name) {
            e.attribute = attrType->name;
        }
    };
    if (!attrType) {
        raise_with(no_type_for_text, {}, details);
    }
    with_boundary(
        in("LDIF_Value( string ) constructor"), [&] { attrType->fromStr(*this, given); }, details);
}

LDIF_Value::LDIF_Value(const _AttrType* type, const void* bytes, int length, aes_key_data* key)
    : attrType(type), key(key) {
    if (!type) {
        raise_with(no_type_for_bytes, {}, [](LDIF_Exception& e) { e.value = "binary"; });
    }
    const auto details = [&](LDIF_Exception& e) {
        if (type->name) {
            e.attribute = type->name;
        }
    };
    with_boundary(
        in("LDIF_Value( binary ) constructor"),
        [&] { type->fromBin(*this, static_cast<const char*>(bytes), length); }, details);
}

LDIF_Value::LDIF_Value(const LDIF_Value& other) : attrType(other.attrType), key(other.key) {
    *this = other;
}

LDIF_Value& LDIF_Value::operator=(const LDIF_Value& other) {
    if (this == &other) {
        return *this;
    }
    attrType = other.attrType;
    text = other.text;
    const auto details = [&](LDIF_Exception& e) {
        e.value = text;
        e.attrType = attrType;
    };
    if (other.binary && other.binaryLength == 0) {
        raise_with(form_without_length, {}, details);
    }
    if (!other.binary && other.binaryLength != 0) {
        raise_with(length_without_form, {}, details);
    }
    set_binary(other.binary.get(), other.binaryLength);
    dn = other.dn ? std::make_unique<LDIF_DN>(*other.dn) : nullptr;
    key = other.key;
    return *this;
}

void LDIF_Value::set_binary(const void* bytes, int length) {
    binary.reset();
    binaryLength = 0;
    if (length == 0) {
        return;
    }
    binary.reset(static_cast<char*>(malloc(static_cast<size_t>(length))));
    if (!binary) {
        raise_with(no_buffer, {}, [&](LDIF_Exception& e) {
            e.sysErrno = ENOMEM;
            e.value = text;
            e.attrType = attrType;
        });
    }
    memcpy(binary.get(), bytes, static_cast<size_t>(length));
    binaryLength = length;
}

std::string LDIF_Value::str() const {
    if (!attrType || !attrType->toStr) {
        raise(no_to_str);
    }
    return attrType->toStr(*this);
}

int LDIF_Value::compare(const LDIF_Value& other) const {
    if (!attrType || !attrType->match) {
        raise(no_match);
    }
    return attrType->match(*this, other);
}

int LDIF_Value::compare(const std::string& other) const {
    if (!attrType || !attrType->match) {
        raise(no_match);
    }
    return compare(LDIF_Value(attrType, other, key));
}

std::ostream& operator<<(std::ostream& out, const LDIF_Value& value) { return out << value.str(); }

attribute_name::attribute_name(const std::string& name, const _AttrType& type) {
    if (type.name && name == type.name) {
        table_ = &name_of(type);
    } else {
        own_ = std::make_unique<cisString>(name);
    }
}

attribute_name::attribute_name(const attribute_name& other)
    : table_(other.table_), own_(other.own_ ? std::make_unique<cisString>(*other.own_) : nullptr) {}

attribute_name& attribute_name::operator=(const attribute_name& other) {
    return *this = attribute_name(other);
}

LDIF_Values::LDIF_Values(const std::string& name, aes_key_data* key)
    : type_(getAttrType(name.empty() ? nullptr : name.c_str())), name_(name, *type_), key_(key) {}

LDIF_Values::LDIF_Values(const LDIF_Values& other)
    : values_(other.values_), type_(other.type_), name_(other.name_), key_(other.key_) {}

LDIF_Values& LDIF_Values::operator=(const LDIF_Values& other) {
    if (this == &other) {
        return *this;
    }
    const auto body = [&]() -> LDIF_Values& {
        clear();
        name_ = other.name_;
        type_ = other.type_;
        key_ = other.key_;
        for (const LDIF_Value& value : other.values_) {
            add(value.str());
        }
        return *this;
    };
    return with_boundary(in("LDIF_Values::operator ="), body,
                         [&](LDIF_Exception& e) { complete(e); });
}

LDIF_Values& LDIF_Values::operator+=(const std::string& text) {
    const auto body = [&]() -> LDIF_Values& {
        add(text);
        return *this;
    };
    return with_boundary(in("LDIF_Values::operator +="), body,
                         [&](LDIF_Exception& e) { complete(e, text); });
}

LDIF_Values& LDIF_Values::operator+=(const LDIF_Value& value) {
    const auto body = [&]() -> LDIF_Values& {
        add(value.str());
        return *this;
    };
    return with_boundary(in("LDIF_Values::operator +="), body,
                         [&](LDIF_Exception& e) { complete(e, value.text); });
}

LDIF_Values& LDIF_Values::operator+=(const LDIF_Values& other) {
    std::string text;
    const auto add_all = [&] {
        // Merged into itself, a list may grow (a DN may read back as another): up to its end of
        // before.
        size_t count = other.size();
        for (auto value = other.begin(); count > 0; ++value, --count) {
            text = value->str();
            add(text);
        }
    };
    const auto in_context = [&] {
        with_context(add_all, [&](LDIF_Exception& e) { complete(e, text); });
    };
    // KEPT: what nobody expected is reported with the first value, not with the one that failed.
    with_system_error(in("LDIF_Values::operator +="), in_context, [&](LDIF_Exception& e) {
        complete(e, other.empty() ? empty_str : other.values_.front().text);
    });
    return *this;
}

LDIF_Values& LDIF_Values::operator-=(const std::string& text) {
    const auto body = [&]() -> LDIF_Values& {
        const list::const_iterator value = find(text);
        if (value != values_.end()) {
            erase(value);
        }
        return *this;
    };
    return with_boundary(in("LDIF_Values::operator -="), body,
                         [&](LDIF_Exception& e) { complete(e, text); });
}

void LDIF_Values::complete(LDIF_Exception& e) const {
    e.attrType = type_;
    if (e.attribute.empty()) {
        e.attribute = name().text();
    }
}

void LDIF_Values::complete(LDIF_Exception& e, const std::string& text) const {
    complete(e);
    e.value = text;
}

void LDIF_Values::clear() {
    values_.clear();
    index_.reset();
}

/// Adds the text as a value, unless there is an equal one.
void LDIF_Values::add(const std::string& text) {
    list added;
    added.emplace_back(type_, text, key_);
    if (position_of(added.front()) != values_.end()) {
        return;
    }
    if (index_) {
        index_->emplace(hash_of(added.front()), added.begin());
    }
    values_.splice(values_.end(), added);
}

LDIF_Values::list::iterator LDIF_Values::find(const std::string& text) {
    return values_.empty() ? values_.end() : position_of(LDIF_Value(type_, text, key_));
}

LDIF_Values::list::const_iterator LDIF_Values::find(const std::string& text) const {
    return const_cast<LDIF_Values*>(this)->find(text);
}

LDIF_Values::list::const_iterator LDIF_Values::find(const LDIF_Value& value) const {
    return const_cast<LDIF_Values*>(this)->position_of(value);
}

LDIF_Values::list::const_iterator LDIF_Values::erase(list::const_iterator value) {
    forget(value);
    return values_.erase(value);
}

/// The first value that is equal by the syntax.
LDIF_Values::list::iterator LDIF_Values::position_of(const LDIF_Value& value) {
    if (values_.size() <= longest_scan) {
        return std::find_if(values_.begin(), values_.end(),
                            [&](const LDIF_Value& own) { return own.compare(value) == 0; });
    }
    if (!index_) {
        index_values();
    }
    const auto [first, last] = index_->equal_range(hash_of(value));
    for (auto entry = first; entry != last; ++entry) {
        if (entry->second->compare(value) == 0) {
            return entry->second;
        }
    }
    return values_.end();
}

void LDIF_Values::index_values() {
    auto index = std::make_unique<hash_index>();
    for (auto value = values_.begin(); value != values_.end(); ++value) {
        index->emplace(hash_of(*value), value);
    }
    index_ = std::move(index);
}

/// Takes a value out of the index.
void LDIF_Values::forget(list::const_iterator value) {
    if (!index_) {
        return;
    }
    const auto [first, last] = index_->equal_range(hash_of(*value));
    const auto is_value = [&](const auto& entry) { return entry.second == value; };
    index_->erase(std::find_if(first, last, is_value));
}

std::string LDIF_Values::str() const {
    std::string text;
    append_to(text);
    return text;
}

void LDIF_Values::append_to(std::string& out) const {
    for (const LDIF_Value& value : values_) {
        out.append(name().text()).append(": ").append(value.str()).append("\n");
    }
}
