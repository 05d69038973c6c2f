#include "scenarios.h"

#include <unistd.h>

#include <cerrno>

#include "failing_new.h"

namespace cfg32::tests {

namespace {

const std::string front_end = "cn=Front End, cn=Configuration";

/// The description, around which half of a write ends.
const std::string description(6000, 'd');

std::string configuration(const std::string& lines) {
    std::string text = configuration_head +
                       "\n"
                       "# What the clients see.\n"
                       "dn: cn=Front End, cn=Configuration\n"
                       "cn: Front End\n" +
                       lines + "description: " + description +
                       "\n"
                       "objectclass: top\n"
                       "oru-slapdPort: 1389\n";
    for (int i = 10; i < 40; ++i) {
        const std::string name = "Cache " + std::to_string(i);
        text += "\ndn: cn=" + name + ", cn=Configuration\ncn: " + name +
                "\nnote: " + std::string(120, 'n') + "\nobjectclass: top\n";
    }
    return text;
}

attribute_change replacement(const std::string& attribute, const std::string& value) {
    return {LDAP_MOD_REPLACE, front_end, attribute, {value}};
}

/// A file of few bytes, and a change of it.
scenario small(const char* name, const std::string& from, const std::string& to) {
    const std::string text = "charset: x\nversion: 1\n\ndn: cn=a\ncn: a\ndescription: ";
    return {name, true, text + from + "\n\n", {LDAP_MOD_REPLACE, "cn=a", "description", {to}}, {}};
}

/// With and without a backup.
void add_both(std::vector<scenario>& all, const char* with, const char* without,
              const scenario& one) {
    for (const bool has_backup : {true, false}) {
        all.push_back(one);
        all.back().has_backup = has_backup;
        all.back().name = has_backup ? with : without;
    }
}

}  // namespace

const std::vector<scenario>& scenarios() {
    static const std::vector<scenario> all = [] {
        std::vector<scenario> made;
        const std::string whole = as_written(configuration(""));
        const std::string broken = configuration("oru-slapdIdleTimeOut: x\noru-slapdPort: many\n");
        const attribute_change growth =
            replacement("description", description + std::string(3000, 'D'));
        const std::vector<fault> without_reservation = {
            {0, effect::fails, EOPNOTSUPP, "fallocate"}};
        add_both(made, "growing", "growing_without_backup", {"", true, whole, growth, {}});
        add_both(made, "shrinking", "shrinking_without_backup",
                 {"", true, whole, replacement("description", "short"), {}});
        add_both(made, "staying", "staying_without_backup",
                 {"",
                  true,
                  whole,
                  replacement("description", std::string(description.size(), 'D')),
                  {}});
        add_both(made, "repairing", "repairing_without_backup",
                 {"", true, broken, replacement("oru-slapdTimeLimit", "60"), {}});
        add_both(made, "growing_unreserved", "growing_unreserved_without_backup",
                 {"", true, whole, growth, without_reservation});
        const std::string long_text(100, 'd');
        made.push_back(small("small_growing", "d", "some text"));
        made.push_back(small("small_shrinking", "some text", "d"));
        made.push_back(small("small_becoming_large", "d", long_text));
        made.push_back(small("large_becoming_small", long_text, "d"));
        return made;
    }();
    return all;
}

std::vector<std::string> versions_of(const scenario& one) {
    std::vector<std::string> versions = {one.before};
    const std::string written = as_written(one.before);
    if (written != one.before) {
        versions.push_back(written);
    }
    versions.push_back(as_written_after(one.before, one.what));
    return versions;
}

/// The handle is bound to a file that is whole; what has to be repaired comes with the call. Who
/// may, gives the file to somebody else, so that the backup has to be given to them as well.
stage::stage(const scenario& one)
    : scenario_(one),
      folder_(configuration_head),
      user_(folder_.config(), one.has_backup ? folder_.backup() : "") {
    EXPECT_EQ(user_.bind(), CFG_SUCCESS) << user_.report();
    folder_.write(one.before);
    folder_.folder().touch("oruslapd.conf", 5);
    if (geteuid() == 0) {
        EXPECT_EQ(chown(folder_.config().c_str(), 1, 1), 0);
    }
}

int stage::play(const std::vector<fault>& faults) {
    std::vector<fault> all = faults;
    all.insert(all.end(), scenario_.circumstances.begin(), scenario_.circumstances.end());
    watched_calls calls(all);
    const int code = user_.modify(scenario_.what);
    const failing_allocation::pause pause;
    seen_ = calls.seen();
    return code;
}

std::vector<seen_call> calls_of(const scenario& one) {
    stage on(one);
    EXPECT_EQ(on.play(), CFG_SUCCESS) << on.report();
    return on.seen();
}

}  // namespace cfg32::tests
