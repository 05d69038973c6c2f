#pragma once

// The problems that were found so far.

#include <deque>
#include <string>
#include <vector>

#include "check/file_text.h"
#include "check/problem.h"

class LDIF_Exception;

namespace cfg32::tool {

/// Gives a problem the codes of the failure that it causes.
void take_codes(problem& found, const LDIF_Exception& e);

/// By line and column.
void sort_by_place(std::vector<problem>& all);

class findings {
  public:
    /// The problem stays where it is, to be completed.
    problem& add(const rule& broken, const place& where, std::string text);

    std::deque<problem>& all() { return problems_; }
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
    found.result = broken.result;
    found.extended = broken.extended;
    return problems_.emplace_back(std::move(found));
}

}  // namespace cfg32::tool
