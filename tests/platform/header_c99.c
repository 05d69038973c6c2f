/* The header, included first and twice, in strict C99. */
#include "cfg32_platform.h"

#include <stdlib.h>

int use_from_c(void);

int use_from_c(void) {
    static const unsigned char bytes[16] = {0};
    char text[CFG32_PASSWORD_MAX];
    char* clear = NULL;
    struct aes_key_data* key = aes_key_data_from_bytes(bytes, sizeof bytes);
    int done = format_password(CFG32_PASSWORD_SELECTOR, CFG32_PASSWORD_FLAG, key, "secret", 6, text,
                               (int)sizeof text) &&
               !check_format(text, 10) && unformat_password(text, &clear, key, 0) &&
               nuv_snprintf(text, sizeof text, "%s", clear) == 6;
    _slapd_utils_decode_buffer_free(&clear);
    aes_key_data_free(key);
    initLocaleMutex();
    return done && pthread_mutex_lock(&set_locale_mutex) == 0 &&
           pthread_mutex_unlock(&set_locale_mutex) == 0 && !copyFile("", "", NULL, NULL, 0600) &&
           aes_key_data_from_file("") == NULL;
}
