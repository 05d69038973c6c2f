// A process that updates the file again and again is killed at any moment: nothing that it had been
// told was done is lost.

#include <gtest/gtest.h>
#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <cstdlib>
#include <iostream>
#include <optional>
#include <random>
#include <thread>

#include "faulty_calls.h"
#include "session.h"

using namespace cfg32::tests;

namespace {

const std::string marker = "@VERSION@";

/// What makes a version: its number, and a text whose length differs from that of its neighbours,
/// at the head of the file, so that everything behind it moves.
std::string mark_of(unsigned long version) {
    return "version " + std::to_string(version) + " " +
           std::string(20 + version * 977 % 3000, static_cast<char>('a' + version % 26));
}

attribute_change change_to(unsigned long version) {
    return {LDAP_MOD_REPLACE, "cn=Configuration", "description", {mark_of(version)}};
}

/// A file of some hundred entries, with the marker in the place of the version.
std::string file_with_marker() {
    std::string text = configuration_head + "description: " + marker + "\n";
    for (int i = 100; i < 500; ++i) {
        const std::string name = "Cache " + std::to_string(i);
        text += "\n# number " + std::to_string(i) + "\ndn: cn=" + name +
                ", cn=Configuration\ncn: " + name + "\nnote: " + std::string(i % 90 + 1, 'n') +
                "\nobjectclass: top\noru-slapdPort: " + std::to_string(i) + "\n";
    }
    return as_written(text);
}

class killed_writer : public testing::Test {
  protected:
    static void SetUpTestSuite() { work_in_memory(); }

    const std::string pattern = file_with_marker();
    const size_t place = pattern.find(marker);
    const configuration_folder folder{text_of(0)};

    /// What the library writes for a version, byte for byte.
    std::string text_of(unsigned long version) const {
        return pattern.substr(0, place) + mark_of(version) + pattern.substr(place + marker.size());
    }

    /// The version of a complete text, nothing for any other.
    std::optional<unsigned long> version_of(const std::string& text) const {
        const std::string begin = "version ";
        if (text.compare(0, place, pattern, 0, place) != 0 ||
            text.compare(place, begin.size(), begin) != 0) {
            return {};
        }
        const unsigned long version = strtoul(text.c_str() + place + begin.size(), nullptr, 10);
        return text == text_of(version) ? std::optional(version) : std::nullopt;
    }

    /// The writer's process: writes version after version, and tells of each that is done.
    [[noreturn]] void write_from(unsigned long version, int told, bool is_slow) const {
        // A slow disk takes what is written in many pieces, and its time for each.
        const std::vector<fault> none;
        const watched_calls calls(is_slow ? std::vector<fault>{{0, effect::is_slow, 0, "pwrite"}}
                                          : none);
        session writer(folder.config(), folder.backup());
        if (writer.bind() != CFG_SUCCESS) {
            std::cerr << writer.report();
            _exit(1);
        }
        for (;; ++version) {
            if (writer.modify(change_to(version)) != CFG_SUCCESS) {
                std::cerr << writer.report();
                _exit(1);
            }
            if (::write(told, &version, sizeof version) != sizeof version) {
                _exit(2);
            }
        }
    }

    /// Lets a writer live until it has told of some updates, and for a share of the time that one
    /// took; returns the last version that it told was done.
    unsigned long life(unsigned long last, unsigned long updates, double share, bool is_slow) {
        int ends[2];
        EXPECT_EQ(pipe(ends), 0);
        const pid_t writer = fork();
        if (writer == 0) {
            write_from(last + 1, ends[1], is_slow);
        }
        close(ends[1]);
        const auto next = [&] {
            unsigned long version = 0;
            const bool is_told = ::read(ends[0], &version, sizeof version) == sizeof version;
            if (is_told) {
                EXPECT_EQ(version, last + 1);
                last = version;
            }
            return is_told;
        };
        for (unsigned long i = 0; i < updates; ++i) {
            const auto begin = std::chrono::steady_clock::now();
            EXPECT_TRUE(next()) << "the writer ended by itself";
            one_update_ = std::chrono::steady_clock::now() - begin;
        }
        std::this_thread::sleep_for(one_update_ * share);
        EXPECT_EQ(kill(writer, SIGKILL), 0);
        int status = 0;
        EXPECT_EQ(waitpid(writer, &status, 0), writer);
        EXPECT_TRUE(WIFSIGNALED(status)) << "the writer ended by itself, with " << status;
        while (next()) {
        }
        close(ends[0]);
        return last;
    }

  private:
    std::chrono::duration<double> one_update_{0.001};
};

}  // namespace

TEST_F(killed_writer, LosesNothingThatItWasToldWasDone) {
    const unsigned long kills =
        number_from_environment("CFG32_FAULTS_KILLS", is_sanitized() ? 200 : 1000);
    const unsigned long seed = number_from_environment("CFG32_FAULTS_SEED", 20);
    std::mt19937_64 random(seed);
    std::uniform_int_distribution<unsigned long> before_the_kill(0, 3);
    std::uniform_real_distribution<double> share(0, 1.2);
    unsigned long last = 0;
    unsigned long updates = 0;
    unsigned long torn = 0;
    unsigned long in_flight = 0;
    for (unsigned long i = 0; i < kills && !HasFailure(); ++i) {
        SCOPED_TRACE("kill " + std::to_string(i) + ", seed " + std::to_string(seed));
        const unsigned long wanted = before_the_kill(random);
        const unsigned long acknowledged = life(last, wanted, share(random), i % 2 == 1);
        const auto in_file = version_of(folder.text());
        const auto in_backup = version_of(folder.backup_text());
        ASSERT_TRUE(in_file || in_backup) << "there is no complete version";
        const unsigned long newest = std::max(in_file.value_or(0), in_backup.value_or(0));
        ASSERT_TRUE(newest == acknowledged || newest == acknowledged + 1)
            << newest << " is the newest, " << acknowledged << " was acknowledged";
        torn += in_file ? 0 : 1;
        in_flight += newest == acknowledged + 1 ? 1 : 0;
        if (!in_file) {
            // Nobody takes it for a configuration, and makes it the backup.
            session next(folder.config(), folder.backup());
            EXPECT_EQ(next.bind(), CFG_OTHER);
            EXPECT_EQ(version_of(folder.backup_text()), in_backup);
            folder.restore();
        }
        updates += newest - last;
        last = newest;
    }
    std::cout << kills << " kills among " << updates << " updates (seed " << seed << "): " << torn
              << " found the file torn, " << in_flight << " the version in flight in it\n";
    // Kills that never hit an update prove nothing.
    EXPECT_GT(torn + in_flight, 0u);
}
