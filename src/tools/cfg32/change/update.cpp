// Carrying out changes together: first on a private copy, then on the file.

#include "change/update.h"

#include <cstring>
#include <optional>

#include "LDIF_File.h"
#include "cfg32.h"
#include "change/record_changes.h"
#include "configuration.h"
#include "key.h"
#include "memory_file.h"
#include "outcome.h"
#include "terminal.h"
#include "whole_file.h"

namespace cfg32::tool {

namespace {

constexpr int simple_method = CFG_AUTH_SIMPLE;

/// The text with another file's name; messages may have one.
std::string renamed(std::string text, const std::string& from, const std::string& to) {
    const size_t place = text.find(from);
    return place == std::string::npos ? text : text.replace(place, from.size(), to);
}

/// A private copy of the configuration in memory, loaded.
class trial {
  public:
    trial(const std::string& text, aes_key_data* key) : copy_(text), file_(copy_.name(), {}, key) {}

    LDIF_File& file() { return file_; }
    const std::string& name() const { return copy_.name(); }
    std::string text() const { return copy_.text(); }

  private:
    memory_file copy_;
    LDIF_File file_;
};

class updater {
  public:
    updater(const settings& options, const std::vector<change_record>& records,
            const update_options& how)
        : options_(options),
          records_(records),
          how_(how),
          source_{how.source, options.file_name()},
          key_(options) {}

    update_result run();

  private:
    const std::string& name() const { return source_.configuration; }

    void require_expected() const;
    void load();
    void tell_unused_lines();
    void bind(const secret& password);
    void check_records();
    void skip(size_t number, const refused_record& refused);
    std::optional<bool> carry_out_all();
    void try_records();
    std::string flushed_text();
    bool is_written();
    std::vector<skipped_record> skipped() const;

    const settings& options_;
    const std::vector<change_record>& records_;
    const update_options& how_;
    const record_source source_;
    const key key_;
    std::vector<std::optional<std::string>> reasons_;  // why a record is left out
    std::optional<trial> trial_;
    bool is_repaired_ = false;  // by the load
    update_result result_;
};

update_result updater::run() {
    const secret password = options_.bind_dn.empty() ? secret() : options_.bind_password();
    const progress changing("Changing " + name());
    do {
        result_.before = read_configuration(name());
        require_expected();
        reasons_.assign(records_.size(), std::nullopt);
        load();
        bind(password);
        check_records();
        try_records();
    } while (result_.is_changed && !options_.is_dry_run && !is_written());
    result_.skipped = skipped();
    if (result_.is_changed) {
        tell_unused_lines();
    }
    return std::move(result_);
}

void updater::require_expected() const {
    if (how_.based_on && *how_.based_on != result_.before) {
        fail(CFG_BUSY, name() + " was changed meanwhile; nothing was written: try again");
    }
}

void updater::load() {
    try {
        trial_.emplace(result_.before, key_.get());
    } catch (const LDIF_Exception& e) {
        if (e.sysErrno != 0) {  // there is nothing to be found in the file
            fail(e.ldapErr, name() + ": " + strerror(e.sysErrno));
        }
        const char* hint = result_.before.starts_with(unfinished_mark)
                               ? "`cfg32 restore` puts the backup back"
                               : "`cfg32 check` tells everything that is wrong";
        throw ended(failed, report(e, name()) + "\n  hint: " + hint);
    }
    is_repaired_ = trial_->text() != result_.before;
}

/// The change kept aside, or lost, what could not be used.
void updater::tell_unused_lines() {
    if (!is_repaired_ && !loses_text(result_.before)) {
        return;
    }
    const std::vector<problem> unused = unused_lines(result_.before, key_.get());
    if (!unused.empty()) {
        tell_unused(name(), "not all of it could be used", unused);
    }
}

void updater::bind(const secret& password) {
    if (options_.bind_dn.empty()) {
        return;
    }
    try {
        if (trial_->file().setAuthentication(options_.bind_dn.c_str(), password.c_str(),
                                             simple_method) == LDIF_File::administrator) {
            return;
        }
    } catch (const LDIF_Exception& e) {
        throw ended(failed, report(e, name()));
    }
    fail(CFG_INVALID_CREDENTIALS, name() + ": not the administrator's DN and password");
}

void updater::skip(size_t number, const refused_record& refused) {
    reasons_[number] = refused.message;
}

/// All failures are told, not only the first.
void updater::check_records() {
    std::string failures;
    for (size_t i = 0; i < records_.size(); ++i) {
        try {
            check_record(records_[i], source_, key_.get());
        } catch (const refused_record& refused) {
            skip(i, refused);
            failures += (failures.empty() ? "" : "\n") + refused.message;
        }
    }
    if (!failures.empty() && !how_.goes_on) {
        throw ended(failed, failures);
    }
}

/// Returns whether anything changed; nothing when a record was refused that may have been carried
/// out in part.
std::optional<bool> updater::carry_out_all() {
    bool is_changed = false;
    for (size_t i = 0; i < records_.size(); ++i) {
        if (reasons_[i]) {
            continue;
        }
        try {
            is_changed |= carry_out(trial_->file(), records_[i], how_, source_, key_.get());
        } catch (const refused_record& refused) {
            if (!how_.goes_on) {
                throw ended(failed, refused.message);
            }
            skip(i, refused);
            if (refused.may_be_half_done) {
                return std::nullopt;
            }
        }
    }
    return is_changed;
}

/// Carries the records out on the private copy, which is made anew without each that left a part.
void updater::try_records() {
    if (options_.is_dry_run) {
        result_.canonical = flushed_text();
    }
    std::optional<bool> is_changed;
    while (!(is_changed = carry_out_all())) {
        load();
    }
    result_.is_changed = *is_changed;
    result_.after = result_.before;
    if (!result_.is_changed) {
        return;
    }
    result_.after = flushed_text();
}

/// What a write makes of the private copy.
std::string updater::flushed_text() {
    try {
        trial_->file().flush();
        return trial_->text();
    } catch (const LDIF_Exception& e) {
        throw ended(failed, renamed(report(e, name()), trial_->name(), name()));
    }
}

/// Puts what the private copy has become in the place of the file, if that still is what was
/// copied.
bool updater::is_written() {
    try {
        replace_file(name(), options_.backup_name(), result_.after, result_.before);
        return true;
    } catch (const LDIF_Exception& e) {
        if (e.ldapErr != CFG_BUSY || read_without_waiting(name()) == result_.before) {
            throw ended(failed, report(e, name()));
        }
        return false;  // somebody was faster: again, with what they left
    }
}

std::vector<skipped_record> updater::skipped() const {
    std::vector<skipped_record> skipped;
    for (size_t i = 0; i < records_.size(); ++i) {
        if (reasons_[i]) {
            skipped.push_back({records_[i].line, records_[i].dn, *reasons_[i]});
        }
    }
    return skipped;
}

}  // namespace

update_result update(const settings& options, const std::vector<change_record>& records,
                     const update_options& how) {
    return updater(options, records, how).run();
}

}  // namespace cfg32::tool
