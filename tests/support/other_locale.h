#pragma once

#include <gtest/gtest.h>

#include <clocale>
#include <cstdlib>
#include <string>

namespace cfg32::tests {

/// The process in a locale that a machine need not have. CFG32_LOCALES is the folder that they are
/// built in before the tests.
class other_locale {
  public:
    explicit other_locale(const std::string& name) : before_(setlocale(LC_ALL, nullptr)) {
        setenv("LOCPATH", CFG32_LOCALES, 1);
        is_there_ = setlocale(LC_ALL, name.c_str()) != nullptr;
    }
    other_locale(const other_locale&) = delete;
    other_locale& operator=(const other_locale&) = delete;
    ~other_locale() {
        unsetenv("LOCPATH");
        setlocale(LC_ALL, before_.c_str());
    }

    bool is_there() const { return is_there_; }

  private:
    const std::string before_;
    bool is_there_ = false;
};

}  // namespace cfg32::tests
