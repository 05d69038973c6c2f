#pragma once

// Texts that are kept in great numbers. A store is mostly made of them: instead of copying each
// name, value and comment it keeps the text of its file, and lets them stand there.

#include <cstddef>
#include <ostream>
#include <string>
#include <string_view>
#include <utility>

namespace cfg32 {

/// A text on its way to somebody who may keep it. It lasts if it stands in memory that outlives
/// whoever keeps it; of any other text a copy is kept.
class given_text {
  public:
    given_text() = default;
    given_text(std::string_view text) : text_(text) {}
    given_text(const std::string& text) : text_(text) {}
    given_text(const char* text) : text_(text) {}

    static given_text lasting(std::string_view text) {
        given_text given(text);
        given.lasts_ = true;
        return given;
    }

    std::string_view view() const { return text_; }
    operator std::string_view() const { return text_; }
    std::string str() const { return std::string(text_); }
    bool lasts() const { return lasts_; }
    bool empty() const { return text_.empty(); }
    size_t size() const { return text_.size(); }

    /// A part of the text, which lasts as long.
    given_text part(std::string_view part) const {
        return lasts_ ? lasting(part) : given_text(part);
    }

  private:
    std::string_view text_;
    bool lasts_ = false;
};

/// A text in sixteen bytes: one of its own, or one that lasts. A copy always has its own.
class kept_text {
  public:
    /// No text, which is not the same as an empty one.
    kept_text() = default;
    kept_text(const given_text& text);
    kept_text(const kept_text& other);
    kept_text(kept_text&& other) noexcept { take(other); }
    kept_text& operator=(const kept_text& other) { return *this = kept_text(other); }
    kept_text& operator=(kept_text&& other) noexcept;
    ~kept_text() { release(); }

    bool has_value() const { return data_; }
    std::string_view view() const { return {data_, size()}; }
    /// For somebody who takes it over, and what it stands in.
    given_text given() const { return is_own() ? given_text(view()) : given_text::lasting(view()); }
    operator std::string_view() const { return view(); }
    std::string str() const { return std::string(view()); }
    bool empty() const { return size() == 0; }
    size_t size() const { return size_and_flags_ >> flag_bits; }

    /// What stands behind the kept text in memory, and lasts like it, is not copied.
    void append(const given_text& text);
    /// Drops so many characters at the end.
    void remove_suffix(size_t count) { size_and_flags_ -= count << flag_bits; }

  private:
    // In the lowest bits of the size.
    static constexpr size_t own_text = 1;
    static constexpr size_t room = 2;  // of its own, for as much as the next power of two
    static constexpr int flag_bits = 2;

    bool is_own() const { return (size_and_flags_ & own_text) != 0; }
    void set(const char* data, size_t size, size_t flags) {
        data_ = data;
        size_and_flags_ = size << flag_bits | flags;
    }
    void copy(std::string_view text);
    void take(kept_text& other) noexcept;
    void release() noexcept;

    const char* data_ = nullptr;
    size_t size_and_flags_ = 0;
};
static_assert(sizeof(kept_text) == 16);

inline bool operator==(const kept_text& left, std::string_view right) {
    return left.view() == right;
}

inline std::ostream& operator<<(std::ostream& out, const kept_text& text) {
    return out << text.view();
}

inline kept_text::kept_text(const given_text& text) {
    if (text.lasts()) {
        set(text.view().data(), text.size(), 0);
    } else {
        copy(text);
    }
}

inline kept_text& kept_text::operator=(kept_text&& other) noexcept {
    if (this != &other) {
        release();
        take(other);
    }
    return *this;
}

inline void kept_text::take(kept_text& other) noexcept {
    data_ = std::exchange(other.data_, nullptr);
    size_and_flags_ = std::exchange(other.size_and_flags_, 0);
}

inline void kept_text::release() noexcept {
    if (is_own()) {
        delete[] data_;
    }
}

}  // namespace cfg32
