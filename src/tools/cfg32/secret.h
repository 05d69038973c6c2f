#pragma once

#include <string>
#include <string_view>

namespace cfg32::tool {

/// A text that is wiped when it goes.
class secret {
  public:
    secret() = default;
    explicit secret(std::string_view text) : text_(text) {}
    secret(const secret&) = delete;
    secret& operator=(const secret&) = delete;
    secret(secret&& other) noexcept;
    secret& operator=(secret&& other) noexcept;
    ~secret() { wipe(); }

    const char* c_str() const { return text_.c_str(); }
    std::string_view text() const { return text_; }
    bool empty() const { return text_.empty(); }

  private:
    void wipe();

    std::string text_;
};

/// Wipes a text's buffer and empties it.
void wipe(std::string& text);

}  // namespace cfg32::tool
