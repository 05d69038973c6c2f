#include "host_routines.h"

#include <stdarg.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>

#include "cfg32_platform.h"

struct host_record host;

pthread_mutex_t set_locale_mutex = PTHREAD_MUTEX_INITIALIZER;

void reset_host(void) {
    memset(&host, 0, sizeof host);
    host.install_path = "/host";
    host.copy_succeeds = 1;
    host.decode_result = 1;
}

static void keep(char *to, size_t size, const char *text) {
    snprintf(to, size, "%s", text ? text : "(null)");
}

/* A copy from malloc. */
static char *copy_of(const char *text) {
    char *copy = malloc(strlen(text) + 1);
    return copy ? strcpy(copy, text) : NULL;
}

void initLocaleMutex(void) { ++host.initialised_locale; }

char *getNUVInstallPath(void) { return host.install_path ? copy_of(host.install_path) : NULL; }

int nuv_snprintf(char *buffer, size_t size, const char *format, ...) {
    va_list arguments;
    va_start(arguments, format);
    const int length = vsnprintf(buffer, size, format, arguments);
    va_end(arguments);
    ++host.formatted;
    return length;
}

bool copyFile(const char *source, const char *target, const char *owner, const char *group,
              mode_t mode) {
    ++host.copied;
    keep(host.copy_source, sizeof host.copy_source, source);
    keep(host.copy_target, sizeof host.copy_target, target);
    keep(host.copy_owner, sizeof host.copy_owner, owner);
    keep(host.copy_group, sizeof host.copy_group, group);
    host.copy_mode = mode;
    return host.copy_succeeds != 0;
}

int check_format(const char *text, int length) {
    if (length != (int)strlen(text)) {
        return 1;
    }
    return *text && *text != '>' && strncmp(text, "{HOST}", 6) != 0;
}

int format_password(int selector, int flag, struct aes_key_data *key, const char *clear, int length,
                    char *out, int out_size) {
    ++host.encoded;
    host.encode_selector = selector;
    host.encode_flag = flag;
    host.encode_key = key;
    keep(host.encode_text, sizeof host.encode_text, clear);
    host.encode_length = length;
    host.encode_size = out_size;
    host.encode_buffer_was_zero = 1;
    for (int i = 0; i < out_size; ++i) {
        host.encode_buffer_was_zero = host.encode_buffer_was_zero && out[i] == '\0';
    }
    return snprintf(out, (size_t)out_size, "{HOST}%.*s", length, clear) < out_size;
}

int unformat_password(const char *encoded, char **clear, struct aes_key_data *key, int flag) {
    static const char *const tags[] = {"{HOST}", "{iMASK}>"};
    const int can_decode =
        host.decode_result != 0 && (host.decodable == 0 || host.decoded < host.decodable);
    ++host.decoded;
    keep(host.decode_text, sizeof host.decode_text, encoded);
    host.decode_key = key;
    host.decode_flag = flag;
    host.decode_result_was_null = *clear == NULL;
    for (size_t i = 0; i < sizeof tags / sizeof *tags; ++i) {
        if (can_decode && strncmp(encoded, tags[i], strlen(tags[i])) == 0) {
            *clear = copy_of(encoded + strlen(tags[i]));
            if (host.on_clear) {
                host.on_clear(*clear);
            }
            return host.decode_result;
        }
    }
    return 0;
}

void _slapd_utils_decode_buffer_free(char **clear) {
    ++host.freed;
    if (clear) {
        free(*clear);
        *clear = NULL;
    }
}
