// Fills the list of all attributes into the source of a manual page, from standard input to
// standard output.

#include <fmt/format.h>

#include <iostream>
#include <string>
#include <string_view>

#include "LDIF_AttrType.h"
#include "schema/attribute_words.h"

using namespace cfg32::tool;

namespace {

constexpr std::string_view place = "@ATTRIBUTES@";

/// Text in which scdoc finds no markup.
std::string escaped(std::string_view text) {
    std::string out;
    for (const char c : text) {
        out.append(std::string_view("*_\\").find(c) == std::string_view::npos ? "" : "\\") += c;
    }
    return out;
}

void print_attributes() {
    for (const _AttrType* row : all_attributes()) {
        fmt::print("*{}*\n\t{}; {}.++\nExample: {}\n\n", escaped(row->name),
                   escaped(accepted_values(*row)), row->isSingle ? "one value" : "several values",
                   escaped(example_value(*row)));
    }
}

}  // namespace

int main() {
    for (std::string line; std::getline(std::cin, line);) {
        line == place ? print_attributes() : fmt::print("{}\n", line);
    }
    return fflush(stdout) == 0 ? 0 : 1;
}
