#pragma once

#include <memory>
#include <string>
#include <utility>

namespace cfg32::tool {

/// A text that stands in memory once, for all its copies.
class shared_text {
  public:
    shared_text() = default;
    explicit shared_text(std::string text)
        : text_(std::make_shared<const std::string>(std::move(text))) {}

    const std::string& str() const {
        static const std::string nothing;
        return text_ ? *text_ : nothing;
    }

  private:
    std::shared_ptr<const std::string> text_;
};

}  // namespace cfg32::tool
