// The error tables, and the exported calls that report the last failure of a handle.

#include "error.h"

#include <cstring>
#include <new>

#include "LDIF_Exception.h"
#include "cfg32.h"
#include "handle.h"

#define ERROR(code, text) {code, text},

const cfg32::error_text ldap_errlist[] = {
#include "ldap_errlist.def"
    {-1, nullptr},
};

const cfg32::error_text cfg_errlist[] = {
#include "cfg_errlist.def"
    {0, "Unknown error"},
};

#undef ERROR

namespace {

constexpr int last_ldap_code = 999;

const char* ldap_text(int code) {
    for (const cfg32::error_text* row = ldap_errlist; row->code != -1; ++row) {
        if (row->code == code) {
            return row->text;
        }
    }
    return "Unknown error";
}

const char* cfg_text(int code) {
    const cfg32::error_text* row = cfg_errlist;
    while (row->code != 0 && row->code != code) {
        ++row;
    }
    return row->text;
}

}  // namespace

const char* cfg_err2string(int code) noexcept {
    return code <= last_ldap_code ? ldap_text(code) : cfg_text(code);
}

int cfg_get_errno(CfgHandle* handle) noexcept { return handle ? handle->err : CFG_PARAM_ERROR; }

int cfg_get_exterror(CfgHandle* handle) noexcept {
    if (!handle) {
        return CFG_PARAM_ERROR;
    }
    const LDIF_Exception* e = handle->exception;
    return e && e->extErr != 0 ? e->extErr : handle->err;
}

void cfg_perror(CfgHandle*, const char*) noexcept {}

const char* cfg_dump_exception(CfgHandle* handle) noexcept {
    if (!handle) {
        return nullptr;
    }
    if (!handle->dumpText && handle->exception) {
        try {
            handle->dumpText = strdup(handle->exception->dump().c_str());
        } catch (const std::bad_alloc&) {
            return nullptr;
        }
    }
    return handle->dumpText;
}
