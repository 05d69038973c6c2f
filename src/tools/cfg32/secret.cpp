// Texts that nobody else is to see.

#include "secret.h"

#include <sodium.h>

#include <utility>

namespace cfg32::tool {

void wipe(std::string& text) {
    sodium_memzero(text.data(), text.capacity());
    text.clear();
}

void secret::wipe() { tool::wipe(text_); }

secret::secret(secret&& other) noexcept { *this = std::move(other); }

secret& secret::operator=(secret&& other) noexcept {
    if (this != &other) {
        wipe();
        // A copy: moving a short text would leave it behind.
        text_ = other.text_;
        other.wipe();
    }
    return *this;
}

}  // namespace cfg32::tool
