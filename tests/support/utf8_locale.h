#pragma once

#include <gtest/gtest.h>
#include <langinfo.h>

#include <cstring>

namespace cfg32::tests {

inline bool locale_is_utf8() { return strcmp(nl_langinfo(CODESET), "UTF-8") == 0; }

}  // namespace cfg32::tests

/// For a test about text that only a UTF-8 locale has.
#define REQUIRE_UTF8()                                    \
    if (!cfg32::tests::locale_is_utf8()) {                \
        GTEST_SKIP() << "the locale's text is not UTF-8"; \
    }
