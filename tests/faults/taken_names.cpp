#include "taken_names.h"

#include <dlfcn.h>

#include <algorithm>
#include <cstdio>
#include <memory>
#include <sstream>
#include <string_view>

namespace cfg32::tests {

namespace {

/// What the libraries take from elsewhere and what can't lose a file, by the reason.
const std::set<std::string> harmless = {
    // the compiler's and the linker's
    "_ITM_deregisterTMCloneTable",
    "_ITM_registerTMCloneTable",
    "__ctype_get_mb_cur_max",
    "__cxa_atexit",
    "__cxa_finalize",
    "__errno_location",
    "__gmon_start__",
    "__gxx_personality_v0",
    "__stack_chk_fail",
    "__tls_get_addr",
    "_Unwind_Resume",
    // memory
    "calloc",
    "explicit_bzero",
    "free",
    "malloc",
    "memchr",
    "memcmp",
    "memcpy",
    "memmove",
    "memset",
    "wmemchr",
    "wmemcpy",
    "wmemmove",
    "wmemset",
    // text
    "__ctype_tolower_loc",
    "iswspace",
    "mbrtowc",
    "mbstowcs",
    "snprintf",
    "strcasecmp",
    "strcmp",
    "strcspn",
    "strdup",
    "strerror",
    "strlen",
    "strncasecmp",
    "strnlen",
    "strrchr",
    "strtol",
    "vsnprintf",
    "wcslen",
    "wcstombs",
    // the process: cfg_init() reads the C library's own files of the locale, nothing else
    "getauxval",
    "pthread_mutex_lock",
    "pthread_mutex_unlock",
    "secure_getenv",
    "setlocale",
};

/// Families of such names: exceptions, the sanitizers, ciphers and compression in memory.
const char* const harmless_families[] = {"__cxa_",  "__asan_",      "__ubsan_",
                                         "__tsan_", "__sanitizer_", "__sancov_",
                                         "nettle_", "deflate",      "inflate"};

/// C++ is harmless save for what opens files and for the standard streams; the description of a
/// type does not.
const char* const parts_with_files[] = {"fstream",       "filebuf", "filesystem",
                                        "random_device", "St3cin",  "St4cout",
                                        "St4cerr",       "St4clog", "6vprint"};

}  // namespace

bool is_harmless(const std::string& name) {
    if (name.starts_with("_ZTI")) {
        return true;
    }
    if (name.starts_with("_Z")) {
        return std::none_of(std::begin(parts_with_files), std::end(parts_with_files),
                            [&](const char* part) { return name.find(part) != std::string::npos; });
    }
    // A function that looks at the size of what it writes to has a name made of its own.
    const std::string_view checked = "_chk";
    if (name.starts_with("__") && name.ends_with(checked)) {
        return is_harmless(name.substr(2, name.size() - 2 - checked.size()));
    }
    return harmless.count(name) != 0 ||
           std::any_of(std::begin(harmless_families), std::end(harmless_families),
                       [&](const char* family) { return name.starts_with(family); });
}

std::set<std::string> taken_names(const std::string& files, const std::string& option) {
    const std::string command = NM " --undefined-only " + option + " '" + files + "'";
    const std::unique_ptr<FILE, int (*)(FILE*)> output(popen(command.c_str(), "r"), pclose);
    std::set<std::string> names;
    char line[4096];
    while (output && fgets(line, sizeof line, output.get())) {
        std::istringstream words(line);
        std::string type;
        std::string name;
        words >> type >> name;
        if (name.find("@CFG32") == std::string::npos) {
            names.insert(name.substr(0, name.find('@')));
        }
    }
    return names;
}

std::string home_of(void* definition) {
    Dl_info info{};
    return definition && dladdr(definition, &info) != 0 ? info.dli_fname : "";
}

}  // namespace cfg32::tests
