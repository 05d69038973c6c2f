#pragma once

#include <string>
#include <vector>

#include "check/problem.h"

namespace cfg32::tool {

/// What is edited: all of a configuration file's text, or one entry of it.
class edited_text {
  public:
    /// An empty dn means the whole file.
    edited_text(const std::string& file_name, const std::string& dn);

    /// The file's text when editing began.
    const std::string& before() const { return before_; }
    /// What the editor is given.
    std::string part() const { return before_.substr(begin_, end_ - begin_); }
    /// The whole text with the draft in the place of the part.
    std::string with(const std::string& draft) const;

    /// The problems that a person should look at before a draft is written.
    struct findings {
        std::vector<problem> in_draft;   ///< their lines are those of the draft
        std::vector<problem> elsewhere;  ///< new ones, and those that stop a load, by the file's
        bool is_loadable;                ///< the whole text with the draft
    };
    findings check(const std::string& draft, aes_key_data* key) const;

  private:
    std::string before_;
    size_t begin_ = 0;
    size_t end_;
    int first_line_ = 1;
};

}  // namespace cfg32::tool
