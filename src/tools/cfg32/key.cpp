// The key of encoded passwords.

#include "key.h"

#include <cerrno>
#include <cstring>

#include "cfg32_platform.h"
#include "outcome.h"
#include "settings.h"

namespace cfg32::tool {

key::key(const settings& options) {
    if (options.key_file.empty()) {
        return;
    }
    data_ = aes_key_data_from_file(options.key_file.c_str());
    if (!data_) {
        const int error = errno;
        throw ended(failed, options.key_file + ": " +
                                (error == EACCES   ? "a key file that others can read is not used"
                                 : error == EINVAL ? "a key file holds 16, 24 or 32 bytes"
                                                   : strerror(error)));
    }
}

key::~key() { aes_key_data_free(data_); }

}  // namespace cfg32::tool
