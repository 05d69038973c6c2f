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
    data_ = own;
    set_size(text.size());
    is_own_ = true;
}

void kept_text::append(const given_text& text) {
    if (!has_value()) {
        *this = kept_text(text);
        return;
    }
    const size_t size = size_ + text.size();
    if (!is_own_ && text.lasts() && data_ + size_ == text.view().data()) {
        set_size(size);
        return;
    }
    if (!has_room_ || size > std::bit_ceil(size_t{size_})) {
        char* own = new char[std::bit_ceil(size)];
        view().copy(own, size_);
        text.view().copy(own + size_, text.size());
        release();
        data_ = own;
        is_own_ = has_room_ = true;
    } else {
        text.view().copy(const_cast<char*>(data_) + size_, text.size());
    }
    set_size(size);
}

}  // namespace cfg32
