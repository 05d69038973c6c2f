#pragma once

#include <gtest/gtest.h>

#include <clocale>
#include <cstdlib>
#include <string>

#include "temporary_folder.h"

namespace cfg32::tests {

/// The process in a locale that a machine need not have: it is built for the time of the object.
class other_locale {
  public:
    /// As localedef(1) takes them: "tr_TR" and "ISO-8859-9".
    other_locale(const std::string& definition, const std::string& character_set)
        : before_(setlocale(LC_ALL, nullptr)) {
        const std::string name = "built";
        const std::string command = "localedef -i " + definition + " -f " + character_set + " " +
                                    folder_.file(name) + " >/dev/null 2>&1";
        // It also tells of warnings in its status; what counts is whether the locale is there.
        static_cast<void>(system(command.c_str()));
        setenv("LOCPATH", folder_.file("").c_str(), 1);
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
    const temporary_folder folder_;
    const std::string before_;
    bool is_there_ = false;
};

}  // namespace cfg32::tests
