#pragma once

// What differs between a person at a terminal and a program in a pipe.

#include <fmt/color.h>

#include <condition_variable>
#include <mutex>
#include <string>
#include <string_view>
#include <thread>

#include "secret.h"
#include "settings.h"

namespace cfg32::tool {

/// The styles of everything that is coloured.
namespace style {
inline const auto error = fmt::fg(fmt::terminal_color::red) | fmt::emphasis::bold;
inline const auto warning = fmt::fg(fmt::terminal_color::magenta) | fmt::emphasis::bold;
inline const auto place = fmt::text_style(fmt::emphasis::bold);
inline const auto marker = fmt::fg(fmt::terminal_color::green) | fmt::emphasis::bold;
inline const auto added = fmt::text_style(fmt::fg(fmt::terminal_color::green));
inline const auto removed = fmt::text_style(fmt::fg(fmt::terminal_color::red));
inline const auto hunk = fmt::text_style(fmt::fg(fmt::terminal_color::cyan));
}  // namespace style

/// Decides once, from --color, NO_COLOR and what standard output and standard error are.
void choose_color(color_choice choice);

/// The text in that style, if the stream (stdout or stderr) is coloured.
std::string styled(std::FILE* stream, const fmt::text_style& style, std::string_view text);

/// The text with a "?" for each control character, but line feeds and tabs: what a file holds shall
/// not steer a terminal.
std::string printable(std::string_view text);

/// Prints "cfg32: " and the message on standard error.
void complain(std::string_view message);

/// Writes on standard error.
void tell(std::string_view text);

/// True when a person sees a question and can answer it.
bool can_be_asked();

/// Asks for a text without echo, at the terminal or, without one, on standard input.
secret ask_secret(const std::string& prompt);

/// Asks a question on standard error until a word that begins with one of the letters answers it on
/// standard input; NUL at the end of the input.
char ask(const std::string& question, std::string_view letters);

/// Tells on a terminal's standard error what is being done, once it takes longer than a second.
class progress {
  public:
    explicit progress(std::string what);
    progress(const progress&) = delete;
    progress& operator=(const progress&) = delete;
    ~progress();

  private:
    void show();

    std::string what_;
    std::mutex mutex_;
    std::condition_variable over_;
    bool is_over_ = false;
    std::thread thread_;
};

}  // namespace cfg32::tool
