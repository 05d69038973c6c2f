#pragma once

// For the definitions of system calls: how each is noted, and passed on or not.

#include <dlfcn.h>
#include <signal.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <string>
#include <utility>

#include "failing_new.h"
#include "faulty_calls.h"

namespace cfg32::tests {

inline thread_local watched_calls* current = nullptr;

/// The definition that would have been used without this one.
template <class Function>
Function next(const char* name) {
    const auto found = reinterpret_cast<Function>(dlsym(RTLD_NEXT, name));
    if (!found) {
        fprintf(stderr, "there is no %s to pass on to\n", name);
        abort();
    }
    return found;
}

[[noreturn]] inline void die() {
    for (;;) {
        kill(getpid(), SIGKILL);
    }
}

// What is done here for the list is not what may lack memory.

inline std::string about(const char* path) {
    const failing_allocation::pause pause;
    return current ? path : "";
}

inline std::string about(int file) { return current ? std::to_string(file) : ""; }

inline std::string about(int file, size_t size) {
    const failing_allocation::pause pause;
    return current ? std::to_string(file) + ", " + std::to_string(size) + " bytes" : "";
}

/// Lets the planned event happen, unseen.
inline void let_happen(const fault& planned) {
    if (planned.event) {
        watched_calls* const watching = std::exchange(current, nullptr);
        const int saved = errno;
        planned.event(watching->seen().back());
        errno = saved;
        current = watching;
    }
}

/// Carries a call out, or lets happen to it what is planned. fail reports an error in the way of
/// the call; call takes how much of what it could transfer it shall.
enum share { half, whole };
template <class Call, class Fail>
auto passed(const char* name, const std::string& about, bool is_transfer, Call call, Fail fail)
    -> decltype(call(whole)) {
    const fault* planned = current ? current->note(name, about, is_transfer) : nullptr;
    if (!planned) {
        return call(whole);
    }
    if (planned->what == effect::comes_after) {
        const auto result = call(whole);
        let_happen(*planned);
        return result;
    }
    let_happen(*planned);
    if (planned->what == effect::comes_before) {
        return call(whole);
    }
    if (planned->what == effect::fails) {
        return fail(planned->error);
    }
    if (planned->what == effect::kills_before) {
        die();
    }
    const auto result = call(planned->what == effect::kills_after ? whole : half);
    if (planned->what == effect::is_slow) {
        usleep(100);  // microseconds
    } else if (planned->what != effect::is_short) {
        die();
    }
    return result;
}

inline int with_errno(int error) {
    errno = error;
    return -1;
}

template <class Call>
auto simple(const char* name, const std::string& about, Call call) {
    return passed(
        name, about, false, [&](share) { return call(); }, with_errno);
}

}  // namespace cfg32::tests
