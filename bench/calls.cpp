// Times whole calls of the library on a configuration file, as its callers make them:
//
//   cfg32_bench load FILE                 one load: init, options, bind
//   cfg32_bench search FILE               searches on an open handle
//   cfg32_bench modify FILE               changes of one value, each on the disk with a backup
//   cfg32_bench bind-search-unbind FILE   the whole cycle
//
// The environment tells what to search for and to change (see `environment`). Each result is a line
// "NAME reps=R ns_per_op=X items=K".

#include <cfg32.h>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <functional>
#include <stdexcept>
#include <string>
#include <vector>

namespace {

using steady = std::chrono::steady_clock;
using nanoseconds = std::chrono::duration<double, std::nano>;
using namespace std::chrono_literals;

std::string environment(const char* name, const char* otherwise) {
    const char* value = getenv(name);
    return value ? value : otherwise;
}

/// What is searched for and changed.
struct probe {
    std::string suffix = environment("CFG_BENCH_SUFFIX", "cn=Configuration");
    std::string base = environment("CFG_BENCH_BASE", "cn=Configuration");
    std::string parent = environment("CFG_BENCH_PARENT", "cn=Configuration");
    std::string cn = environment("CFG_BENCH_CN", "Configuration");
    std::string attribute = environment("CFG_BENCH_ATTR", "oru-slapdPort");
    std::string value = environment("CFG_BENCH_VALUE", "389");
    std::string backup = environment("CFG_BENCH_BACKUP", "");
};

/// A handle of the library; a call that fails ends the program.
class handle {
  public:
    explicit handle(const std::string& file, const std::string& backup = {}) : handle_(cfg_init()) {
        require(cfg_set_option(handle_, CFG_OPT_CONFIG_FILE, file.c_str()), "option");
        if (!backup.empty()) {
            require(cfg_set_option(handle_, CFG_OPT_BACKUP_FILE, backup.c_str()), "option");
        }
        require(cfg_bind_s(handle_, nullptr, nullptr, CFG_AUTH_SIMPLE), "bind");
    }
    handle(const handle&) = delete;
    handle& operator=(const handle&) = delete;
    ~handle() { cfg_unbind(handle_); }

    CfgHandle* get() const { return handle_; }

    void require(int code, const char* what) const {
        if (code != CFG_SUCCESS) {
            const char* details = cfg_dump_exception(handle_);
            throw std::runtime_error(std::string(what) + ": " +
                                     (details ? details : cfg_err2string(code)));
        }
    }

  private:
    CfgHandle* handle_;
};

/// Reads all of an entry, as a caller does, and frees the copies.
void read_whole(CfgHandle* handle, CfgMessage* entry) {
    cfg_memfree(cfg_get_dn(handle, entry));
    CfgCursor* cursor = nullptr;
    for (char* name = cfg_first_attribute(handle, entry, &cursor); name;
         name = cfg_next_attribute(handle, entry, cursor)) {
        cfg_value_free(cfg_get_values(handle, entry, name));
        cfg_memfree(name);
    }
    cfg_ber_free(cursor);
}

struct query {
    const char* name;
    std::string base;
    int scope;
    std::string filter;
    std::vector<const char*> attributes;  // none means all
    bool is_read;                         // also what the entries hold
};

/// Makes the search, counts the results along the chain and frees them.
size_t count_found(const handle& in, const query& what) {
    std::vector<const char*> names = what.attributes;
    names.push_back(nullptr);
    CfgMessage* found = nullptr;
    in.require(cfg_search_s(in.get(), what.base.c_str(), what.scope, what.filter.c_str(),
                            what.attributes.empty() ? nullptr : const_cast<char**>(names.data()), 0,
                            &found),
               what.name);
    size_t count = 0;
    for (CfgMessage* entry = cfg_first_entry(in.get(), found); entry;
         entry = cfg_next_entry(in.get(), entry)) {
        if (what.is_read) {
            read_whole(in.get(), entry);
        }
        ++count;
    }
    cfg_msgfree(found);
    return count;
}

double time_of(const std::function<void()>& operation) {
    const auto begin = steady::now();
    operation();
    return nanoseconds(steady::now() - begin).count();
}

void print_result(const char* name, size_t reps, double ns_per_operation, size_t items) {
    printf("%s reps=%zu ns_per_op=%.1f items=%zu\n", name, reps, ns_per_operation, items);
}

/// Repeats a short operation and prints its mean time. Batches keep the clock out of it.
void print_mean(const char* name, const std::function<size_t()>& operation) {
    constexpr auto long_enough = 150ms;
    size_t items = operation();  // and warms up
    size_t reps = 0;
    double total = 0;
    for (size_t batch = 1; total < nanoseconds(long_enough).count(); batch *= 2) {
        total += time_of([&] {
            for (size_t i = 0; i < batch; ++i) {
                items = operation();
            }
        });
        reps += batch;
    }
    print_result(name, reps, total / static_cast<double>(reps), items);
}

/// Repeats a long operation and returns its times.
std::vector<double> times_of(std::chrono::milliseconds at_most,
                             const std::function<void()>& operation) {
    constexpr size_t most = 41;
    std::vector<double> times;
    double total = 0;
    while (times.empty() || (times.size() < most && total < nanoseconds(at_most).count())) {
        times.push_back(time_of(operation));
        total += times.back();
    }
    return times;
}

double median(std::vector<double> times) {
    const auto middle = times.begin() + static_cast<ptrdiff_t>(times.size() / 2);
    std::nth_element(times.begin(), middle, times.end());
    return *middle;
}

void load(const std::string& file, const probe&) {
    handle* loaded = nullptr;
    const double loading = time_of([&] { loaded = new handle(file); });
    // Counting them here would be part of the memory that the load is measured by.
    const size_t entries = std::stoul(environment("CFG_BENCH_ENTRIES", "0"));
    print_result("load", 1, loading, entries);
    print_result("unload", 1, time_of([&] { delete loaded; }), entries);
}

void search(const std::string& file, const probe& wanted) {
    const handle opened(file);
    const std::string any = "(objectclass=*)";
    const query queries[] = {
        {"search.base", wanted.base, CFG_SCOPE_BASE, any, {}, false},
        {"search.base.walk", wanted.base, CFG_SCOPE_BASE, any, {}, true},
        {"search.one", wanted.parent, CFG_SCOPE_ONELEVEL, any, {}, false},
        {"search.one.walk", wanted.parent, CFG_SCOPE_ONELEVEL, any, {}, true},
        {"search.sub.eq", wanted.suffix, CFG_SCOPE_SUBTREE, "(cn=" + wanted.cn + ")", {}, false},
        {"search.sub.all", wanted.suffix, CFG_SCOPE_SUBTREE, any, {"cn"}, false},
    };
    for (const query& each : queries) {
        print_mean(each.name, [&] { return count_found(opened, each); });
    }
}

/// Replaces one value by another each time.
void modify(const std::string& file, const probe& wanted) {
    const handle opened(file, wanted.backup);
    std::string values[] = {std::to_string(std::stoi(wanted.value) % 65535 + 1), wanted.value};
    size_t number = 0;
    const std::vector<double> times = times_of(600ms, [&] {
        char* list[] = {values[number++ % 2].data(), nullptr};
        std::string name = wanted.attribute;
        LDAPMod change{};
        change.mod_op = LDAP_MOD_REPLACE;
        change.mod_type = name.data();
        change.mod_values = list;
        LDAPMod* changes[] = {&change, nullptr};
        opened.require(cfg_modify_s(opened.get(), wanted.base.c_str(), changes), "modify");
    });
    // Each change is on the disk when its call returns.
    for (const char* name : {"modify", "modify.sync"}) {
        print_result(name, times.size(), median(times), 1);
    }
}

void bind_search_unbind(const std::string& file, const probe& wanted) {
    const query base = {"search", wanted.base, CFG_SCOPE_BASE, "(objectclass=*)", {}, true};
    size_t items = 0;
    const std::vector<double> times =
        times_of(300ms, [&] { items = count_found(handle(file), base); });
    print_result("bind-search-unbind", times.size(), median(times), items);
}

constexpr struct {
    const char* name;
    void (*run)(const std::string& file, const probe& wanted);
} modes[] = {
    {"load", load},
    {"search", search},
    {"modify", modify},
    {"bind-search-unbind", bind_search_unbind},
};

}  // namespace

int main(int argc, char** argv) try {
    const auto* mode = std::find_if(std::begin(modes), std::end(modes), [&](const auto& each) {
        return argc == 3 && !strcmp(each.name, argv[1]);
    });
    if (mode == std::end(modes)) {
        fprintf(stderr, "usage: cfg32_bench load|search|modify|bind-search-unbind FILE\n");
        return 2;
    }
    mode->run(argv[2], probe());
    return 0;
} catch (const std::exception& e) {
    fprintf(stderr, "cfg32_bench: %s\n", e.what());
    return 1;
}
