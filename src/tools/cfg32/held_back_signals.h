#pragma once

#include <csignal>

namespace cfg32::tool {

/// While it lives, signals to this thread wait: what is in the middle of being written is written
/// to its end. Threads that are begun meanwhile never get any.
class held_back_signals {
  public:
    held_back_signals() {
        sigset_t all;
        sigfillset(&all);
        pthread_sigmask(SIG_SETMASK, &all, &before_);
    }
    held_back_signals(const held_back_signals&) = delete;
    held_back_signals& operator=(const held_back_signals&) = delete;
    ~held_back_signals() { pthread_sigmask(SIG_SETMASK, &before_, nullptr); }

  private:
    sigset_t before_;
};

}  // namespace cfg32::tool
