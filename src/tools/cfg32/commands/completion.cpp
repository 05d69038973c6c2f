// cfg32 completion: scripts that let a shell complete command lines. They ask the command itself
// what may stand at the end of a line, so that they can't differ from it.

#include <fmt/format.h>

#include <exception>
#include <iostream>
#include <iterator>
#include <memory>

#include "arguments.h"
#include "command.h"
#include "completion/completion_words.h"
#include "completion/shell_word.h"
#include "outcome.h"

namespace cfg32::tool {

namespace {

constexpr const char* bash_script =
    R"(# Completion of cfg32 for bash. Load it with: source <(cfg32 completion bash)

_cfg32() {
    local rest=${COMP_LINE:0:COMP_POINT} word kind i program
    local -a words=()
    # Bash splits words at the characters of COMP_WORDBREAKS, too, "=" among them: what has no blank
    # before it belongs to the word before.
    for ((i = 0; i <= COMP_CWORD; i++)); do
        word=${COMP_WORDS[i]}
        if ((i == 0)) || [[ -z $COMP_LINE || $rest == [[:space:]]* ]]; then
            words+=("")
            rest=${rest#"${rest%%[![:space:]]*}"}
        fi
        # The last word ends at the cursor.
        [[ -n $COMP_LINE && $i -eq $COMP_CWORD && $rest != "$word"* ]] && word=$rest
        words[-1]+=$word
        rest=${rest#"$word"}
    done
    # The program of the line answers, wherever it lies; for another name of it the one of PATH.
    program=${words[0]//[\"\'\\]/}
    program=${program/#'~/'/$HOME/}
    type -P -- "$program" >/dev/null || program=cfg32
    {
        read -r kind
        mapfile -t COMPREPLY
    } < <(printf '%s\0' "$COMP_WORDBREAKS" "${words[@]}" |
        command "$program" completion bash --candidates 2>/dev/null)
    if [[ $kind == files ]]; then
        compopt -o default 2>/dev/null
    fi
}

complete -F _cfg32 cfg32
)";

constexpr const char* zsh_script = R"(#compdef cfg32
# Completion of cfg32 for zsh. Save it as _cfg32 in a folder of $fpath, or after compinit load it
# with: source <(cfg32 completion zsh)

_cfg32() {
    local kind line program=${(Q)words[1]}
    local -a lines names descriptions
    # The program of the line answers, wherever it lies; for another name of it the one of PATH.
    program=${program/#'~/'/$HOME/}
    whence -p -- "$program" >/dev/null || program=cfg32
    lines=("${(@f)$(printf '%s\0' '' "${(@Q)words[1,CURRENT-1]}" "${(Q)PREFIX}" |
        command "$program" completion zsh --candidates 2>/dev/null)}")
    kind=$lines[1]
    shift lines
    if [[ $kind == files ]]; then
        # The file is what follows the option.
        [[ $PREFIX == --*=* ]] && compset -P 1 '*='
        _files
        return
    fi
    for line in "${lines[@]}"; do
        names+=("${line%%$'\t'*}")
        descriptions+=("${line/$'\t'/  -- }")
    done
    compadd -l -d descriptions -a names
}

if [[ $funcstack[1] == _cfg32 ]]; then
    _cfg32 "$@"
else
    compdef _cfg32 cfg32
fi
)";

constexpr const char* fish_script =
    R"(# Completion of cfg32 for fish. Load it with: cfg32 completion fish | source

function __cfg32_candidates
    set -l current (commandline -ct)
    set -l words (commandline -opc)
    # The program of the line answers, wherever it lies; for another name of it the one of PATH.
    set -l program (string replace -r '^~/' "$HOME/" -- $words[1])
    command -sq -- $program; or set program cfg32
    set -l lines (printf '%s\0' '' $words "$current" |
        command $program completion fish --candidates 2>/dev/null)
    if test "$lines[1]" = files
        # The file is what follows the option.
        set -l option (string match -r -- '^--[^=]*=' $current)
        for path in (__fish_complete_path (string replace -- "$option" '' $current))
            printf '%s%s\n' "$option" $path
        end
        return
    end
    set -e lines[1]
    string join \n -- $lines
end

complete -c cfg32 -f -a '(__cfg32_candidates)'
)";

struct shell {
    const char* name;
    const char* script;
};

constexpr shell shells[] = {{"bash", bash_script}, {"zsh", zsh_script}, {"fish", fish_script}};

int print_script(const std::string& name) {
    for (const shell& each : shells) {
        if (name == each.name) {
            fmt::print("{}", each.script);
        }
    }
    return done;
}

/// The texts of standard input, each ended by NUL.
std::vector<std::string> given_texts() {
    std::vector<std::string> texts;
    for (std::string text; std::getline(std::cin, text, '\0');) {
        texts.push_back(text);
    }
    return texts;
}

/// For bash, which neither takes quotes off nor puts them on: what replaces the end of the word.
void print_for_bash(const completion_words& found, const typed_word& last) {
    for (const candidate& word : found.words) {
        if (word.text.starts_with(last.text)) {
            const std::string_view end = std::string_view(word.text).substr(last.kept.size());
            fmt::print("{}\n", quoted_for_shell(end, last.quote));
        }
    }
}

void print_described(const completion_words& found) {
    for (const candidate& word : found.words) {
        fmt::print("{}{}{}\n", word.text, word.description.empty() ? "" : "\t", word.description);
    }
}

/// Prints what the shell's script reads: "files" or "words", and below it the words. Standard input
/// has the characters at which the shell breaks words, and the words of the line up to the cursor.
void print_candidates(const CLI::App& program, const std::string& shell_name) {
    std::vector<std::string> words = given_texts();
    if (words.empty()) {
        return;
    }
    const std::string breaks = words.front();
    words.erase(words.begin());
    typed_word last;
    if (shell_name == "bash") {
        for (std::string& word : words) {
            last = read_typed_word(word, breaks);
            word = last.text;
        }
    }
    const completion_words found = complete(program, words);
    fmt::print("{}\n", found.are_files ? "files" : "words");
    shell_name == "bash" ? print_for_bash(found, last) : print_described(found);
}

/// A failure must not stand in the line that is being typed.
int try_candidates(const CLI::App& program, const std::string& shell_name) {
    try {
        print_candidates(program, shell_name);
    } catch (const std::exception&) {
        return failed;
    }
    return done;
}

}  // namespace

action define_completion(CLI::App& parser, settings&) {
    const auto name = std::make_shared<std::string>();
    const auto asks = std::make_shared<bool>(false);
    add_choice(parser, "shell", "the shell that reads the script", *name,
               {{"bash", "bash"}, {"zsh", "zsh"}, {"fish", "fish"}}, presence::required);
    add_flag(parser, "--candidates", "", *asks);  // for the scripts alone: not in the help
    return [&parser, name, asks] {
        return *asks ? try_candidates(program_of(parser), *name) : print_script(*name);
    };
}

}  // namespace cfg32::tool
