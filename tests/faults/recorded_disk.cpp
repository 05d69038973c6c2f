#include "recorded_disk.h"

#include <sys/stat.h>

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <iterator>

#include "environment.h"

namespace cfg32::tests {

namespace {

/// Of so many operations every part is tried.
constexpr size_t few = 8;

ino_t number_of(const std::string& path) {
    struct stat status {};
    stat(path.c_str(), &status);
    return status.st_ino;
}

std::map<std::string, ino_t> names_in(const std::string& folder) {
    std::map<std::string, ino_t> names;
    for (const auto& file : std::filesystem::directory_iterator(folder)) {
        names[file.path().filename()] = number_of(file.path());
    }
    return names;
}

std::string text_of(const std::string& path) {
    std::ifstream in(path, std::ios::binary);
    return {std::istreambuf_iterator<char>(in), {}};
}

/// Which of the operations are done, for the images of one moment.
std::vector<std::vector<bool>> choices(size_t count, size_t by_chance, std::mt19937_64& random) {
    std::vector<std::vector<bool>> all;
    if (count <= few) {
        for (size_t bits = 0; bits < size_t{1} << count; ++bits) {
            all.emplace_back();
            for (size_t i = 0; i < count; ++i) {
                all.back().push_back((bits >> i & 1) != 0);
            }
        }
        return all;
    }
    for (size_t i = 0; i < count; ++i) {
        all.emplace_back(count, false);
        std::fill_n(all.back().begin(), i, true);  // a beginning
        all.emplace_back(count, false)[i] = true;
        all.emplace_back(count, true)[i] = false;
    }
    all.emplace_back(count, true);
    for (size_t i = 0; i < by_chance; ++i) {
        std::bernoulli_distribution is_done(std::uniform_real_distribution<>(0, 1)(random));
        std::vector<bool>& one = all.emplace_back();
        std::generate_n(std::back_inserter(one), count, [&] { return is_done(random); });
    }
    return all;
}

}  // namespace

recorded_disk::recorded_disk(const std::string& folder) : folder_(folder) {
    record_names(names_in(folder_));
    for (const auto& [name, number] : names_) {
        record_content(numbers_[number], text_of(folder_ + "/" + name));
    }
    for (const operation& one : operations_) {
        apply(one, first_);
    }
    operations_.clear();
}

std::vector<fault> recorded_disk::recording() {
    std::vector<fault> events;
    for (const char* name :
         {"copy_file_range", "fdatasync", "fsync", "ftruncate", "link", "linkat", "open", "open64",
          "openat", "openat64", "pwrite", "renameat", "unlink", "unlinkat", "write"}) {
        events.push_back(
            {0, effect::comes_after, 0, name, [this](const seen_call& call) { record(call); }});
    }
    return events;
}

/// What a call did is what is different after it.
void recorded_disk::record(const seen_call& call) {
    record_names(names_in(folder_));
    for (const auto& [name, number] : names_) {
        record_content(numbers_[number], text_of(folder_ + "/" + name));
    }
    if (call.name == "fsync" || call.name == "fdatasync") {
        record_sync(std::stoi(call.about));
    }
}

void recorded_disk::record_names(const std::map<std::string, ino_t>& names) {
    operation change{operation::name, std::nullopt};
    for (const auto& [name, number] : names_) {
        if (names.count(name) == 0) {
            change.names[name] = std::nullopt;
        }
    }
    for (const auto& now : names) {
        const auto known = names_.find(now.first);
        if (known != names_.end() && known->second == now.second) {
            continue;
        }
        const bool is_renamed = std::any_of(names_.begin(), names_.end(), [&](const auto& before) {
            return before.second == now.second;
        });
        if (!is_renamed) {
            numbers_[now.second] = next_number_++;
        }
        change.names[now.first] = numbers_[now.second];
    }
    names_ = names;
    if (!change.names.empty()) {
        operations_.push_back(change);
    }
}

void recorded_disk::record_content(file_number file, const std::string& now) {
    std::string& before = seen_[file];
    if (now.size() < before.size()) {
        operations_.push_back({operation::cut, file, now.size()});
    }
    const size_t size_before = before.size();
    before.resize(now.size());
    for (size_t place = 0; place < now.size(); place += sector) {
        const std::string piece = now.substr(place, sector);
        if (before.compare(place, sector, piece) != 0) {
            operations_.push_back({operation::write, file, place, piece});
        }
    }
    if (now.size() > size_before) {
        operations_.push_back({operation::grow, file, now.size()});
    }
    before = now;
}

void recorded_disk::record_sync(int descriptor) {
    struct stat status {};
    fstat(descriptor, &status);
    const auto known = numbers_.find(status.st_ino);
    if (status.st_ino == number_of(folder_)) {
        operations_.push_back({operation::sync, std::nullopt});
    } else if (known != numbers_.end()) {
        operations_.push_back({operation::sync, known->second});
    }
}

/// What was open of the file, or of the folder's names, is on the disk.
void recorded_disk::sync(const operation& one, state& durable, std::vector<operation>& open) {
    std::vector<operation> left;
    for (const operation& each : open) {
        if (each.file == one.file) {
            apply(each, durable);
        } else {
            left.push_back(each);
        }
    }
    open = left;
}

void recorded_disk::apply(const operation& one, state& to) {
    if (one.kind == operation::name) {
        for (const auto& [name, file] : one.names) {
            if (file) {
                to.names[name] = *file;
            } else {
                to.names.erase(name);
            }
        }
        return;
    }
    content& file = to.files[*one.file];
    if (one.kind == operation::write) {
        file.bytes.resize(std::max(file.bytes.size(), one.place + one.bytes.size()));
        file.bytes.replace(one.place, one.bytes.size(), one.bytes);
    } else if (one.kind == operation::cut) {
        file.bytes.resize(std::min(file.bytes.size(), one.place));
        file.size = one.place;
    } else {
        file.size = std::max(file.size, one.place);
    }
}

recorded_disk::image recorded_disk::image_of(const state& what) {
    image texts;
    for (const auto& [name, number] : what.names) {
        const auto file = what.files.find(number);
        std::string& text = texts[name];
        if (file != what.files.end()) {
            text = file->second.bytes;
            text.resize(file->second.size);
        }
    }
    return texts;
}

recorded_disk::image recorded_disk::image_of(state durable, const std::vector<operation>& open,
                                             const std::vector<bool>& is_done) {
    for (size_t i = 0; i < open.size(); ++i) {
        if (is_done[i]) {
            apply(open[i], durable);
        }
    }
    return image_of(durable);
}

void recorded_disk::for_each_image(size_t by_chance, std::mt19937_64& random,
                                   const std::function<void(const image&)>& look) const {
    state durable = first_;
    std::vector<operation> open;
    const auto cut_power = [&] {
        for (const std::vector<bool>& is_done : choices(open.size(), by_chance, random)) {
            look(image_of(durable, open, is_done));
        }
    };
    for (const operation& one : operations_) {
        if (one.kind == operation::sync) {
            cut_power();
            sync(one, durable, open);
        } else {
            open.push_back(one);
        }
    }
    cut_power();
}

recorded_disk::image recorded_disk::lasting() const {
    state durable = first_;
    std::vector<operation> open;
    for (const operation& one : operations_) {
        if (one.kind == operation::sync) {
            sync(one, durable, open);
        } else {
            open.push_back(one);
        }
    }
    return image_of(durable);
}

std::string recorded_disk::listed() const {
    static const char* const kinds[] = {"write", "cut to", "grow to", "name", "sync"};
    std::string text;
    for (const operation& one : operations_) {
        text += std::string(kinds[one.kind]) + " " +
                (one.file ? "file " + std::to_string(*one.file) : "the folder");
        if (one.kind != operation::sync && one.kind != operation::name) {
            text += ", " + std::to_string(one.place);
        }
        for (const auto& [name, file] : one.names) {
            text += ", " + name + (file ? " is " + std::to_string(*file) : " is gone");
        }
        text += "\n";
    }
    return text;
}

size_t cuts_by_chance() {
    return number_from_environment("CFG32_FAULTS_POWER_CUTS", is_sanitized() ? 25 : 100);
}

}  // namespace cfg32::tests
