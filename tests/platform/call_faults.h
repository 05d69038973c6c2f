#pragma once

#include <string>
#include <string_view>
#include <vector>

// The platform objects' calls of the system and of the allocator go through these tests (the linker
// option --wrap), which can let one of them fail and watch what passes by.

enum class watched_call {
    allocate,  // malloc, calloc, strdup and new together
    chmod,
    chown,
    close,
    copy_range,
    look_up,  // of an account; the error is returned
    random,
    read,
    rename,
    sync,
    write,
};

// Lets the nth call (from 1) of its kind fail with this errno for as long as the object lives; 0
// only counts, and every_call lets all of them fail. A write that fails with no errno writes
// nothing and returns 0.
constexpr int every_call = -1;

class call_fault {
  public:
    call_fault(watched_call call, int nth, int error = 0);
    call_fault(const call_fault&) = delete;
    call_fault& operator=(const call_fault&) = delete;
    ~call_fault();

    int calls() const;
    bool happened() const;
};

// Looks for a secret in every block that the platform objects free while the object lives.
class free_watch {
  public:
    explicit free_watch(std::string_view secret);
    free_watch(const free_watch&) = delete;
    free_watch& operator=(const free_watch&) = delete;
    ~free_watch();

    int blocks() const;
    int leaks() const;
};
