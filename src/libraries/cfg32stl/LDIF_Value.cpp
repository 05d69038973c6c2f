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

}  // namespace

LDIF_Value::LDIF_Value(const _AttrType* type, const char* text, aes_key_data* key)
    : attrType(type), key(key) {
    text ? check(text) : raise_with(no_text, {}, [&](LDIF_Exception& e) { e.attrType = type; });
}

LDIF_Value::LDIF_Value(const _AttrType* type, const given_text& text, aes_key_data* key)
    : attrType(type), key(key) {
    check(text);
}

void LDIF_Value::check(const given_text& given) {
    const auto details = [&](LDIF_Exception& e) {
        e.value = given.str();
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

LDIF_Value LDIF_Value::stored(const _AttrType* type, std::string_view text, aes_key_data* key) {
    LDIF_Value value(type, key);
    value.text = given_text::lasting(text);
    complete(value);
    return value;
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
        e.value = text.str();
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

bool binary_form::assign(const void* bytes, size_t length) {
    reset();
    if (length <= sizeof *number_) {
        memcpy(number_.emplace().data(), bytes, length);
        return true;
    }
    bytes_.reset(static_cast<char*>(malloc(length)));
    if (bytes_) {
        memcpy(bytes_.get(), bytes, length);
    }
    return static_cast<bool>(bytes_);
}

void LDIF_Value::set_binary(const void* bytes, int length) {
    binary.reset();
    binaryLength = 0;
    if (length == 0) {
        return;
    }
    if (!binary.assign(bytes, static_cast<size_t>(length))) {
        raise_with(no_buffer, {}, [&](LDIF_Exception& e) {
            e.sysErrno = ENOMEM;
            e.value = text.str();
            e.attrType = attrType;
        });
    }
    binaryLength = length;
}

std::string LDIF_Value::str() const {
    if (!attrType || !attrType->toStr) {
        raise(no_to_str);
    }
    return attrType->toStr(*this);
}

// Every syntax shows what it stores.
std::string_view LDIF_Value::shown() const {
    if (!attrType || !attrType->toStr) {
        raise(no_to_str);
    }
    return text;
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

LDIF_Values::LDIF_Values(const LDIF_Values& other)
    : name_(other.name_), key_(other.key_), first_(other.first_) {
    if (!other.several_) {
        return;
    }
    several_ = std::make_unique<several>();
    several_->texts.assign(other.texts().begin(), other.texts().end());
    if (!other.several_->dns) {
        return;
    }
    several_->dns = std::make_unique<dn_map>();
    for (size_t i = 0; i < size(); ++i) {
        const auto dn = other.several_->dns->find(other.texts()[i].view().data());
        if (dn != other.several_->dns->end()) {
            several_->dns->emplace(texts()[i].view().data(), dn->second);
        }
    }
}

LDIF_Values& LDIF_Values::operator=(const LDIF_Values& other) {
    if (this == &other) {
        return *this;
    }
    const auto body = [&]() -> LDIF_Values& {
        clear();
        name_ = other.name_;
        key_ = other.key_;
        for (const LDIF_Value& value : other) {
            add(value.str());
        }
        return *this;
    };
    return with_boundary(in("LDIF_Values::operator ="), body,
                         [&](LDIF_Exception& e) { complete(e); });
}

LDIF_Values& LDIF_Values::operator+=(const given_text& text) {
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

LDIF_Values& LDIF_Values::merge(const LDIF_Values& other, bool takes_over) {
    std::string_view text;
    const auto add_all = [&] {
        // Merged into itself, a list may grow: up to its end of before.
        const size_t count = other.size();
        for (size_t i = 0; i < count; ++i) {
            const given_text given = other.texts()[i].given();
            text = given;
            // A text that was kept as it was given has passed the syntax already.
            takes_over&& given.lasts() ? add_stored(given) : add(given_text(text));
        }
    };
    const auto in_context = [&] {
        with_context(add_all, [&](LDIF_Exception& e) { complete(e, text); });
    };
    // KEPT: what nobody expected is reported with the first value, not with the one that failed.
    with_system_error(in("LDIF_Values::operator +="), in_context, [&](LDIF_Exception& e) {
        complete(e, other.empty() ? empty_str : other.texts().front().view());
    });
    return *this;
}

LDIF_Values& LDIF_Values::operator-=(const std::string& text) {
    const auto body = [&]() -> LDIF_Values& {
        const const_iterator value = find(text);
        if (value != end()) {
            remove(value.position_);
        }
        if (several_ && several_->gaps > size()) {
            several_->close_gaps();
        }
        return *this;
    };
    return with_boundary(in("LDIF_Values::operator -="), body,
                         [&](LDIF_Exception& e) { complete(e, text); });
}

void LDIF_Values::complete(LDIF_Exception& e) const {
    e.attrType = type();
    if (e.attribute.empty()) {
        e.attribute = name().text();
    }
}

void LDIF_Values::complete(LDIF_Exception& e, std::string_view text) const {
    complete(e);
    e.value = text;
}

void LDIF_Values::clear() {
    first_ = {};
    several_.reset();
}

LDIF_Value LDIF_Values::value_of(std::string_view text) const {
    LDIF_Value value = LDIF_Value::stored(type(), text, key_);
    if (several_ && several_->dns) {
        const auto dn = several_->dns->find(text.data());
        value.dn = dn == several_->dns->end() ? nullptr : std::make_unique<LDIF_DN>(dn->second);
    }
    return value;
}

LDIF_Values::several& LDIF_Values::more_than_a_text() {
    if (!several_) {
        auto all = std::make_unique<several>();
        all->texts.reserve(2);
        if (first_.has_value()) {
            all->texts.push_back(std::move(first_));
        }
        several_ = std::move(all);
    }
    return *several_;
}

void LDIF_Values::add_stored(const given_text& text) {
    if (empty() && !several_) {
        first_ = text;
        return;
    }
    LDIF_Value value = LDIF_Value::stored(type(), text, key_);
    value.text = text;
    append(std::move(value));
}

/// Adds the text as a value, unless there is an equal one.
void LDIF_Values::add(const given_text& text) { append(LDIF_Value(type(), text, key_)); }

void LDIF_Values::append(LDIF_Value&& value) {
    if (!empty() && position_of(value) != texts_and_gaps().size()) {
        return;
    }
    if (empty() && !several_ && !value.dn) {
        first_ = std::move(value.text);
        return;
    }
    // Whatever may fail comes before the first change.
    several& all = more_than_a_text();
    if (all.texts.size() == all.texts.capacity()) {
        all.texts.reserve(2 * all.texts.size());
    }
    dn_map dn;
    if (value.dn) {
        dn.emplace(value.text.view().data(), *value.dn);
        all.dns = all.dns ? std::move(all.dns) : std::make_unique<dn_map>();
    }
    if (hash_index* index = all.good_index()) {
        index->positions.emplace(hash_of(value, index->kind), all.texts.size());
    }
    if (value.dn) {
        all.dns->merge(dn);
    }
    all.texts.push_back(std::move(value.text));
}

LDIF_Values::const_iterator LDIF_Values::find(const std::string& text) const {
    return empty() ? end() : find(LDIF_Value(type(), text, key_));
}

LDIF_Values::const_iterator LDIF_Values::find(const LDIF_Value& value) const {
    return {this, position_of(value)};
}

LDIF_Values::const_iterator LDIF_Values::erase(const const_iterator& value) {
    remove(value.position_);
    return {this, value.position_ + 1};
}

/// Removes a value. It leaves a gap: to close that at once would make it slow to remove many.
void LDIF_Values::remove(size_t position) {
    if (!several_) {
        first_ = {};
        return;
    }
    kept_text& erased = several_->texts[position];
    forget(position);
    if (several_->dns) {
        several_->dns->erase(erased.view().data());
    }
    erased = {};
    ++several_->gaps;
}

void LDIF_Values::several::close_gaps() {
    std::erase_if(texts, [](const kept_text& text) { return !text.has_value(); });
    gaps = 0;
    index.reset();
}

/// The index, if there is one that fits the locale.
LDIF_Values::hash_index* LDIF_Values::several::good_index() {
    if (index && index->kind != present_hash_kind()) {
        index.reset();
    }
    return index.get();
}

/// Where the first value stands that is equal by the syntax; the end for none.
size_t LDIF_Values::position_of(const LDIF_Value& value) const {
    if (size() > longest_scan) {
        return indexed_position_of(value);
    }
    equal_texts* const equal = value.attrType == type() ? equal_texts_of(*type()) : nullptr;
    const auto is_equal = [&](const kept_text& own) {
        return own.has_value() &&
               (equal ? equal(own, value.text) : value_of(own).compare(value) == 0);
    };
    // Gaps stay: who holds a place of the list may look for another.
    const std::span<const kept_text> all = texts_and_gaps();
    return static_cast<size_t>(std::ranges::find_if(all, is_equal) - all.begin());
}

size_t LDIF_Values::indexed_position_of(const LDIF_Value& value) const {
    const hash_index& known = index();
    const auto [first, last] = known.positions.equal_range(hash_of(value, known.kind));
    const auto is_equal = [&](const auto& entry) {
        const kept_text& own = several_->texts[entry.second];
        return own.has_value() && value_of(own).compare(value) == 0;
    };
    const auto entry = std::find_if(first, last, is_equal);
    return entry == last ? several_->texts.size() : entry->second;
}

/// The index, which is made when it is first asked for.
const LDIF_Values::hash_index& LDIF_Values::index() const {
    if (!several_->good_index()) {
        auto index = std::make_unique<hash_index>();
        const std::span<const kept_text> all = texts_and_gaps();
        for (size_t position = 0; position < all.size(); ++position) {
            if (all[position].has_value()) {
                index->positions.emplace(hash_of(value_of(all[position]), index->kind), position);
            }
        }
        several_->index = std::move(index);
    }
    return *several_->index;
}

/// Takes a value out of the index.
void LDIF_Values::forget(size_t position) {
    hash_index* const index = several_->good_index();
    if (!index) {
        return;
    }
    const size_t hash = hash_of(value_of(several_->texts[position]), index->kind);
    const auto [first, last] = index->positions.equal_range(hash);
    const auto is_it = [&](const auto& entry) { return entry.second == position; };
    const auto entry = std::find_if(first, last, is_it);
    // Another locale may hash its DN otherwise: then its row stays, and leads to a gap.
    if (entry != last) {
        index->positions.erase(entry);
    }
}

std::string LDIF_Values::str() const {
    std::string text;
    append_to(text);
    return text;
}

void LDIF_Values::append_to(std::string& out) const {
    for (const kept_text& text : texts()) {
        out.append(name().text()).append(": ").append(text).append("\n");
    }
}
