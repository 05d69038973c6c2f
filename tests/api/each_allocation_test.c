/*
 * Every exported call on the example configuration, each time with another of its allocations
 * failing, alone and with all that follow it: the call gives its answer or a documented failure,
 * leaves no memory and no half-written file behind, and gives its answer when it is made again.
 *
 * usage: each_allocation_test; the environment names the example's folder (EXAMPLES) and the list
 * of the exported calls (EXPORTS).
 */

#include <dirent.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include "allocation_rows.h"
#include "allocator.h"
#include "cfg32_platform.h"

/* Tells whether a text is one of those in a list, which are separated by "|". */
static int is_one_of(const char *text, const char *list) {
    const size_t length = strlen(text);
    for (; list; list = strchr(list, '|') ? strchr(list, '|') + 1 : NULL) {
        if (strncmp(text, list, length) == 0 && (list[length] == '\0' || list[length] == '|')) {
            return 1;
        }
    }
    return 0;
}

/* ---- what is left in the folder ---- */

/* A file without the bytes of encoded passwords, which differ each time; null if there is none. */
static char *text_of(const char *path) {
    char *text = file_exists(path) ? read_file(path) : NULL;
    for (char *password = text; password && (password = strstr(password, "PW: "));) {
        char *end = strchr(password += 4, '\n');
        memset(password, '#', (size_t)(end - password));
    }
    return text;
}

/* The number of files beside the configuration, with it. */
static int count_files(const struct scene *s) {
    int count = 0;
    char *folder = path_of(s->f, "etc");
    DIR *stream = opendir(folder);
    assert_non_null(stream);
    for (const struct dirent *entry; (entry = readdir(stream));) {
        count += strcmp(entry->d_name, ".") != 0 && strcmp(entry->d_name, "..") != 0;
    }
    closedir(stream);
    free(folder);
    return count;
}

/* What a call is to leave when it is done. */
struct expectation {
    char *answer;
    char *before; /* the configuration file */
    char *after;
    int is_backed_up;
};

/* The file is a complete version, as what the call has done says, and so is the backup. */
static void assert_complete(const struct scene *s, const struct expectation *expected,
                            int is_done) {
    char *text = text_of(s->f->config);
    char *backup = text_of(s->backup);
    assert_string_equal(text, is_done ? expected->after : expected->before);
    if (backup || (is_done && expected->is_backed_up)) {
        assert_text(backup, expected->before);
    }
    assert_int_equal(count_files(s), s->files + (backup != NULL));
    free(backup);
    free(text);
}

/* Tells whether the file is no more what it was. */
static int is_rewritten(const struct scene *s, const struct expectation *expected) {
    char *text = text_of(s->f->config);
    const int is_equal = strcmp(text, expected->before) == 0;
    free(text);
    return !is_equal;
}

/* ---- one call ---- */

static void begin(struct scene *s, const struct row *row) {
    write_file(s->f->config, s->example);
    remove(s->backup);
    s->files = count_files(s);
    s->handle = cfg_init();
    assert_non_null(s->handle);
    row->prepare(s);
}

static void end(struct scene *s) {
    cfg_ber_free(s->cursor);
    cfg_msgfree(s->result);
    cfg_value_free(s->values);
    cfg_memfree(s->text);
    if (s->handle) {
        cfg_unbind(s->handle);
    }
    s->cursor = NULL;
    s->result = NULL;
    s->values = NULL;
    s->text = NULL;
    s->handle = NULL;
}

/* The call's answer, to be freed. */
static char *answer_of(struct scene *s, const struct row *row) {
    char *text = NULL;
    size_t length = 0;
    FILE *out = open_memstream(&text, &length);
    assert_non_null(out);
    row->tell(s, out);
    fclose(out);
    return text;
}

static int has_line(const char *text, const char *line) {
    const size_t length = strcspn(text, "\n");
    return (strlen(line) == length && strncmp(text, line, length) == 0) ||
           (text[length] != '\0' && has_line(text + length + 1, line));
}

/* It is the answer that the row is there for, and not a refusal that nobody thought of. */
static void assert_answer(const struct row *row, const char *answer) {
    if (!has_line(answer, row->answer)) {
        fail_msg("%s, %s: without the line \"%s\":\n%s", row->call, row->of, row->answer, answer);
    }
}

/* The answer, and what is left, when nothing fails. */
static struct expectation expect(struct scene *s, const struct row *row) {
    struct expectation expected;
    begin(s, row);
    expected.before = text_of(s->f->config);
    row->make(s);
    expected.answer = answer_of(s, row);
    assert_answer(row, expected.answer);
    expected.after = text_of(s->f->config);
    expected.is_backed_up = file_exists(s->backup);
    end(s);
    return expected;
}

static void forget(struct expectation *expected) {
    free(expected->answer);
    free(expected->before);
    free(expected->after);
}

/* Once more: what had been done in memory only is done now. */
static void make_again(struct scene *s, const struct row *row, const struct expectation *expected) {
    row->make(s);
    char *again = answer_of(s, row);
    if (strcmp(again, expected->answer) != 0) {
        if (!row->done_before || !is_one_of(again, row->done_before)) {
            fail_msg("%s, %s, made again: %s", row->call, row->of, again);
        }
        if (strcmp(expected->before, expected->after) != 0) {
            assert_int_equal(cfg_flush_s(s->handle), CFG_SUCCESS);
        }
    }
    assert_complete(s, expected, 1);
    free(again);
}

typedef void (*failing)(unsigned kinds, long n);

/* Makes the call with its nth allocation failing. Returns how many failed. */
static long make_with_failure(struct scene *s, const struct row *row,
                              const struct expectation *expected, failing begin_failing, long n) {
    begin(s, row);
    begin_failing(call_any, n);
    row->make(s);
    const long failed = stop_failing();
    char *answer = answer_of(s, row);
    const int is_done = strcmp(answer, expected->answer) == 0;
    if (!is_done && (failed == 0 || !row->failures || !is_one_of(answer, row->failures))) {
        fail_msg("%s, %s, allocation %ld: %s", row->call, row->of, n, answer);
    }
    free(answer);
    assert_complete(s, expected,
                    is_done || (row->besides & repairs_first && is_rewritten(s, expected)));
    if (!is_done) {
        make_again(s, row, expected);
    }
    end(s);
    return failed;
}

/* Makes it until no block is left: what the C library makes once and keeps, a locale's table after
 * the other, is made by then. */
static long make_without_leak(struct scene *s, const struct row *row,
                              const struct expectation *expected, failing begin_failing, long n) {
    for (int times = 0; times < 20; ++times) {
        const long before = live_blocks();
        const long failed = make_with_failure(s, row, expected, begin_failing, n);
        if (live_blocks() - before <= (row->besides & loses_a_block ? 1 : 0)) {
            return failed;
        }
    }
    fail_msg("%s, %s, allocation %ld: blocks are left each time", row->call, row->of, n);
    return 0;
}

/* A sanitizer looks for leaks in another way, but takes long; so does what counts the lines. */
#ifdef SAMPLES_ONLY
enum { step = 23 };
#else
enum { step = 1 };
#endif

static void survive(struct scene *s, const struct row *row) {
    static const failing ways[] = {fail_call, fail_calls_from};
    struct expectation expected = expect(s, row);
    for (size_t i = 0; i < LENGTH(ways); ++i) {
        long n = 1;
        while (make_without_leak(s, row, &expected, ways[i], n) > 0) {
            n += step;
        }
        /* A row whose call never fails claims no failure. */
        if (!row->failures != (n == 1)) {
            fail_msg("%s, %s: %s", row->call, row->of, n == 1 ? "allocates nothing" : "can fail");
        }
    }
    forget(&expected);
}

/* ---- the tests ---- */

/* For the sanitizer: setlocale() of the GNU C library can lose a name without memory. */
const char *__lsan_default_suppressions(void);
const char *__lsan_default_suppressions(void) { return "leak:setlocale\nleak:_nl_\n"; }

/* The key of the example's passwords. */
static struct aes_key_data *example_key(const char *examples) {
    char path[512];
    snprintf(path, sizeof path, "%s/oruslapd.key", examples);
    char *bytes = read_file(path);
    struct aes_key_data *key = aes_key_data_from_bytes((unsigned char *)bytes, strlen(bytes));
    assert_non_null(key);
    free(bytes);
    return key;
}

/* The file is where the default one is. */
static int set_up_scene(void **state) {
    static struct scene s;
    const char *examples = getenv("EXAMPLES");
    char path[512];
    if (set_up(state) != 0) {
        return -1;
    }
    s.f = *state;
    snprintf(path, sizeof path, "%s/oruslapd.conf", examples);
    s.example = read_file(path);
    s.key = example_key(examples);
    snprintf(path, sizeof path, "%s/etc", s.f->folder);
    mkdir(path, 0700);
    snprintf(s.f->config, sizeof s.f->config, "%.150s/oruslapd.conf", path);
    s.backup = path_of(s.f, "etc/backup");
    setenv("NUV_INSTALL_PATH", s.f->folder, 1);
    *state = &s;
    return 0;
}

static int tear_down_scene(void **state) {
    struct scene *s = *state;
    void *f = s->f;
    free(s->example);
    free(s->backup);
    aes_key_data_free(s->key);
    return tear_down(&f);
}

/* Each row in a process of its own: what the C++ runtime keeps for exceptions without memory is in
 * ever smaller pieces the more were thrown. */
static void every_call_survives_each_failing_allocation(void **state) {
    for (const struct row *row = allocation_rows; row->call; ++row) {
        int status = 0;
        fflush(NULL);
        const pid_t child = fork();
        assert_true(child >= 0);
        if (child == 0) {
            survive(*state, row);
            exit(EXIT_SUCCESS);
        }
        assert_int_equal(waitpid(child, &status, 0), child);
        if (status != 0) {
            fail_msg("%s, %s: status %d", row->call, row->of, status);
        }
    }
}

static int has_row(const char *call) {
    const struct row *row = allocation_rows;
    while (row->call && strcmp(row->call, call) != 0) {
        ++row;
    }
    return row->call != NULL;
}

static void every_exported_call_has_a_row(void **state) {
    char word[128];
    int count = 0;
    (void)state;
    FILE *list = fopen(getenv("EXPORTS"), "r");
    assert_non_null(list);
    while (fscanf(list, "%127s", word) == 1) {
        char *end = strchr(word, ';');
        if (strncmp(word, "cfg_", 4) == 0 && end) {
            *end = '\0';
            ++count;
            if (!has_row(word)) {
                fail_msg("%s has no row", word);
            }
        }
    }
    fclose(list);
    assert_true(count > 0);
}

int main(void) {
    const struct CMUnitTest tests[] = {
        cmocka_unit_test(every_exported_call_has_a_row),
        cmocka_unit_test_setup_teardown(every_call_survives_each_failing_allocation, set_up_scene,
                                        tear_down_scene),
    };
    /* Thousands of files are written, and each is waited for. */
    if (access("/dev/shm", W_OK) == 0) {
        setenv("TMPDIR", "/dev/shm", 0);
    }
    return cmocka_run_group_tests_name("each_allocation", tests, NULL, NULL);
}
