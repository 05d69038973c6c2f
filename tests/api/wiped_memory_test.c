/* The library's memory: all of it is released, and what was secret is wiped before. */

#include <string.h>

#include "allocator.h"
#include "fixture.h"
#include "host_routines.h"

#define BASE "cn=Configuration"

static void watch_clear_text(const char *clear) {
    if (strcmp(clear, "open sesame") == 0) {
        watch_block(clear, sizeof "open sesame");
    }
}

static void assert_freed_and_zero(size_t size) {
    const unsigned char *bytes = freed_bytes();
    assert_non_null(bytes);
    for (size_t i = 0; i < size; ++i) {
        assert_int_equal(bytes[i], 0);
    }
}

static void a_handle_is_wiped_when_it_is_released(void **state) {
    struct fixture *f = *state;
    watch_block(f->handle, 64);
    assert_int_equal(cfg_unbind(f->handle), CFG_SUCCESS);
    f->handle = NULL;
    assert_freed_and_zero(64);
}

static void a_decoded_password_is_wiped_when_its_result_is_freed(void **state) {
    char name[] = "oru-slapdMasterPW";
    char *attrs[] = {name, NULL};
    struct fixture *f = *state;
    reset_host();
    load(f, CONFIGURATION_HEAD "oru-slapdMasterPW: {HOST}open sesame\n");
    host.on_clear = watch_clear_text;
    CfgMessage *result = found(f->handle, BASE, CFG_SCOPE_BASE, NULL, attrs);
    host.on_clear = NULL;
    assert_null(freed_bytes());
    cfg_msgfree(result);
    assert_freed_and_zero(sizeof "open sesame");
}

/* A search that fails after it decoded a password: the second value can't be decoded. */
static void a_decoded_password_is_wiped_when_the_search_fails(void **state) {
    char name[] = "oru-slapdMasterPW";
    char *attrs[] = {name, NULL};
    struct fixture *f = *state;
    CfgMessage *result = NULL;
    reset_host();
    load(f, CONFIGURATION_HEAD "oru-slapdMasterPW: {HOST}open sesame\noru-slapdMasterPW: >x\n");
    host.on_clear = watch_clear_text;
    host.decoded = 0;
    host.decodable = 1;
    assert_int_equal(cfg_search_s(f->handle, BASE, CFG_SCOPE_BASE, NULL, attrs, 0, &result),
                     CFG_DECODING_ERROR);
    reset_host();
    assert_null(result);
    assert_freed_and_zero(sizeof "open sesame");
}

/* The second copy finds no memory: nobody else will see the first. */
static void the_copy_of_a_password_is_wiped_when_there_is_none_of_the_next(void **state) {
    char name[] = "oru-slapdMasterPW";
    char *attrs[] = {name, NULL};
    struct fixture *f = *state;
    reset_host();
    load(f, CONFIGURATION_HEAD
         "oru-slapdMasterPW: {HOST}open sesame\noru-slapdMasterPW: {HOST}other\n");
    CfgMessage *result = found(f->handle, BASE, CFG_SCOPE_BASE, NULL, attrs);
    watch_text("open sesame");
    fail_call(call_strdup, 2);
    char **values = cfg_get_values(f->handle, result, name);
    assert_int_equal(stop_failing(), 1);
    assert_null(values);
    assert_int_equal(cfg_get_errno(f->handle), CFG_NO_MEMORY);
    assert_int_equal(freed_with_text(), 0);
    values = cfg_get_values(f->handle, result, name);
    cfg_value_free(values);
    assert_int_equal(freed_with_text(), 1); /* copies that were given are the caller's to wipe */
    watch_text(NULL);
    cfg_msgfree(result);
}

static void use(const struct fixture *f, CfgHandle *handle) {
    CfgMessage *result = NULL;
    for (int i = 0; i < 2; ++i) {
        cfg_set_option(handle, CFG_OPT_BACKUP_FILE, "/a/name");
        cfg_set_option(handle, CFG_OPT_CONFIG_FILE, f->config);
        assert_int_equal(bind_administrator(handle), CFG_SUCCESS);
        assert_int_equal(cfg_search_s(handle, "cn", 0, NULL, NULL, 0, &result), 34);
        assert_non_null(cfg_dump_exception(handle));
    }
}

static void a_released_handle_leaves_nothing_behind(void **state) {
    struct fixture *f = *state;
    long before = 0;
    reset_host();
    /* What is made once and kept is made in the first round. */
    for (int round = 0; round < 2; ++round) {
        before = live_blocks();
        CfgHandle *handle = cfg_init();
        use(f, handle);
        assert_int_equal(cfg_unbind(handle), CFG_SUCCESS);
    }
    assert_int_equal(live_blocks(), before);
}

int main(void) {
    const struct CMUnitTest tests[] = {
        BOUND(a_handle_is_wiped_when_it_is_released),
        CREATED(a_released_handle_leaves_nothing_behind),
        CREATED(a_decoded_password_is_wiped_when_its_result_is_freed),
        CREATED(a_decoded_password_is_wiped_when_the_search_fails),
        CREATED(the_copy_of_a_password_is_wiped_when_there_is_none_of_the_next),
    };
    reset_host();
    return cmocka_run_group_tests_name("wiped_memory", tests, NULL, NULL);
}
