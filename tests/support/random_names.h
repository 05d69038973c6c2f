#pragma once

#include <iterator>
#include <random>
#include <string>

namespace cfg32::tests {

/// Names of which few differ, so that they often meet in a tree.
class random_names {
  public:
    explicit random_names(unsigned seed) : random_(seed) {}

    unsigned below(unsigned count) { return static_cast<unsigned>(random_() % count); }

    std::string rdn() {
        static const char* const pool[] = {"cn=a", "CN=A", "cn=b", "o=a",       "ou=x",
                                           "OU=X", "cn=c", "sn=a", "cn=a+sn=b", "SN=B+cn=a"};
        return pool[below(std::size(pool))];
    }

    std::string dn(unsigned depth) {
        std::string text = rdn();
        while (--depth > 0) {
            text += "," + rdn();
        }
        return text;
    }

  private:
    std::mt19937 random_;
};

}  // namespace cfg32::tests
