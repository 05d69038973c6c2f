// A session of C calls. The input is the configuration, and then the calls, one in a line:
//
//   =dn|attribute=value|-attribute=value|*attribute=value    cfg_modify_s: add, delete, replace
//   +dn|attribute=value|attribute=value                      cfg_add_s
//   -dn                                                      cfg_delete_s
//   ?base|scope|filter|attribute|attribute                   cfg_search_s, and its results
//   !                                                        cfg_flush_s
//   #options                                                 cfg_set_option: bits of a number
//   @dn|password                                             cfg_bind_s, after a cfg_unbind

#include <unistd.h>

#include <algorithm>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <memory>

#include "cfg32.h"
#include "cfg32_platform.h"
#include "handle.h"
#include "memory_file.h"
#include "modifications.h"
#include "printed_text.h"
#include "property.h"

namespace cfg32::fuzz {

namespace {

/// The pieces of a text between separators; at least one.
std::vector<std::string> split(const std::string& text, char separator) {
    std::vector<std::string> pieces(1);
    for (const char c : text) {
        c == separator ? void(pieces.emplace_back()) : pieces.back().push_back(c);
    }
    return pieces;
}

/// The files of all sessions, one after the other. In memory, where there is such a place.
class configuration {
  public:
    static configuration& instance() {
        static configuration only;
        return only;
    }
    configuration(const configuration&) = delete;
    configuration& operator=(const configuration&) = delete;
    ~configuration() {
        std::error_code ignored;
        std::filesystem::remove_all(folder_, ignored);
    }

    void start(const std::string& text) const {
        unlink(backup().c_str());
        std::ofstream(name(), std::ios::binary | std::ios::trunc) << text;
    }
    std::string name() const { return folder_ + "/oruslapd.conf"; }
    std::string backup() const { return folder_ + "/oruslapd.bak"; }
    std::string text() const { return text_of(name()); }
    std::string backup_text() const { return text_of(backup()); }
    /// There is no other file.
    bool are_all() const {
        const std::filesystem::directory_iterator files(folder_);
        return std::all_of(begin(files), end(files), [&](const auto& file) {
            return file.path() == name() || file.path() == backup();
        });
    }

  private:
    configuration() {
        const char* memory = "/dev/shm";
        folder_ = access(memory, W_OK) == 0 ? memory : std::filesystem::temp_directory_path();
        folder_ += "/cfg32-fuzz-XXXXXX";
        require(mkdtemp(folder_.data()), "there is a folder to work in");
    }

    static std::string text_of(const std::string& name) {
        std::ifstream in(name, std::ios::binary);
        return {std::istreambuf_iterator<char>(in), {}};
    }

    std::string folder_;
};

struct unbinding {
    void operator()(CfgHandle* handle) const { cfg_unbind(handle); }
};
using handle = std::unique_ptr<CfgHandle, unbinding>;

struct freeing {
    void operator()(CfgMessage* result) const { cfg_msgfree(result); }
    void operator()(CfgCursor* cursor) const { cfg_ber_free(cursor); }
    void operator()(char* text) const { cfg_memfree(text); }
    void operator()(char** values) const { cfg_value_free(values); }
};
template <class Type>
using freed = std::unique_ptr<Type, freeing>;

/// The key of every session: passwords are encrypted, too.
aes_key_data* key() {
    static constexpr unsigned char bytes[] = "0123456789abcdef0123456789abcde";
    static aes_key_data* const made = aes_key_data_from_bytes(bytes, sizeof bytes);
    return made;
}

handle new_handle(const configuration& files, bool has_backup) {
    handle made(cfg_init());
    require(made != nullptr, "there is a handle");
    cfg_set_option(made.get(), CFG_OPT_CONFIG_FILE, files.name().c_str());
    cfg_set_option(made.get(), CFG_OPT_KEY_DATA, key());
    if (has_backup) {
        cfg_set_option(made.get(), CFG_OPT_BACKUP_FILE, files.backup().c_str());
    }
    return made;
}

/// What a failed call left can be asked for, whatever it was.
void ask_for_failure(CfgHandle* user) {
    for (const char* text : {cfg_get_file_name(user), cfg_get_entry(user), cfg_get_attribute(user),
                             cfg_get_value(user), cfg_dump_exception(user)}) {
        require(!text || std::char_traits<char>::length(text) < 1'000'000, "a report is a text");
    }
    cfg_err2string(cfg_get_errno(user));
    cfg_err2string(cfg_get_exterror(user));
    if (const char* const* words = cfg_get_enum(user)) {
        for (; *words; ++words) {
            require(**words != '\0', "words are words");
        }
    }
    cfg_get_file_line(user);
    cfg_get_bitmask(user);
    require(cfg_get_minimum(user) <= cfg_get_maximum(user), "a minimum is none above the maximum");
    cfg_get_is_single(user);
}

/// The attributes of an entry and all values of each, which the counts must tell.
std::string traverse(CfgHandle* user, CfgMessage* entry) {
    std::string text = freed<char>(cfg_get_dn(user, entry)).get();
    CfgCursor* cursor = nullptr;
    int attributes = 0;
    freed<char> name(cfg_first_attribute(user, entry, &cursor));
    const freed<CfgCursor> owner(cursor);
    for (; name; name.reset(cfg_next_attribute(user, entry, cursor))) {
        ++attributes;
        const freed<char*> values(cfg_get_values(user, entry, name.get()));
        const int count = cfg_count_values(values.get());
        text.append("\n").append(name.get());
        for (int i = 0; i < count; ++i) {
            text.append("\n  ").append(values.get()[i]);
        }
        require(!values || !values.get()[count], "values end where their count says");
    }
    require_equal(cfg_count_attributes(user, entry), attributes, "attributes are counted");
    return text + "\n";
}

std::string traverse_all(CfgHandle* user, CfgMessage* result) {
    std::string text;
    int left = cfg_count_entries(user, result);
    for (CfgMessage* entry = cfg_first_entry(user, result); entry;
         entry = cfg_next_entry(user, entry)) {
        require_equal(cfg_count_entries(user, entry), left--, "entries are counted");
        text += traverse(user, entry);
    }
    require_equal(left, 0, "entries are as many as their count");
    return text;
}

/// All entries as searches see them, or the code of why they can't be seen.
std::string search(CfgHandle* user, const std::string& base, int scope, const std::string& filter,
                   const std::vector<std::string>& names) {
    std::vector<char*> attributes;
    for (const std::string& name : names) {
        attributes.push_back(const_cast<char*>(name.c_str()));
    }
    attributes.push_back(nullptr);
    CfgMessage* found = nullptr;
    const int code = cfg_search_s(user, base.c_str(), scope, filter.c_str(),
                                  names.empty() ? nullptr : attributes.data(), scope > 2, &found);
    const freed<CfgMessage> result(found);
    if (code != CFG_SUCCESS) {
        require(!found, "a refused search has no result");
        return std::to_string(code);
    }
    return traverse_all(user, found);
}

class session {
  public:
    session(const configuration& files, bool has_backup)
        : files_(files), has_backup_(has_backup), user_(new_handle(files, has_backup)) {}

    bool bind(const char* dn = nullptr, const char* password = nullptr) {
        return note(cfg_bind_s(user_.get(), dn, password, CFG_AUTH_SIMPLE));
    }

    void carry_out(const std::string& line);

  private:
    bool note(int code) {
        require(code >= 0, "a result is none below 0");
        require(!is_surprise(code, cfg_get_exterror(user_.get())),
                "a call is refused for a reason");
        if (code != CFG_SUCCESS) {
            ask_for_failure(user_.get());
        }
        return code == CFG_SUCCESS;
    }

    template <class Call>
    void change(Call call);
    void modify(const std::vector<std::string>& words, bool is_new);
    void search_by(const std::vector<std::string>& words);
    void set_options(unsigned long bits);

    const configuration& files_;
    bool has_backup_;
    handle user_;
};

/// A file has that text, or what a load makes of it.
/// KEPT: a file that was repaired may need it once more, when its lines were kept aside with blanks
/// around them; the next load does so, whatever it is made for.
void require_left(const std::string& found, const std::string& text, std::string_view promise) {
    if (found != text) {
        const tool::memory_file file(text);
        const LDIF_File loaded(file.name(), "", nullptr);
        require_equal(found, file.text(), promise);
    }
}

/// A change that is refused leaves the file as it is. One that is not leaves it with the text of
/// the tree, so that everybody can read it, and the backup as the file was.
template <class Call>
void session::change(Call call) {
    const std::string before = files_.text();
    if (!note(call(user_.get()))) {
        require_left(files_.text(), before, "a refused change leaves the file alone");
        return;
    }
    if (has_backup_) {
        require_left(files_.backup_text(), before, "the backup is what was there before");
    }
    require_equal(files_.text(), printed_text(*user_->file), "a change is in the file");
    require(files_.are_all(), "nothing else is left behind");
    const handle other = new_handle(files_, false);
    require_equal(cfg_bind_s(other.get(), nullptr, nullptr, CFG_AUTH_SIMPLE), CFG_SUCCESS,
                  "a changed file can be read");
}

void session::modify(const std::vector<std::string>& words, bool is_new) {
    std::vector<tests::change> changes;
    for (size_t i = 1; i < words.size(); ++i) {
        std::string word = words[i];
        const int operation = word.starts_with('-')   ? LDAP_MOD_DELETE
                              : word.starts_with('*') ? LDAP_MOD_REPLACE
                                                      : LDAP_MOD_ADD;
        word.erase(0, operation == LDAP_MOD_ADD ? 0 : 1);
        const bool is_binary = word.starts_with('$');
        word.erase(0, is_binary ? 1 : 0);
        std::vector<std::string> values = split(word, '=');
        const std::string name = values.front();
        values.erase(values.begin());
        changes.push_back({operation | (is_binary ? LDAP_MOD_BVALUES : 0), name, values});
    }
    tests::modifications records(changes);
    const char* dn = words.front().c_str();
    change([&](CfgHandle* user) {
        return is_new ? cfg_add_s(user, dn, records.records())
                      : cfg_modify_s(user, dn, records.records());
    });
}

void session::search_by(const std::vector<std::string>& words) {
    const int scope = words.size() > 1 ? atoi(words[1].c_str()) : CFG_SCOPE_SUBTREE;
    const std::string filter = words.size() > 2 ? words[2] : "";
    const std::vector<std::string> names(words.begin() + std::min<ptrdiff_t>(3, std::ssize(words)),
                                         words.end());
    const std::string seen = search(user_.get(), words.front(), scope, filter, names);
    require_equal(search(user_.get(), words.front(), scope, filter, names), seen,
                  "a search finds the same again");
}

void session::set_options(unsigned long bits) {
    for (const int option : {CFG_OPT_DELETE_NON_LEAVES, CFG_OPT_SHOW_STACK, CFG_OPT_SHOW_SOURCE}) {
        const int wanted = static_cast<int>(bits % 2);
        bits /= 2;
        cfg_set_option(user_.get(), option, wanted == 1 ? CFG_OPT_ON : CFG_OPT_OFF);
        int is_on = -1;
        cfg_get_option(user_.get(), option, &is_on);
        require_equal(is_on, wanted, "an option is what it was set to");
    }
    const char* drawing = cfg_tree_view(user_.get(), static_cast<int>(bits % 3));
    require(drawing == cfg_tree_view(user_.get(), 0),
            "a drawing is the same until it is made anew");
}

void session::carry_out(const std::string& line) {
    if (line.empty()) {
        return;
    }
    const std::vector<std::string> words = split(line.substr(1), '|');
    switch (line.front()) {
        case '=':
            return modify(words, false);
        case '+':
            return modify(words, true);
        case '-':
            return change(
                [&](CfgHandle* user) { return cfg_delete_s(user, words.front().c_str()); });
        case '?':
            return search_by(words);
        case '!':
            return change(cfg_flush_s);
        case '#':
            return set_options(strtoul(words.front().c_str(), nullptr, 10));
        case '@':
            user_ = new_handle(files_, has_backup_);
            bind(words.front().c_str(), words.back().c_str());
            return;
        default:
            cfg_reset(user_.get());
    }
}

}  // namespace

void calls_property(std::string_view input) {
    const std::vector<std::string> parts = parts_of(input, 2);
    const configuration& files = configuration::instance();
    files.start(parts.front());
    const std::vector<std::string> calls = split(parts.back(), '\n');
    // Making a backup takes the longest.
    session user(files, calls.size() % 4 == 0);
    if (!user.bind()) {
        return;
    }
    for (const std::string& line : calls) {
        user.carry_out(line);
    }
}

}  // namespace cfg32::fuzz
