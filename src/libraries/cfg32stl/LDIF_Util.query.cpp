// The exported calls that tell where the last failure was and what would have been allowed, and
// cfg_tree_view.

#include <cstring>
#include <exception>

#include "LDIF_AttrType.h"
#include "LDIF_File.h"
#include "LDIF_Util.h"
#include "handle.h"

using namespace cfg32;

namespace {

const LDIF_Exception* failure_of(const CfgHandle* handle) {
    return handle ? handle->exception : nullptr;
}

/// The attribute type that the last failure violated, or null.
const _AttrType* type_of(const CfgHandle* handle) {
    const LDIF_Exception* e = failure_of(handle);
    return e ? e->attrType : nullptr;
}

}  // namespace

const char* cfg_get_file_name(CfgHandle* handle) noexcept {
    if (!handle) {
        return nullptr;
    }
    if (handle->exception && !handle->exception->configFile.empty()) {
        return handle->exception->configFile.c_str();
    }
    if (is_bound(*handle)) {
        return handle->file->getFileName();
    }
    return handle->fileName ? handle->fileName : getDefaultConfigFilename();
}

int cfg_get_file_line(CfgHandle* handle) noexcept {
    const LDIF_Exception* e = failure_of(handle);
    return e ? e->configLine : 0;
}

const char* cfg_get_entry(CfgHandle* handle) noexcept {
    const LDIF_Exception* e = failure_of(handle);
    return e ? e->entryDn.c_str() : nullptr;
}

// KEPT: null, not "", when neither an attribute nor a type is known.
const char* cfg_get_attribute(CfgHandle* handle) noexcept {
    const LDIF_Exception* e = failure_of(handle);
    if (e && !e->attribute.empty()) {
        return e->attribute.c_str();
    }
    const _AttrType* type = type_of(handle);
    return type ? type->name : nullptr;
}

const char* cfg_get_value(CfgHandle* handle) noexcept {
    const LDIF_Exception* e = failure_of(handle);
    return e ? e->value.c_str() : nullptr;
}

const char* const* cfg_get_enum(CfgHandle* handle) noexcept {
    const _AttrType* type = type_of(handle);
    return type ? type->enumValues : nullptr;
}

int64_t cfg_get_bitmask(CfgHandle* handle) noexcept {
    const _AttrType* type = type_of(handle);
    return type ? type->bitmask : 0;
}

int64_t cfg_get_minimum(CfgHandle* handle) noexcept {
    const _AttrType* type = type_of(handle);
    return type ? type->minimum : 0;
}

int64_t cfg_get_maximum(CfgHandle* handle) noexcept {
    const _AttrType* type = type_of(handle);
    return type ? type->maximum : 0;
}

int cfg_get_is_single(CfgHandle* handle) noexcept {
    const _AttrType* type = type_of(handle);
    return type && type->isSingle ? 1 : 0;
}

char* cfg_tree_view(CfgHandle* handle, int style) noexcept {
    if (!handle) {
        return nullptr;
    }
    if (!handle->treeText && is_bound(*handle)) {
        try {
            handle->treeText = strdup(handle->file->treeView(style != 0).c_str());
        } catch (const std::exception&) {
            // The handle still tells of the last call that failed, not of this one.
            return nullptr;
        }
    }
    return handle->treeText;
}
