#pragma once

// The problems that were found so far.

#include <deque>
#include <string>
#include <vector>

#include "check/file_text.h"
#include "check/problem.h"

namespace cfg32::tool {

class findings {
  public:
    /// The problem stays where it is, to be completed.
    problem& add(const rule& broken, const place& where, std::string text);

    /// All of them by line and column.
    std::vector<problem> sorted();

  private:
    std::deque<problem> problems_;
};

inline problem& findings::add(const rule& broken, const place& where, std::string text) {
    problem found{};
    found.broken = &broken;
    found.text = std::move(text);
    found.line = where.line;
    found.column = where.column;
    found.width = where.width;
    return problems_.emplace_back(std::move(found));
}

}  // namespace cfg32::tool
