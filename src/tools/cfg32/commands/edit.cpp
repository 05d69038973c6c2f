// cfg32 edit: edits the file or one entry in an editor, and checks before anything is written.

#include <fmt/format.h>

#include <CLI/CLI.hpp>
#include <algorithm>
#include <cstdlib>
#include <filesystem>
#include <optional>

#include "LDIF_Exception.h"
#include "LDIF_File.h"
#include "check/check_report.h"
#include "check/problem.h"
#include "command.h"
#include "diff/unified_diff.h"
#include "entry_text.h"
#include "memory_file.h"
#include "private_folder.h"
#include "terminal.h"

namespace cfg32::tool {

namespace {

/// What is edited: all of a file's text or a part of it.
class edited_text {
  public:
    edited_text(const std::string& file_name, const std::string& dn)
        : file_name_(file_name), before_(read_configuration(file_name)), end_(before_.size()) {
        if (!dn.empty()) {
            const entry_text place = find_entry_text(before_, dn);
            begin_ = place.begin;
            end_ = place.end;
            first_line_ = place.first_line;
        }
    }

    const std::string& before() const { return before_; }
    std::string part() const { return before_.substr(begin_, end_ - begin_); }
    std::string with(const std::string& draft) const;

    /// The problems of the part, counted from its first line; and whether the whole can be loaded.
    struct findings {
        std::vector<problem> problems;
        bool is_loadable;
    };
    findings check(const std::string& draft, aes_key_data* key) const;

  private:
    std::string file_name_;
    std::string before_;
    size_t begin_ = 0;
    size_t end_;
    int first_line_ = 1;
};

/// The whole text with the draft in the place of the part.
std::string edited_text::with(const std::string& draft) const {
    const std::string rest = before_.substr(end_);
    const bool runs_on = !draft.empty() && draft.back() != '\n' && !rest.empty();
    return before_.substr(0, begin_) + draft + (runs_on ? "\n" : "") + rest;
}

edited_text::findings edited_text::check(const std::string& draft, aes_key_data* key) const {
    findings found{find_problems(with(draft), key), true};
    const auto lines = static_cast<int>(std::count(draft.begin(), draft.end(), '\n'));
    const auto stops_load = [](const problem& each) {
        return each.broken->outcome == consequence::stops_load;
    };
    found.is_loadable = std::none_of(found.problems.begin(), found.problems.end(), stops_load);
    if (begin_ > 0 || end_ < before_.size()) {
        std::erase_if(found.problems, [&](problem& each) {
            each.line -= first_line_ - 1;
            return each.line < 1 || each.line > lines + 1;
        });
    }
    return found;
}

/// Runs the user's editor, as other programs do: its variable may hold arguments.
void run_editor(const std::string& path) {
    const char* visual = getenv("VISUAL");
    const char* editor = visual && *visual ? visual : getenv("EDITOR");
    setenv("CFG32_EDITED", path.c_str(), 1);
    const std::string command =
        std::string(editor && *editor ? editor : "vi") + " \"$CFG32_EDITED\"";
    if (system(command.c_str()) != 0) {
        throw ended(failed, "the editor failed: " + std::string(editor ? editor : "vi"));
    }
}

/// One edit: the editor, the check and the question, until it is written or dropped.
class session {
  public:
    session(const settings& options, const std::string& dn)
        : options_(options),
          file_name_(options.file_name()),
          key_(options),
          text_(file_name_, dn),
          path_(folder_.write(std::filesystem::path(file_name_).filename(), text_.part())) {}

    int run();

  private:
    enum choice { edit_again, write, drop };

    choice review(const std::string& draft);
    int finish(const std::string& draft);
    void keep_draft();

    const settings& options_;
    std::string file_name_;
    key key_;
    edited_text text_;
    private_folder folder_;
    std::string path_;
};

session::choice session::review(const std::string& draft) {
    const edited_text::findings found = text_.check(draft, key_.get());
    if (found.problems.empty() && found.is_loadable) {
        return write;
    }
    tell(text_report({{path_, draft, found.problems}}));
    if (!found.is_loadable) {
        complain("this can't be loaded, so it can't be written");
    }
    const char answer = found.is_loadable ? ask("(e)dit again, (w)rite or (d)rop?", "ewd")
                                          : ask("(e)dit again or (d)rop?", "ed");
    if (answer == '\0') {
        throw ended(failed, "nobody answered; nothing was written");
    }
    return answer == 'e' ? edit_again : answer == 'w' ? write : drop;
}

int session::finish(const std::string& draft) {
    const std::string after = text_.with(draft);
    if (after == text_.before()) {
        fmt::print("unchanged\n");
    } else if (options_.is_dry_run) {
        fmt::print("{}", unified_diff(text_.before(), after, file_name_));
    } else {
        LDIF_File::replace(file_name_, options_.backup_name(), after, text_.before());
    }
    return done;
}

int session::run() {
    try {
        for (;;) {
            run_editor(path_);
            const std::string draft = read_configuration(path_);
            const choice chosen = draft == text_.part() ? write : review(draft);
            if (chosen == write) {
                return finish(draft);
            }
            if (chosen == drop) {
                complain("dropped; nothing was written");
                return answer_is_no;
            }
        }
    } catch (...) {
        keep_draft();
        throw;
    }
}

/// Whatever went wrong, what was edited is not lost.
void session::keep_draft() {
    if (read_configuration(path_) != text_.part()) {
        folder_.keep();
        tell(fmt::format("what you edited is kept in {}\n", path_));
    }
}

}  // namespace

action define_edit(CLI::App& parser, settings& options) {
    const auto dn = std::make_shared<std::string>();
    parser.add_option("dn", *dn, "the entry to edit; else the whole file")->type_name("DN");
    parser.footer("The editor is the one that VISUAL or EDITOR names, else vi.");
    return [dn, &options] { return session(options, *dn).run(); };
}

}  // namespace cfg32::tool
