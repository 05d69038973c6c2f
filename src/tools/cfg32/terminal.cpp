// What differs between a person at a terminal and a program in a pipe.

#include "terminal.h"

#include <bsd/readpassphrase.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cctype>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <iostream>

#include "cfg32_platform.h"
#include "outcome.h"

namespace cfg32::tool {

namespace {

using namespace std::chrono_literals;

color_choice chosen = color_choice::automatic;

/// NO_COLOR says the same as --color=never, which an explicit --color=always overrides.
bool is_coloured(std::FILE* stream) {
    if (chosen != color_choice::automatic) {
        return chosen == color_choice::always;
    }
    const char* no_color = getenv("NO_COLOR");
    const char* terminal = getenv("TERM");
    return isatty(fileno(stream)) && !(no_color && *no_color) &&
           !(terminal && std::string_view(terminal) == "dumb");
}

/// From when on, and how often, it is said what is being done.
constexpr auto patience = 1s;

/// Names and values that a message quotes shall not steer the terminal.
std::string without_controls(std::string_view message) {
    std::string text(message);
    const auto is_control = [](unsigned char c) { return c != '\n' && iscntrl(c); };
    std::replace_if(text.begin(), text.end(), is_control, '?');
    return text;
}

}  // namespace

void choose_color(color_choice choice) { chosen = choice; }

std::string styled(std::FILE* stream, const fmt::text_style& style, std::string_view text) {
    return is_coloured(stream) ? fmt::format(style, "{}", text) : std::string(text);
}

void complain(std::string_view message) {
    tell(fmt::format("{} {}\n", styled(stderr, style::error, "cfg32:"), without_controls(message)));
}

void tell(std::string_view text) {
    // Where nobody listens there is nobody to tell that.
    [[maybe_unused]] const size_t written = fwrite(text.data(), 1, text.size(), stderr);
}

bool can_be_asked() { return isatty(STDIN_FILENO) && isatty(STDERR_FILENO); }

secret ask_secret(const std::string& prompt) {
    std::array<char, CFG32_PASSWORD_MAX + 2> buffer{};
    const bool is_given = readpassphrase(prompt.c_str(), buffer.data(), buffer.size(), 0);
    secret text(is_given ? std::string_view(buffer.data()) : std::string_view());
    explicit_bzero(buffer.data(), buffer.size());
    if (!is_given) {
        throw ended(failed, "no password was given");
    }
    return text;
}

char ask(const std::string& question, std::string_view letters) {
    for (;;) {
        tell(fmt::format("{} ", question));
        fflush(stderr);
        std::string answer;
        if (!std::getline(std::cin, answer)) {
            tell("\n");
            return '\0';
        }
        const char letter = static_cast<char>(tolower(static_cast<unsigned char>(answer[0])));
        if (letters.find(letter) != std::string_view::npos) {
            return letter;
        }
    }
}

progress::progress(std::string what) : what_(std::move(what)) {
    if (isatty(STDERR_FILENO)) {
        thread_ = std::thread([this] { show(); });
    }
}

progress::~progress() {
    if (thread_.joinable()) {
        {
            const std::scoped_lock lock(mutex_);
            is_over_ = true;
        }
        over_.notify_one();
        thread_.join();
    }
}

void progress::show() {
    std::unique_lock lock(mutex_);
    int seconds = 0;
    while (!over_.wait_for(lock, patience, [this] { return is_over_; })) {
        tell(fmt::format("\r{} ... {} s", what_, ++seconds));
        fflush(stderr);
    }
    if (seconds > 0) {
        tell("\r\033[K");  // the line is for the result
        fflush(stderr);
    }
}

}  // namespace cfg32::tool
