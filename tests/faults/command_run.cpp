#include "command_run.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <regex>
#include <sstream>

#include "command_line.h"
#include "session.h"
#include "temporary_folder.h"

namespace cfg32::tests {

namespace {

namespace fs = std::filesystem;

const std::string listener = "cn=Listener, cn=Configuration";

std::string configuration(const std::string& port) {
    return as_written(configuration_head + "\n# " + std::string(6000, '-') + "\ndn: " + listener +
                      "\ncn: Listener\nobjectclass: top\noru-slapdPort: " + port +
                      "\n\ndn: cn=Spare, cn=Configuration\ncn: Spare\nobjectclass: top\n");
}

std::string without_passwords(const std::string& text) {
    static const std::regex password("\\{iMASK\\}>[^\n]*");
    return std::regex_replace(text, password, "*");
}

folder_image image_of(const fs::path& folder) {
    folder_image image;
    for (const auto& file : fs::recursive_directory_iterator(folder)) {
        if (file.is_regular_file()) {
            std::ifstream in(file.path(), std::ios::binary);
            image[file.path().filename()] = {std::istreambuf_iterator<char>(in), {}};
        } else {
            image[file.path().filename()] = "";
        }
    }
    return comparable(image);
}

void redirect(const std::string& path, int flags, int to) {
    const int file = open(path.c_str(), flags, 0600);
    if (file < 0 || dup2(file, to) < 0 || close(file) != 0) {
        _exit(100);
    }
}

/// Writes down what was called: name, transfer or not, and the rest.
void keep(const std::vector<seen_call>& calls, const std::string& path) {
    std::ofstream out(path);
    for (const seen_call& call : calls) {
        out << call.name << ' ' << call.is_transfer << ' ' << call.about << '\n';
    }
}

std::vector<seen_call> kept(const std::string& path) {
    std::ifstream in(path);
    std::vector<seen_call> calls;
    for (std::string line; std::getline(in, line);) {
        std::istringstream words(line);
        seen_call& call = calls.emplace_back();
        words >> call.name >> call.is_transfer;
        std::getline(words >> std::ws, call.about);
    }
    return calls;
}

/// The folders of one run, and the files around it.
struct place {
    temporary_folder folder;
    std::string work = folder.file("work");
    std::string temporary = folder.file("tmp");
    std::string input = folder.file("input");
    std::string output = folder.file("output");
    std::string told = folder.file("told");
    std::string trace = folder.file("trace");

    explicit place(const command_row& row) {
        fs::create_directory(work);
        fs::create_directory(temporary);
        folder.write("input", row.input);
        folder.write("output", "");
        folder.write("told", "");
        for (const auto& [name, text] : row.before) {
            folder.write("work/" + name, text);
        }
    }
};

/// Makes this process the command's; returns its arguments.
std::vector<std::string> become_command(const command_row& row, const place& at) {
    setsid();  // nobody is asked at a terminal
    redirect(at.input, O_RDONLY, STDIN_FILENO);
    redirect(at.output, O_WRONLY | O_CREAT, STDOUT_FILENO);
    redirect(at.told, O_WRONLY | O_CREAT, STDERR_FILENO);
    setenv("TMPDIR", at.temporary.c_str(), 1);
    setenv("EDITOR", "sed -i s/1389/389/", 1);
    unsetenv("VISUAL");
    std::vector<std::string> words = {"cfg32", "-f", "oruslapd.conf"};
    words.insert(words.end(), row.words.begin(), row.words.end());
    if (chdir(at.work.c_str()) != 0) {
        _exit(100);
    }
    return words;
}

int carry_out(std::vector<std::string> words, const std::vector<fault>& faults,
              const std::string& trace) {
    std::vector<char*> arguments;
    for (std::string& word : words) {
        arguments.push_back(word.data());
    }
    arguments.push_back(nullptr);
    const watched_calls calls(faults);
    const int status = tool::run_command_line(static_cast<int>(words.size()), arguments.data());
    keep(calls.seen(), trace);
    return status;
}

/// Runs the function in a process that is the command's; what it returns is the exit status.
command_run run_apart(const command_row& row,
                      const std::function<int(const place&, std::vector<std::string>)>& run) {
    const place at(row);
    fflush(nullptr);  // what is still to be printed is the parent's
    const pid_t child = fork();
    if (child == 0) {
        const int status = run(at, become_command(row, at));
        fflush(nullptr);
        _exit(status);
    }
    int status = 0;
    EXPECT_EQ(waitpid(child, &status, 0), child);
    command_run result;
    result.status = WIFEXITED(status) ? WEXITSTATUS(status) : -1;
    result.signal = WIFSIGNALED(status) ? WTERMSIG(status) : 0;
    result.output = at.folder.read("output");
    result.told = at.folder.read("told");
    result.after = image_of(at.work);
    result.temporary = image_of(at.temporary);
    result.calls = kept(at.trace);
    return result;
}

}  // namespace

const std::vector<command_row>& command_rows() {
    static const std::vector<command_row> all = [] {
        const std::string before = configuration("1389");
        const folder_image alone = {{"oruslapd.conf", before}};
        const auto with = [&](const std::string& name, const std::string& text) {
            folder_image two = alone;
            two[name] = text;
            return two;
        };
        const std::string backup = configuration("2389");
        // Longer than what is read at once or not at all.
        const std::string changes = "# " + std::string(600, '-') + "\ndn: " + listener +
                                    "\nchangetype: modify\nreplace: oru-slapdPort\n"
                                    "oru-slapdPort: 389\n-\n";
        const std::string torn = unfinished_head + before.substr(unfinished_head.size(), 3000);
        return std::vector<command_row>{
            {"set", {"set", listener, "oru-slapdPort", "389"}, alone},
            {"set_by_the_administrator",
             {"-D", "cn=root", "-y", "typed", "set", listener, "oru-slapdPort", "389"},
             with("typed", "correct horse\n")},
            {"unset", {"unset", listener, "oru-slapdPort"}, alone},
            {"passwd",
             {"passwd", "cn=Spare, cn=Configuration", "oru-slapdDbUserPW"},
             alone,
             "Isar\nIsar\n"},
            {"add",
             {"add", "-l", "new.ldif"},
             with("new.ldif", "dn: cn=New, cn=Configuration\ncn: New\nobjectclass: top\n")},
            {"modify", {"modify", "-l", "changes.ldif"}, with("changes.ldif", changes)},
            {"modify_from_standard_input", {"modify"}, alone, changes},
            {"delete", {"delete", "cn=Spare, cn=Configuration"}, alone},
            {"apply", {"apply", "wanted.conf"}, with("wanted.conf", backup)},
            {"edit", {"edit"}, alone},
            {"backup", {"backup"}, alone},
            {"backup_again", {"backup"}, with("oruslapd.conf.bak", backup)},
            {"restore", {"restore", "--yes"}, with("oruslapd.conf.bak", backup)},
            {"restore_of_a_torn_file",
             {"restore", "--yes"},
             {{"oruslapd.conf", torn}, {"oruslapd.conf.bak", backup}}},
            {"restore_of_a_missing_file", {"restore", "--yes"}, {{"oruslapd.conf.bak", backup}}},
            {"keygen", {"keygen", "new.key"}, {}},
        };
    }();
    return all;
}

const command_row& command_row_of(const std::string& name) {
    const auto& all = command_rows();
    return *std::find_if(all.begin(), all.end(),
                         [&](const command_row& row) { return row.name == name; });
}

std::string command_run::described() const {
    return "ended with " + std::to_string(status) + ", signal " + std::to_string(signal) +
           ", and told:\n" + told + listed(calls);
}

command_run run_command(const command_row& row, const std::vector<fault>& faults) {
    return run_apart(row, [&](const place& at, const std::vector<std::string>& words) {
        return carry_out(words, faults, at.trace);
    });
}

command_run run_without_output(const command_row& row) {
    return run_apart(row, [&](const place& at, const std::vector<std::string>& words) {
        redirect("/dev/full", O_WRONLY, STDOUT_FILENO);
        return carry_out(words, {}, at.trace);
    });
}

command_run run_recorded(const command_row& row,
                         const std::function<bool(const recorded_disk&)>& is_good) {
    return run_apart(row, [&](const place& at, const std::vector<std::string>& words) {
        recorded_disk disk(at.work);
        const int status = carry_out(words, disk.recording(), at.trace);
        return is_good(disk) ? status : bad_run;
    });
}

folder_image comparable(folder_image image) {
    for (auto& [name, text] : image) {
        text = name.ends_with(".key") && !text.empty() ? std::to_string(text.size()) + " bytes"
                                                       : without_passwords(text);
    }
    return image;
}

}  // namespace cfg32::tests
