// Many processes use one file at the same time.

#include <gtest/gtest.h>
#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <iostream>
#include <iterator>
#include <set>
#include <string>
#include <vector>

#include "faulty_calls.h"
#include "session.h"

using namespace cfg32::tests;

namespace {

const std::string entry = "cn=Configuration";
const std::string attribute = "oru-slapdSetenv";

std::string value_of(int writer, unsigned long update) {
    return "W" + std::to_string(writer) + "U" + std::to_string(update) + "=" +
           std::to_string(update);
}

/// The end of a process that met an error.
[[noreturn]] void give_up(const std::string& why, const session& user) {
    std::cerr << why << "\n" << user.report();
    _exit(1);
}

/// On a machine with too much to do the others may keep the file for longer than a call waits,
/// which then has done nothing.
template <class Call>
int result_of(Call call) {
    int code = CFG_BUSY;
    while (code == CFG_BUSY) {
        code = call();
    }
    return code;
}

int bind(session& user) {
    return result_of([&] { return user.bind(); });
}

int search(session& user, std::set<std::string>& values) {
    return result_of([&] { return user.search(entry, attribute, values); });
}

/// Adds values of its own, one at a time.
void write_values(const configuration_folder& folder, int writer, unsigned long updates) {
    session user(folder.config(), folder.backup());
    if (bind(user) != CFG_SUCCESS) {
        give_up("a writer could not bind", user);
    }
    for (unsigned long i = 0; i < updates; ++i) {
        const attribute_change addition = {LDAP_MOD_ADD, entry, attribute, {value_of(writer, i)}};
        if (result_of([&] { return user.modify(addition); }) != CFG_SUCCESS) {
            give_up("a writer could not write", user);
        }
    }
}

/// One search; the values may become more than those seen, and never less.
void look(session& user, std::set<std::string>& seen) {
    std::set<std::string> values;
    if (search(user, values) != CFG_SUCCESS) {
        give_up("a reader could not search", user);
    }
    if (!std::includes(values.begin(), values.end(), seen.begin(), seen.end())) {
        give_up("a value has vanished", user);
    }
    seen = values;
}

bool writes(const seen_call& call) {
    static const std::set<std::string> names = {"fallocate", "ftruncate", "futimens", "openat",
                                                "openat64",  "pwrite",    "renameat", "write"};
    return names.count(call.name) != 0;
}

volatile sig_atomic_t is_done = 0;

/// Binds and searches until it is told to end, with a new handle and with one that stays.
void read_values(const configuration_folder& folder) {
    session lasting(folder.config());
    if (bind(lasting) != CFG_SUCCESS) {
        give_up("a reader could not bind", lasting);
    }
    std::set<std::string> seen;
    while (!is_done) {
        const watched_calls calls;
        session user(folder.config());
        if (bind(user) != CFG_SUCCESS) {
            give_up("a reader could not bind", user);
        }
        look(user, seen);
        look(lasting, seen);
        if (std::any_of(calls.seen().begin(), calls.seen().end(), writes)) {
            give_up("a reader has written:\n" + listed(calls.seen()), user);
        }
    }
}

template <class Body>
pid_t start(Body body) {
    const pid_t child = fork();
    if (child == 0) {
        body();
        _exit(0);
    }
    EXPECT_GT(child, 0);
    return child;
}

void expect_good_end(pid_t child) {
    int status = 0;
    EXPECT_EQ(waitpid(child, &status, 0), child);
    EXPECT_EQ(status, 0) << "a process met an error";
}

}  // namespace

TEST(many_writers, LoseNoUpdateAndReadersSeeEveryOne) {
    constexpr int writers = 8;
    constexpr int readers = 2;
    const unsigned long updates =
        number_from_environment("CFG32_FAULTS_UPDATES", is_sanitized() ? 50 : 200);
    const configuration_folder folder(configuration_head);
    signal(SIGTERM, [](int) { is_done = 1; });

    std::vector<pid_t> reading;
    std::vector<pid_t> writing;
    std::generate_n(std::back_inserter(reading), readers,
                    [&] { return start([&] { read_values(folder); }); });
    for (int i = 0; i < writers; ++i) {
        writing.push_back(start([&] { write_values(folder, i, updates); }));
    }
    std::for_each(writing.begin(), writing.end(), expect_good_end);
    for (const pid_t reader : reading) {
        EXPECT_EQ(kill(reader, SIGTERM), 0);
        expect_good_end(reader);
    }

    std::set<std::string> expected;
    for (int i = 0; i < writers; ++i) {
        for (unsigned long j = 0; j < updates; ++j) {
            expected.insert(value_of(i, j));
        }
    }
    session user(folder.config());
    ASSERT_EQ(user.bind(), CFG_SUCCESS);
    std::set<std::string> values;
    EXPECT_EQ(user.search(entry, attribute, values), CFG_SUCCESS);
    EXPECT_EQ(values, expected);
    EXPECT_EQ(folder.text().find("oru-slapdInvalidLine"), std::string::npos);
    std::cout << writers << " writers made " << updates << " updates each\n";
}
