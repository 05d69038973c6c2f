// Loading the configuration file.

#include "LDIF_File.h"

#include <cerrno>

#include "LDIF_Attribute.h"
#include "LDIF_Line.h"
#include "disk.h"
#include "failure.h"
#include "line_source.h"
#include "logical_line.h"

using namespace cfg32;

namespace {

constexpr failure no_name{91, 1001, "Config filename is NULL!"};
constexpr failure no_status{91, 1003, "_stat()"};
constexpr failure not_opened{91, 1004, "ifstream()"};
constexpr failure not_read{80, 1000, "System error reading file"};
constexpr failure second_version{19, 1006, "More than 1 \"version\" attribute not allowed"};
constexpr failure second_charset{19, 1006, "More than 1 \"charset\" attribute not allowed"};
constexpr failure not_of_root{65, 1007, "\""};
constexpr failure unknown_line{80, 1000, "Unknown LDIF_Line::Type!"};

constexpr int object_class_violation = 65;

/// One pass over the text of a file, which fills a tree. The tree stands in the text.
class loader {
  public:
    loader(LDIF_Entry& root, LDIF_Comment& pending, aes_key_data* key)
        : root_(root), pending_(pending), key_(key), lines_(key) {}

    void run(std::string_view text);

    int line_number() const { return line_number_; }
    bool found_invalid_lines() const { return found_invalid_lines_; }
    std::string place() const { return open_.empty() ? "<root>" : shown(open_.front().dn()); }

  private:
    void read_line(line_source& source);
    void dispatch();
    void end_of_file();
    void blank_line();
    void dn_line();
    void attribute_line();
    bool leave_unread();
    void add_attribute();
    void add_root_attribute(LDIF_Attribute&& attribute);
    void require_root_attribute(const char* name, const char* value, bool& seen);
    void close_entry();

    LDIF_Entry& root_;
    LDIF_Comment& pending_;  // comment lines that belong to nothing yet
    aes_key_data* key_;
    logical_line line_;
    int line_number_ = 0;
    const char* end_of_line_ = nullptr;
    LDIF_Entry::list open_;  // the entry that attribute lines belong to, if there is one
    LDIF_Entry* last_parent_ = nullptr;  // where the entry before went, and the next may go
    unread_checker lines_;               // of that entry
    bool version_seen_ = false;
    bool charset_seen_ = false;
    bool done_ = false;
    bool reuse_line_ = false;
    bool found_invalid_lines_ = false;
};

void loader::run(std::string_view text) {
    line_source source(given_text::lasting(text));
    while (!done_) {
        if (!reuse_line_) {
            read_line(source);
        }
        if (!line_.has_separator) {
            line_.change_to_invalid_attribute();
            found_invalid_lines_ = true;
        }
        dispatch();
    }
}

void loader::read_line(line_source& source) {
    const int last = line_number_;
    ++line_number_;  // what a failing read reports
    line_number_ = line_.next(source, last);
    end_of_line_ = source.rest().data();
}

void loader::dispatch() {
    switch (line_.type) {
        case LDIF_Line::endOfFile:
            return end_of_file();
        case LDIF_Line::blankLine:
            return blank_line();
        case LDIF_Line::comment:
            pending_.append(line_.with_newline());
            lines_.take_comment(line_);
            return;
        case LDIF_Line::dn:
            return dn_line();
        case LDIF_Line::attr:
            return attribute_line();
        default:                  // UNREACHABLE: the reader tells no other type
            raise(unknown_line);  // UNREACHABLE: as above
    }
}

void loader::end_of_file() {
    done_ = true;
    close_entry();
    pending_.drop_trailing_blank_lines();
}

void loader::blank_line() {
    if (!open_.empty()) {
        close_entry();
    } else {
        pending_.append(line_.with_newline());
    }
}

void loader::dn_line() {
    close_entry();
    require_root_attribute("charset", "ISO-8859-1", charset_seen_);
    require_root_attribute("version", "1", version_seen_);
    reuse_line_ = false;
    open_.emplace_back(attribute_name(line_.attribute), kept_dn(line_.value), std::move(pending_));
    pending_.clear();
    lines_.start(end_of_line_);
}

/// Adds the attribute to the root of a file without it; the comment before the first entry moves
/// to it.
void loader::require_root_attribute(const char* name, const char* value, bool& seen) {
    if (!seen) {
        LDIF_Attribute attribute(key_, name, value);
        attribute += pending_;
        pending_.clear();
        root_ += std::move(attribute);
        seen = true;
    }
}

/// A line that can't be used is kept as an attribute for such lines. KEPT: the root does not allow
/// that attribute, so that a bad line above the first entry ends the load.
void loader::attribute_line() {
    try {
        if (!leave_unread()) {
            add_attribute();
        }
    } catch (const LDIF_Exception& e) {
        // A failure of the system says nothing about the line.
        if (e.ldapErr == object_class_violation || e.sysErrno != 0) {
            throw;
        }
        line_.change_to_invalid_attribute();
        found_invalid_lines_ = true;
        reuse_line_ = true;
    }
}

/// True when the line was checked, and need not be read before somebody asks for it.
bool loader::leave_unread() {
    if (open_.empty() || !lines_.take(line_, end_of_line_)) {
        return false;
    }
    open_.front().leave_unread(lines_.taken());
    pending_.clear();
    reuse_line_ = false;
    return true;
}

void loader::add_attribute() {
    LDIF_Attribute attribute(key_, attribute_name(line_.attribute), line_.value,
                             std::move(pending_));
    pending_.clear();
    reuse_line_ = false;
    if (!open_.empty()) {
        open_.front() += std::move(attribute);
    } else {
        add_root_attribute(std::move(attribute));
    }
}

void loader::add_root_attribute(LDIF_Attribute&& attribute) {
    const auto details = [&](LDIF_Exception& e) {
        e.entryDn = "<root>";
        e.attribute = attribute.name().text();
        e.value = attribute.values().begin()->str();
    };
    if (!is_of_root(attribute)) {
        raise_with(not_of_root,
                   attribute.name().text() + "\" attribute not allowed in <root> object", details);
    }
    const bool is_version = attribute == "version";
    bool& seen = is_version ? version_seen_ : charset_seen_;
    if (seen) {
        raise_with(is_version ? second_version : second_charset, {}, details);
    }
    root_ += std::move(attribute);
    seen = true;
}

void loader::close_entry() {
    if (open_.empty()) {
        return;
    }
    LDIF_Entry* parent = last_parent_ ? last_parent_->place_below(open_) : nullptr;
    last_parent_ = parent ? parent : &root_.place(open_);
    open_.clear();
}

}  // namespace

bool cfg32::is_of_root(const LDIF_Attribute& attribute) {
    return attribute == "version" || attribute == "charset";
}

LDIF_File::LDIF_File(const std::string& fileName, const std::string& backupFileName,
                     aes_key_data* key)
    : file_name_(fileName), backup_file_name_(backupFileName), key_(key) {
    if (file_name_.empty()) {
        raise_with(no_name, {}, [](LDIF_Exception& e) { e.configFile = "<NULL>"; });
    }
    refresh();
}

bool LDIF_File::is_current(const struct stat& status) const {
    return is_loaded_ && is_same_version(status, status_);
}

int LDIF_File::refresh() {
    const bool is_loaded = load_if_changed();
    if (is_loaded && has_invalid_lines_) {
        const update lock(*this);
        load_if_changed();  // another process may have been first
        if (has_invalid_lines_) {
            flush();
        }
    }
    return is_loaded ? 1 : 0;
}

/// Nobody shall write while the file is read. In an update nobody does: it has the lock.
locked_file LDIF_File::locked_for_reading() {
    if (!is_updated_) {
        return locked(O_RDONLY, LOCK_SH);
    }
    locked_file file = locked(O_RDONLY, without_lock);
    if (file && !lock_) {
        errno = lock_error_;
        return {};
    }
    if (file && !is_same_file(file.status(), lock_.status())) {
        raise_changed();
    }
    return file;
}

bool LDIF_File::load_if_changed() {
    struct stat status;
    if (stat(file_name_.c_str(), &status) != 0) {
        raise_with(no_status, {}, name_file_and_errno(errno));
    }
    if (is_current(status)) {
        return false;
    }
    const locked_file file = locked_for_reading();
    if (!file) {
        raise_with(not_opened, {}, name_file_and_errno(errno));
    }
    is_loaded_ = is_whole_ = false;
    trailing_comment_.clear();
    root_.clear();
    text_.clear();  // in which they stood
    loader load(root_, trailing_comment_, key_);
    const auto body = [&] {
        if (!read_all(file.get(), static_cast<size_t>(file.status().st_size), text_)) {
            raise_with(not_read, {}, name_file_and_errno(errno));
        }
        require_finished(text_);
        load.run(text_);
    };
    with_boundary([] { return "reading file"; }, body,
                  [&](LDIF_Exception& e) {
                      name_file(e);
                      e.configLine = load.line_number();
                      e.entryDn = load.place();
                  });
    status_ = file.status();
    is_loaded_ = is_whole_ = true;
    has_invalid_lines_ = load.found_invalid_lines();
    return true;
}
