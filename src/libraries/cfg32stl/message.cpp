// The calls that walk and free search results. None of them touches the file.

#include "message.h"

#include <strings.h>

#include <cstdlib>
#include <cstring>
#include <utility>

#include "handle.h"

using namespace cfg32;

namespace {

/// Keeps an error code in the handle, if there is one; the call then returns null.
std::nullptr_t fail(CfgHandle* handle, int code) {
    if (handle) {
        handle->err = code;
    }
    return nullptr;
}

char* copy_of(CfgHandle* handle, const char* text) {
    char* copy = strdup(text);
    if (!copy) {
        fail(handle, CFG_NO_MEMORY);
    }
    return copy;
}

CfgMessage* find_attribute(CfgMessage* entry, const char* name) {
    CfgMessage* attribute = entry->child;
    while (attribute && (!attribute->text || strcasecmp(attribute->text, name) != 0)) {
        attribute = attribute->next;
    }
    return attribute;
}

/// Copies count texts from the chain into values; a result code.
int copy_values(const CfgMessage* value, int count, char** values) {
    for (int i = 0; i < count; ++i, value = value->next) {
        if (!value) {
            return CFG_OTHER;
        }
        values[i] = strdup(value->text ? value->text : "");
        if (!values[i]) {
            return CFG_NO_MEMORY;
        }
    }
    return CFG_SUCCESS;
}

/// Wipes the copies of passwords, which nobody else will.
void wipe_secrets(const CfgMessage* value, char** values) {
    for (char** copy = values; *copy; ++copy, value = value->next) {
        if (value->is_secret) {
            explicit_bzero(*copy, strlen(*copy));
        }
    }
}

}  // namespace

CfgMessage* cfg_first_entry(CfgHandle* handle, CfgMessage* result) noexcept {
    cfg_reset(handle);
    return result;
}

CfgMessage* cfg_next_entry(CfgHandle* handle, CfgMessage* entry) noexcept {
    cfg_reset(handle);
    return entry ? entry->next : nullptr;
}

int cfg_count_entries(CfgHandle* handle, CfgMessage* node) noexcept {
    if (cfg_reset(handle) != CFG_SUCCESS) {
        return CFG_PARAM_ERROR;
    }
    int count = 0;
    for (; node; node = node->next) {
        ++count;
    }
    return count;
}

int cfg_count_attributes(CfgHandle* handle, CfgMessage* entry) noexcept {
    return cfg_count_entries(handle, entry ? entry->child : nullptr);
}

char* cfg_first_attribute(CfgHandle* handle, CfgMessage* entry, CfgCursor** cursor) noexcept {
    cfg_reset(handle);
    if (!cursor) {
        return fail(handle, CFG_PARAM_ERROR);
    }
    *cursor = nullptr;
    if (!entry) {
        return fail(handle, CFG_PARAM_ERROR);
    }
    auto* place = static_cast<CfgCursor*>(calloc(1, sizeof(CfgCursor)));
    if (!place) {
        return fail(handle, CFG_NO_MEMORY);
    }
    place->attribute = entry->child;
    *cursor = place;
    if (!entry->child || !entry->child->text) {
        return nullptr;
    }
    char* name = copy_of(handle, entry->child->text);
    if (!name) {
        free(std::exchange(*cursor, nullptr));
    }
    return name;
}

char* cfg_next_attribute(CfgHandle* handle, CfgMessage*, CfgCursor* cursor) noexcept {
    cfg_reset(handle);
    if (!cursor) {
        return fail(handle, CFG_PARAM_ERROR);
    }
    if (!cursor->attribute) {
        return nullptr;
    }
    cursor->attribute = cursor->attribute->next;
    const bool has_name = cursor->attribute && cursor->attribute->text;
    return has_name ? copy_of(handle, cursor->attribute->text) : nullptr;
}

char** cfg_get_values(CfgHandle* handle, CfgMessage* entry, const char* name) noexcept {
    cfg_reset(handle);
    if (!entry || !name) {
        return fail(handle, CFG_PARAM_ERROR);
    }
    CfgMessage* attribute = find_attribute(entry, name);
    if (!attribute) {
        return fail(handle, CFG_NO_SUCH_ATTRIBUTE);
    }
    // KEPT: without a handle the count is 89, whatever there is.
    const int count = cfg_count_entries(handle, attribute->child);
    if (count == 0) {
        return nullptr;
    }
    auto** values = static_cast<char**>(calloc(static_cast<size_t>(count) + 1, sizeof(char*)));
    if (!values) {
        return fail(handle, CFG_NO_MEMORY);
    }
    if (const int code = copy_values(attribute->child, count, values); code != CFG_SUCCESS) {
        wipe_secrets(attribute->child, values);
        cfg_value_free(values);
        return fail(handle, code);
    }
    return values;
}

int cfg_count_values(char** values) noexcept {
    int count = 0;
    while (values && values[count]) {
        ++count;
    }
    return count;
}

void cfg_value_free(char** values) noexcept {
    for (char** value = values; value && *value; ++value) {
        free(*value);
    }
    free(values);
}

char* cfg_get_dn(CfgHandle* handle, CfgMessage* entry) noexcept {
    cfg_reset(handle);
    if (!entry || !entry->text || entry->kind != entry_message) {
        return fail(handle, CFG_PARAM_ERROR);
    }
    return copy_of(handle, entry->text);
}

int cfg_msgfree(CfgMessage* node) noexcept {
    // Along the chain by a loop, down by recursion: a result is only three levels deep.
    while (node) {
        CfgMessage* next = node->next;
        cfg_msgfree(node->child);
        if (node->is_secret) {
            explicit_bzero(node->text, strlen(node->text));
        }
        free(node->text);
        free(node);
        node = next;
    }
    return CFG_SUCCESS;
}

void cfg_ber_free(CfgCursor* cursor) noexcept { free(cursor); }

void cfg_memfree(void* text) noexcept { free(text); }
