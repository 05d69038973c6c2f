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

/// True for the attributes whose values are passwords.
bool is_password_attribute(std::string_view name);

/// What takes the place of text that is not to be seen.
inline constexpr std::string_view hidden_text = "********";

/// A value as people and programs may see it: of a password that is in clear, or only masked,
/// nothing but the hidden text; of an encrypted or hashed one what is stored.
std::string shown_value(std::string_view attribute, std::string_view value);

/// The same for a line of a file, also for one without a colon and for a kept unusable line.
std::string shown_line(std::string_view line);

}  // namespace cfg32::tool
