#include "cfg32_platform.h"

// Initialised by the linker, not by code: the mutex is usable by constructors of other objects too.
pthread_mutex_t set_locale_mutex = PTHREAD_MUTEX_INITIALIZER;

// Nothing is left to do. To initialise a mutex again, possibly while it is held, would be undefined
// (POSIX, pthread_mutex_init), so a call after the first has to do nothing in any case.
void initLocaleMutex() noexcept {}
