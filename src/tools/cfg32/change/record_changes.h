#pragma once

// Carrying out change records on a loaded configuration, in memory.

#include "change/change_record.h"
#include "change/update.h"

class LDIF_File;
struct aes_key_data;

namespace cfg32::tool {

/// Why a record can't be carried out: the whole of the message.
struct refused_record {
    std::string message;
    bool may_be_half_done;
};

/// Where messages say that a record stands.
struct record_source {
    std::string text;           ///< what the records' text is called; empty for none
    std::string configuration;  ///< the configuration file, for records without a text
};

/// Lets the syntaxes judge the record's DN and all its values. Throws refused_record.
void check_record(const change_record& record, const record_source& source, aes_key_data* key);

/// Carries the record out, except the parts that would change nothing. Returns whether anything
/// changed. Throws refused_record; where the update goes on without the record, what came before
/// the refused part is mostly undone then.
bool carry_out(LDIF_File& file, const change_record& record, const update_options& how,
               const record_source& source, aes_key_data* key);

}  // namespace cfg32::tool
