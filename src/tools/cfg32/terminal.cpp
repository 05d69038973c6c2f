// What differs between a person at a terminal and a program in a pipe.

#include "terminal.h"

#include <bsd/readpassphrase.h>
#include <unistd.h>

#include <array>
#include <cctype>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <iostream>

#include "cfg32_platform.h"
#include "held_back_signals.h"
#include "hidden_passwords.h"
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

}  // namespace

void choose_color(color_choice choice) { chosen = choice; }

std::string styled(std::FILE* stream, const fmt::text_style& style, std::string_view text) {
    return is_coloured(stream) ? fmt::format(style, "{}", text) : std::string(text);
}

void complain(std::string_view message) {
    tell(fmt::format("{} {}\n", styled(stderr, style::error, "cfg32:"),
                     printable(shown_text(message))));
}

std::string printable(std::string_view text) {
    std::string shown;
    for (size_t i = 0; i < text.size(); ++i) {
        const auto byte = static_cast<unsigned char>(text[i]);
        const auto next = static_cast<unsigned char>(i + 1 < text.size() ? text[i + 1] : 0);
        const bool is_c1 = byte == 0xC2 && next >= 0x80 && next < 0xA0;  // in UTF-8
        i += is_c1 ? 1 : 0;
        const bool is_control = is_c1 || (byte != '\n' && byte != '\t' && iscntrl(byte));
        shown += is_control ? '?' : text[i];
    }
    return shown;
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
        const held_back_signals from_the_thread;
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
