#include "kept_text.h"

#include <bit>

namespace cfg32 {

kept_text::kept_text(const kept_text& other) {
    if (other.has_value()) {
        copy(other);
    }
}

void kept_text::copy(std::string_view text) {
    char* own = new char[text.size()];
    text.copy(own, text.size());
    set(own, text.size(), own_text);
}

void kept_text::append(const given_text& text) {
    if (!has_value()) {
        *this = kept_text(text);
        return;
    }
    const size_t total = size() + text.size();
    if (!is_own() && text.lasts() && data_ + size() == text.view().data()) {
        set(data_, total, 0);
        return;
    }
    const bool has_room = (size_and_flags_ & room) != 0 && total <= std::bit_ceil(size());
    char* own = has_room ? const_cast<char*>(data_) : new char[std::bit_ceil(total)];
    if (!has_room) {
        view().copy(own, size());
    }
    text.view().copy(own + size(), text.size());  // before the old text goes, which it may be of
    if (!has_room) {
        release();
    }
    set(own, total, own_text | room);
}

}  // namespace cfg32
