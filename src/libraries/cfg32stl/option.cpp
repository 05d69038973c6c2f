// The options of a handle.

#include <algorithm>
#include <atomic>
#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <iterator>

#include "LDIF_AttrType.h"
#include "LDIF_Value.h"
#include "handle.h"

namespace {

/// Where an option is kept: exactly one of the members is set.
struct option {
    int id;
    unsigned int flag;                ///< a bit of the handle's flags
    std::atomic<bool>* process_flag;  ///< shared by all handles
    char* CfgHandle::*text;           ///< a file name
    aes_key_data* CfgHandle::*key;
};

constexpr option options[] = {
    {CFG_OPT_FLAG_A, 0x1, nullptr, nullptr, nullptr},
    {CFG_OPT_FLAG_B, 0x2, nullptr, nullptr, nullptr},
    {CFG_OPT_SHOW_SOURCE, 0, &LDIF_Exception::showSource, nullptr, nullptr},
    {CFG_OPT_SHOW_STACK, 0, &LDIF_Exception::showStack, nullptr, nullptr},
    {CFG_OPT_DELETE_NON_LEAVES, 0x4, nullptr, nullptr, nullptr},
    {CFG_OPT_CONFIG_FILE, 0, nullptr, &CfgHandle::fileName, nullptr},
    {CFG_OPT_BACKUP_FILE, 0, nullptr, &CfgHandle::backupFileName, nullptr},
    {CFG_OPT_KEY_DATA, 0, nullptr, nullptr, &CfgHandle::keyData},
};

const option* find_option(int id) {
    const auto has_id = [id](const option& row) { return row.id == id; };
    const option* row = std::find_if(std::begin(options), std::end(options), has_id);
    return row == std::end(options) ? nullptr : row;
}

/// Sets a file name, checked and normalised by the syntax of file names.
int set_file_name(char*& name, const char* text) {
    if (!text) {
        free(name);
        name = nullptr;
        return CFG_SUCCESS;
    }
    static const _AttrType* const fileAttribute = getAttrType("oru-slapdIncludeSchema");
    try {
        char* copy = strdup(LDIF_Value(fileAttribute, text, nullptr).str().c_str());
        if (!copy) {
            return CFG_NO_MEMORY;
        }
        free(name);
        name = copy;
        return CFG_SUCCESS;
    } catch (const LDIF_Exception& e) {
        return e.sysErrno == ENOMEM ? CFG_NO_MEMORY : e.ldapErr;
    } catch (...) {
        return CFG_NO_MEMORY;
    }
}

}  // namespace

int cfg_get_option(CfgHandle* handle, int id, void* out) noexcept {
    if (!handle || !out) {
        return CFG_PARAM_ERROR;
    }
    const option* row = find_option(id);
    if (!row) {
        return CFG_SUCCESS;
    }
    if (row->text) {
        const char* text = handle->*row->text;
        *static_cast<char**>(out) = text ? strdup(text) : nullptr;
    } else if (row->key) {
        *static_cast<aes_key_data**>(out) = handle->*row->key;
    } else {
        const bool is_on =
            row->process_flag ? row->process_flag->load() : (handle->flags & row->flag) != 0;
        *static_cast<int*>(out) = is_on ? 1 : 0;
    }
    return CFG_SUCCESS;
}

int cfg_set_option(CfgHandle* handle, int id, const void* value) noexcept {
    if (!handle) {
        return CFG_PARAM_ERROR;
    }
    const option* row = find_option(id);
    if (!row) {
        return CFG_SUCCESS;
    }
    if (row->text) {
        return set_file_name(handle->*row->text, static_cast<const char*>(value));
    }
    if (row->key) {
        handle->*row->key = static_cast<aes_key_data*>(const_cast<void*>(value));
    } else if (row->process_flag) {
        *row->process_flag = value != nullptr;
    } else {
        handle->flags = value ? handle->flags | row->flag : handle->flags & ~row->flag;
    }
    return CFG_SUCCESS;
}
