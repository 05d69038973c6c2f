// cfg32 check: every problem of a file at once, without changing it.

#include <fmt/format.h>
#include <memory>

#include <algorithm>
#include <cctype>
#include <filesystem>
#include <optional>

#include "arguments.h"
#include "check/check_report.h"
#include "command.h"
#include "key.h"
#include "memory_file.h"
#include "outcome.h"
#include "terminal.h"

namespace cfg32::tool {

namespace {

void print(std::string_view text) { fwrite(text.data(), 1, text.size(), stdout); }

template <std::string (*report)(const std::vector<checked_file>&)>
void print_whole(const std::vector<checked_file>& files) {
    print([&] {
        const progress reporting("Putting the report together");
        return report(files);
    }());
}

void print_json(const std::vector<checked_file>& files) { json_report(files, print); }

struct arguments {
    std::vector<std::string> files;
    void (*print_report)(const std::vector<checked_file>&) = print_whole<text_report>;
};

/// ".cfg32-", 16 hexadecimal digits, ".tmp": what a backup is called until it is complete.
bool is_unfinished_copy(std::string_view name) {
    constexpr std::string_view front = ".cfg32-";
    constexpr std::string_view end = ".tmp";
    constexpr size_t digits = 16;
    if (name.size() != front.size() + digits + end.size() || !name.starts_with(front) ||
        !name.ends_with(end)) {
        return false;
    }
    const std::string_view number = name.substr(front.size(), digits);
    return std::all_of(number.begin(), number.end(), [](unsigned char c) { return isxdigit(c); });
}

/// A folder that can't be listed has none.
void add_unfinished_copies(const std::filesystem::path& folder, std::vector<std::string>& names) {
    std::error_code ignored;
    for (auto entry = std::filesystem::directory_iterator(folder.empty() ? "." : folder, ignored);
         entry != std::filesystem::directory_iterator(); entry.increment(ignored)) {
        if (is_unfinished_copy(entry->path().filename().native())) {
            names.push_back(folder / entry->path().filename());
        }
    }
}

/// The copies beside a file, and beside the one that a symbolic link names.
std::vector<problem> find_leftover_copies(const std::string& file_name) {
    const auto folder = std::filesystem::path(file_name).parent_path();
    std::error_code ignored;
    const auto real_folder = std::filesystem::canonical(file_name, ignored).parent_path();
    std::vector<std::string> names;
    add_unfinished_copies(folder, names);
    if (!std::filesystem::equivalent(folder.empty() ? "." : folder, real_folder, ignored)) {
        add_unfinished_copies(real_folder, names);
    }
    std::sort(names.begin(), names.end());
    std::vector<problem> found;
    for (const std::string& name : names) {
        problem each{};
        each.broken = &kind::leftover_copy;
        each.text = name +
                    " was left by a program that was killed: unless a backup is being made now, "
                    "remove it";
        each.line = each.column = each.width = 1;
        found.push_back(std::move(each));
    }
    return found;
}

/// Nothing for a file that can't be read, which is told.
std::optional<checked_file> checked(const std::string& name, aes_key_data* key) try {
    std::string text = read_configuration(name);
    const progress checking("Checking " + name);
    std::vector<problem> problems = find_leftover_copies(name);
    for (problem& each : find_problems(text, key)) {
        problems.push_back(std::move(each));
    }
    return checked_file{name, std::move(text), std::move(problems)};
} catch (const ended& end) {
    complain(end.what());
    return {};
}

int check(const settings& options, const arguments& given) {
    const key decoding_key(options);
    const std::vector<std::string> names =
        given.files.empty() ? std::vector{options.file_name()} : given.files;
    std::vector<checked_file> files;
    for (const std::string& name : names) {
        if (std::optional<checked_file> file = checked(name, decoding_key.get())) {
            files.push_back(std::move(*file));
        }
    }
    (options.is_json ? print_json : given.print_report)(files);
    if (files.size() < names.size()) {
        return failed;
    }
    const bool is_clean = std::all_of(
        files.begin(), files.end(), [](const checked_file& file) { return file.problems.empty(); });
    return is_clean ? done : answer_is_no;
}

}  // namespace

action define_check(CLI::App& parser, settings& options) {
    const auto given = std::make_shared<arguments>();
    add_argument(parser, "file", "FILE", "what to check; else the configuration file",
                 given->files);
    add_format(parser, "how to print the problems; else text", given->print_report,
               {{"text", print_whole<text_report>},
                {"json", print_json},
                {"sarif", print_whole<sarif_report>},
                {"github", print_whole<github_report>}});
    return [given, &options] { return check(options, *given); };
}

}  // namespace cfg32::tool
