// cfg32 edit: edits the file or one entry in an editor, and checks before anything is written.

#include <fmt/format.h>
#include <unistd.h>

#include <array>
#include <climits>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <memory>

#include "arguments.h"
#include "check/check_report.h"
#include "command.h"
#include "configuration.h"
#include "diff/unified_diff.h"
#include "edited_text.h"
#include "private_folder.h"
#include "terminal.h"
#include "whole_file.h"

namespace cfg32::tool {

namespace {

/// Runs the user's editor, as other programs do: its variable may hold arguments.
void run_editor(const std::string& path) {
    const char* visual = getenv("VISUAL");
    const char* editor = visual && *visual ? visual : getenv("EDITOR");
    setenv("CFG32_EDITED", path.c_str(), 1);
    const std::string name = editor && *editor ? editor : "vi";
    if (system((name + " \"$CFG32_EDITED\"").c_str()) != 0) {
        throw ended(failed, "the editor failed: " + name + " (VISUAL or EDITOR names another)");
    }
}

/// Tells where the draft is when a signal ends the program, as long as there is one.
class draft_keeper {
  public:
    explicit draft_keeper(const std::string& path) {
        snprintf(message, sizeof message, "\nwhat you edited is kept in %s\n", path.c_str());
        struct sigaction action {};
        action.sa_handler = tell_and_end;
        action.sa_flags = static_cast<int>(SA_RESETHAND);
        for (size_t i = 0; i < ending.size(); ++i) {
            sigaction(ending[i], &action, &before_[i]);
            if (before_[i].sa_handler == SIG_IGN) {
                sigaction(ending[i], &before_[i], nullptr);
            }
        }
    }
    draft_keeper(const draft_keeper&) = delete;
    draft_keeper& operator=(const draft_keeper&) = delete;
    ~draft_keeper() {
        for (size_t i = 0; i < ending.size(); ++i) {
            sigaction(ending[i], &before_[i], nullptr);
        }
    }

  private:
    static constexpr std::array ending = {SIGHUP,  SIGINT,  SIGQUIT, SIGPIPE, SIGALRM,
                                          SIGTERM, SIGUSR1, SIGUSR2, SIGXCPU};

    static void tell_and_end(int signal) {
        [[maybe_unused]] const ssize_t written = ::write(STDERR_FILENO, message, strlen(message));
        raise(signal);
    }

    static inline char message[PATH_MAX + 64];

    std::array<struct sigaction, ending.size()> before_{};
};

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
    bool is_unedited() const;

    const settings& options_;
    std::string file_name_;
    key key_;
    edited_text text_;
    private_folder folder_;
    std::string path_;
};

session::choice session::review(const std::string& draft) {
    const edited_text::findings found = text_.check(draft, key_.get());
    if (found.in_draft.empty() && found.elsewhere.empty()) {
        return write;
    }
    if (!found.in_draft.empty()) {
        tell(text_report({{path_, draft, found.in_draft}}));
    }
    if (!found.elsewhere.empty()) {
        tell(text_report({{file_name_, text_.before(), found.elsewhere}}));
    }
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
        if (fflush(stdout) != 0) {  // while the draft is there
            throw ended(failed, "what would change can't be shown");
        }
    } else {
        replace_file(file_name_, options_.backup_name(), after, text_.before());
    }
    return done;
}

int session::run() {
    const draft_keeper keeper(path_);
    try {
        for (;;) {
            run_editor(path_);
            const std::string draft = read_without_waiting(path_);
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
    if (!is_unedited()) {
        folder_.keep();
        std::error_code ignored;
        tell(fmt::format(
            "what you edited is kept in {}\n",
            std::filesystem::exists(path_, ignored) ? path_ : path_.substr(0, path_.rfind('/'))));
    }
}

bool session::is_unedited() const {
    try {
        return read_without_waiting(path_) == text_.part();
    } catch (const ended&) {  // an editor may have moved or locked it
        return false;
    }
}

}  // namespace

action define_edit(CLI::App& parser, settings& options) {
    const auto dn = std::make_shared<std::string>();
    add_argument(parser, "dn", "DN", "the entry to edit; else the whole file", *dn);
    add_footer(parser, "The editor is the one that VISUAL or EDITOR names, else vi.");
    return [dn, &options] {
        require_bind(options, options.file_name());
        return session(options, *dn).run();
    };
}

}  // namespace cfg32::tool
