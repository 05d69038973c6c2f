/* Files that other programs have in use. They are real processes: a lock belongs to its holder. */

#include <errno.h>
#include <fcntl.h>
#include <pthread.h>
#include <signal.h>
#include <stdio.h>
#include <stdlib.h>
#include <sys/file.h>
#include <sys/wait.h>
#include <unistd.h>

#include "changes.h"

/* ---- the other process ---- */

/* A process that holds a lock until it is told to let go. */
struct holder {
    pid_t process;
    int orders; /**< closing it ends the process */
};

static void hold(const char *path, int operation, int ready, int orders) {
    char byte = 'r';
    const int file = open(path, O_RDWR);
    if (file < 0 || flock(file, operation) != 0 || write(ready, &byte, 1) != 1) {
        _exit(1);
    }
    _exit(read(orders, &byte, 1) == 0 ? 0 : 1);
}

/* Returns when the lock is held. */
static struct holder hold_lock(const char *path, int operation) {
    int ready[2];
    int orders[2];
    char byte;
    assert_int_equal(pipe(ready), 0);
    assert_int_equal(pipe(orders), 0);
    const struct holder holder = {fork(), orders[1]};
    assert_true(holder.process >= 0);
    if (holder.process == 0) {
        close(ready[0]);
        close(orders[1]);
        hold(path, operation, ready[1], orders[0]);
    }
    close(ready[1]);
    close(orders[0]);
    assert_int_equal(read(ready[0], &byte, 1), 1);
    close(ready[0]);
    return holder;
}

static void let_go(struct holder holder) {
    int status = -1;
    close(holder.orders);
    assert_int_equal(waitpid(holder.process, &status, 0), holder.process);
    assert_int_equal(status, 0);
}

/* ---- calls, each in its own thread with a handle of its own ---- */

/* Those that read stand first. */
enum { readers = 2, all_calls = readers + LENGTH(update_calls) };

struct attempt {
    const char *name;
    int (*run)(CfgHandle *handle);
    CfgHandle *handle;
    pthread_t thread;
    int code;
};

static void *run_attempt(void *argument) {
    struct attempt *attempt = argument;
    attempt->code = attempt->run(attempt->handle);
    return NULL;
}

static struct attempt attempt_of(const struct fixture *f, const char *name, int (*run)(CfgHandle *),
                                 CfgHandle *handle) {
    const struct attempt attempt = {.name = name, .run = run, .handle = handle, .code = -1};
    cfg_set_option(handle, CFG_OPT_CONFIG_FILE, f->config);
    return attempt;
}

static void prepare(const struct fixture *f, struct attempt *attempts) {
    load_entries(f, update_entries);
    attempts[0] = attempt_of(f, "cfg_bind_s", bind_administrator, cfg_init());
    attempts[1] = attempt_of(f, "cfg_search_s", search_all, second_handle(f));
    for (size_t i = 0; i < LENGTH(update_calls); ++i) {
        attempts[readers + i] =
            attempt_of(f, update_calls[i].name, update_calls[i].run, second_handle(f));
    }
    /* Everybody has to read it again. */
    write_entries(f, update_entries);
}

static void start(struct attempt *attempts) {
    for (size_t i = 0; i < all_calls; ++i) {
        assert_int_equal(pthread_create(&attempts[i].thread, NULL, run_attempt, &attempts[i]), 0);
    }
}

static void join(struct attempt *attempts) {
    for (size_t i = 0; i < all_calls; ++i) {
        assert_int_equal(pthread_join(attempts[i].thread, NULL), 0);
    }
}

static void release(struct attempt *attempts) {
    for (size_t i = 0; i < all_calls; ++i) {
        cfg_unbind(attempts[i].handle);
    }
}

static void assert_busy(const struct fixture *f, const struct attempt *attempt) {
    if (attempt->code != CFG_BUSY) {
        fail_msg("%s: %d", attempt->name, attempt->code);
    }
    assert_int_equal(cfg_get_exterror(attempt->handle), CFG_BUSY);
    assert_report_has(attempt->handle, CFG_BUSY,
                      "\nmsg     Configuration file is in use by another process\n");
    assert_report_has(attempt->handle, CFG_BUSY, f->config);
    assert_string_equal(cfg_get_file_name(attempt->handle), f->config);
}

static void assert_done(const struct attempt *attempt) {
    if (attempt->code != CFG_SUCCESS) {
        fail_msg("%s: %d %s", attempt->name, attempt->code, cfg_dump_exception(attempt->handle));
    }
    assert_no_report(attempt->handle, CFG_SUCCESS);
}

/* All three changes, whatever their order. */
static void assert_all_changes(const struct fixture *f) {
    assert_entries(f, A_LINES("cn: A\nnote: new\n") ENTRY("cn=C", "cn: C\nnote: c\n"));
}

/* ---- the tests ---- */

static void while_another_process_has_the_file_every_call_gives_51(void **state) {
    struct fixture *f = *state;
    struct attempt attempts[all_calls];
    prepare(f, attempts);
    const struct holder holder = hold_lock(f->config, LOCK_EX);
    start(attempts);
    join(attempts);
    for (size_t i = 0; i < all_calls; ++i) {
        assert_busy(f, &attempts[i]);
    }
    assert_entries(f, update_entries);
    let_go(holder);
    /* Afterwards they all go through; what was given up was not half made. */
    for (size_t i = 0; i < all_calls; ++i) {
        attempts[i].code = attempts[i].run(attempts[i].handle);
        assert_done(&attempts[i]);
    }
    assert_all_changes(f);
    release(attempts);
}

static void a_reader_keeps_updates_out_but_no_other_reader(void **state) {
    struct fixture *f = *state;
    struct attempt attempts[all_calls];
    prepare(f, attempts);
    const struct holder holder = hold_lock(f->config, LOCK_SH);
    start(attempts);
    join(attempts);
    for (size_t i = 0; i < all_calls; ++i) {
        i < readers ? assert_done(&attempts[i]) : assert_busy(f, &attempts[i]);
    }
    assert_entries(f, update_entries);
    let_go(holder);
    release(attempts);
}

static void when_the_holder_lets_go_the_calls_go_on(void **state) {
    struct fixture *f = *state;
    struct attempt attempts[all_calls];
    prepare(f, attempts);
    const struct holder holder = hold_lock(f->config, LOCK_EX);
    start(attempts);
    /* Long enough for a call that does not wait. */
    usleep(200000);
    for (size_t i = 0; i < all_calls; ++i) {
        assert_int_equal(pthread_tryjoin_np(attempts[i].thread, NULL), EBUSY);
    }
    let_go(holder);
    join(attempts);
    for (size_t i = 0; i < all_calls; ++i) {
        assert_done(&attempts[i]);
    }
    assert_all_changes(f);
    release(attempts);
}

static void a_holder_that_dies_has_let_go(void **state) {
    struct fixture *f = *state;
    load_entries(f, update_entries);
    FOR_EACH_UPDATE_CALL(call) {
        const struct holder holder = hold_lock(f->config, LOCK_EX);
        assert_int_equal(kill(holder.process, SIGKILL), 0);
        assert_int_equal(waitpid(holder.process, NULL, 0), holder.process);
        close(holder.orders);
        assert_int_equal(call->run(f->handle), CFG_SUCCESS);
    }
    assert_all_changes(f);
}

static void a_search_of_an_unchanged_file_does_not_ask_for_it(void **state) {
    struct fixture *f = *state;
    load_entries(f, update_entries);
    const struct holder holder = hold_lock(f->config, LOCK_EX);
    assert_int_equal(search_all(f->handle), CFG_SUCCESS);
    let_go(holder);
}

static void all_calls_go_through(const struct fixture *f) {
    struct attempt attempts[all_calls];
    prepare(f, attempts);
    for (size_t i = 0; i < all_calls; ++i) {
        attempts[i].code = attempts[i].run(attempts[i].handle);
        assert_done(&attempts[i]);
    }
    assert_all_changes(f);
    release(attempts);
}

static void a_lock_on_another_file_disturbs_nobody(void **state) {
    struct fixture *f = *state;
    char *other = path_of(f, "other.conf");
    write_file(other, standard_configuration);
    const struct holder holder = hold_lock(other, LOCK_EX);
    all_calls_go_through(f);
    let_go(holder);
    free(other);
}

static void a_lock_on_the_file_that_was_replaced_disturbs_nobody(void **state) {
    struct fixture *f = *state;
    char *draft = path_of(f, "draft.conf");
    write_file(draft, standard_configuration);
    load_entries(f, update_entries);
    const struct holder holder = hold_lock(f->config, LOCK_EX);
    assert_int_equal(rename(draft, f->config), 0);
    all_calls_go_through(f);
    let_go(holder);
    free(draft);
}

static void after_a_call_the_file_is_free(void **state) {
    struct fixture *f = *state;
    load_entries(f, update_entries);
    FOR_EACH_UPDATE_CALL(call) {
        assert_int_equal(call->run(f->handle), CFG_SUCCESS);
        assert_int_equal(modify(f->handle, "cn=None", "add note=x"), CFG_NO_SUCH_OBJECT);
        const int file = open(f->config, O_RDONLY | O_CLOEXEC);
        assert_int_equal(flock(file, LOCK_EX | LOCK_NB), 0);
        close(file);
    }
}

int main(void) {
    const struct CMUnitTest tests[] = {
        CREATED(while_another_process_has_the_file_every_call_gives_51),
        CREATED(a_reader_keeps_updates_out_but_no_other_reader),
        CREATED(when_the_holder_lets_go_the_calls_go_on),
        CREATED(a_holder_that_dies_has_let_go),
        CREATED(a_search_of_an_unchanged_file_does_not_ask_for_it),
        CREATED(a_lock_on_another_file_disturbs_nobody),
        CREATED(a_lock_on_the_file_that_was_replaced_disturbs_nobody),
        CREATED(after_a_call_the_file_is_free),
    };
    return cmocka_run_group_tests_name("busy_file", tests, NULL, NULL);
}
