// The syntax of passwords: encoded when they are set, decoded when they are compared, by the
// server's routines.

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <initializer_list>
#include <string_view>

#include "LDIF_AttrType.h"
#include "LDIF_AttrType.syntax.h"
#include "LDIF_Value.h"
#include "cfg32_platform.h"
#include "password.h"

using namespace cfg32;

namespace {

constexpr failure bad_length{21, 1018, ""};
constexpr failure not_encoded{83, 1000, "format_password();"};
constexpr failure left_not_decoded{84, 1000, "unformat_password(left);"};
constexpr failure right_not_decoded{84, 1000, "unformat_password(right);"};

constexpr int clear_text = 1;  // answer of check_format
constexpr long shortest = 1;
constexpr long longest = 1024;

/// Unlike other texts, a password is never unbounded.
length_bounds bounds_of(const _AttrType* type) {
    const long lower = type && type->minimum > 0 ? type->minimum : shortest;
    return {lower, type && type->maximum >= lower ? type->maximum : longest};
}

/// Throws for a password routine that failed. It may have lacked memory, or something else that is
/// not the text's fault either.
[[noreturn]] void routine_failed(const failure& kind, const LDIF_Value& value,
                                 const std::string& text, const throw_site& site = {},
                                 std::initializer_list<int> others = {}) {
    const bool is_of_system =
        errno == ENOMEM || std::find(others.begin(), others.end(), errno) != others.end();
    const int error = is_of_system ? errno : 0;
    const auto details = [&](LDIF_Exception& e) {
        e.sysErrno = error;
        e.value = text;
        e.attrType = value.attrType;
    };
    raise_with(kind, {}, details, site);
}

/// The clear text of a stored password, wiped and released at the end.
class decoded_password {
  public:
    decoded_password(const LDIF_Value& value, const failure& kind, const throw_site& site = {}) {
        const std::string stored = value.str();
        errno = 0;
        if (!stored.empty() && !unformat_password(decoder_input(stored).c_str(), &clear_, value.key,
                                                  CFG32_PASSWORD_FLAG)) {
            routine_failed(kind, value, stored, site);
        }
    }
    decoded_password(const decoded_password&) = delete;
    decoded_password& operator=(const decoded_password&) = delete;
    ~decoded_password() {
        if (clear_) {
            _slapd_utils_decode_buffer_free(&clear_);
        }
    }

    const char* clear() const { return clear_; }

  private:
    char* clear_ = nullptr;
};

int compare_clear(const char* left, const char* right) {
    if (!left || !right) {
        return static_cast<int>(left != nullptr) - static_cast<int>(right != nullptr);
    }
    return strcmp(left, right);
}

std::string encoded(const LDIF_Value& value, const std::string& clear, int length) {
    char buffer[longest] = {};
    errno = 0;
    if (!format_password(CFG32_PASSWORD_SELECTOR, CFG32_PASSWORD_FLAG, value.key, clear.c_str(),
                         length, buffer, sizeof buffer)) {
        // Without random numbers (getrandom(2); a sandbox may refuse them) none can be encoded.
        routine_failed(not_encoded, value, clear, {}, {EAGAIN, EIO, ENOSYS, EPERM});
    }
    return buffer;
}

}  // namespace

namespace cfg32 {

std::string decoder_input(const std::string& stored) {
    return stored.front() == '>' ? std::string(iMASK_BRACED, sizeof iMASK_BRACED) + stored : stored;
}

const match_support pw_match{nullptr,
                             [](const LDIF_Value& value, hash_kind) {
                                 // A list of several passwords holds only ones that can be decoded:
                                 // what fails here is a new one, which a comparison would have on
                                 // its right.
                                 const decoded_password password(value, right_not_decoded);
                                 return password.clear() ? hash_of_text(password.clear()) : 0;
                             },
                             nullptr};

}  // namespace cfg32

int pwCompare(const LDIF_Value& left, const LDIF_Value& right) {
    const auto body = [&] {
        const decoded_password l(left, left_not_decoded);
        const decoded_password r(right, right_not_decoded);
        return compare_clear(l.clear(), r.clear());
    };
    return with_system_error(in("pwCompare()"), body, no_details);
}

void pwFromStr(LDIF_Value& value, const given_text& given) {
    const auto body = [&] {
        const std::string text = given.str();
        const int length = static_cast<int>(strlen(text.c_str()));
        if (check_format(text.c_str(), length) != clear_text) {
            value.text = given;
            return;
        }
        const length_bounds bounds = bounds_of(value.attrType);
        if (!bounds.allow(static_cast<size_t>(length))) {
            char message[80];
            nuv_snprintf(message, sizeof message, "Password length must be %ld to %ld characters",
                         bounds.lower, bounds.upper);
            refuse_with_message(bad_length, message, value, text);
        }
        value.text = given_text(encoded(value, text, length));
    };
    with_system_error(in("pwFromStr()"), body, no_details);
}
