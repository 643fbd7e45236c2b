/* Eight threads at once, and calls that another thread cancels. */
#define _POSIX_C_SOURCE 200809L
#include <pthread.h>
#include <stddef.h>
#include <stdlib.h>
#include <string.h>

#include "checks.h"

enum { threads = 8, moves = 3, width = 120, height = 90, bytes = width * height * 4 };

static const char* const params[moves] = {"slider=0.2;", "slider=0.5;", "slider=1;"};
static struct bytes photo;
static quenby_pixels pixels;
static quenby_session* shared;
static uint8_t wanted[moves][bytes];

static int apply_all(quenby_session* session) {
  uint8_t out[bytes];
  int same = 1;
  for (int move = 0; move < moves; ++move) {
    memset(out, 0, bytes);
    quenby_error own;
    const int32_t kind =
        quenby_session_apply(session, "AE0", params[move], out, width * 4, NULL, &own);
    same = same && kind == QUENBY_OK && memcmp(out, wanted[move], bytes) == 0;
  }
  return same;
}

static void* one_thread(void* of_its_own) {
  quenby_session* session = shared;
  if (of_its_own != NULL) quenby_session_open(&pixels, NULL, 0, 0, &session, NULL);
  const int same = apply_all(session);
  if (of_its_own != NULL) quenby_session_free(session);
  return same ? wanted : NULL;
}

static void same_bytes(int sessions_of_their_own) {
  pthread_t all[threads];
  for (int i = 0; i < threads; ++i)
    CHECK(pthread_create(&all[i], NULL, one_thread, sessions_of_their_own ? wanted : NULL) == 0);
  for (int i = 0; i < threads; ++i) {
    void* same = NULL;
    CHECK(pthread_join(all[i], &same) == 0 && same != NULL);
  }
}

/* Tasks for some threads, which take one after the other. */
struct shared_tasks {
  pthread_mutex_t mutex;
  size_t next, tasks;
  void (*task)(void* state, size_t index);
  void* state;
};

static void* take_tasks(void* all) {
  struct shared_tasks* const shared_tasks = all;
  for (;;) {
    pthread_mutex_lock(&shared_tasks->mutex);
    const size_t index = shared_tasks->next++;
    pthread_mutex_unlock(&shared_tasks->mutex);
    if (index >= shared_tasks->tasks) return NULL;
    shared_tasks->task(shared_tasks->state, index);
  }
}

/* With two threads beside this one, and a note in `context` that it was called. */
static void run_tasks(void* context, size_t tasks, void (*task)(void* state, size_t index),
                      void* state) {
  struct shared_tasks all = {PTHREAD_MUTEX_INITIALIZER, 0, tasks, task, state};
  pthread_t helpers[2];
  *(int*)context = 1;
  for (int i = 0; i < 2; ++i) CHECK(pthread_create(&helpers[i], NULL, take_tasks, &all) == 0);
  take_tasks(&all);
  for (int i = 0; i < 2; ++i) CHECK(pthread_join(helpers[i], NULL) == 0);
}

static void with_workers(void) {
  int used = 0;
  const quenby_workers workers = {sizeof(workers), 3, &used, run_tasks};
  quenby_session* session = NULL;
  CHECK(quenby_session_open(&pixels, NULL, 0, 0, &session, NULL) == QUENBY_OK);
  CHECK(quenby_session_share(session, &workers, NULL) == QUENBY_OK);
  CHECK(apply_all(session) && used);
  quenby_session_free(session);

  quenby_file *alone = NULL, *shared_file = NULL;
  quenby_open_options options = {.struct_size = sizeof(options), .scale = 1, .workers = &workers};
  CHECK(quenby_filter_file(photo.data, photo.size, "AE0", "slider=0.4;", NULL, 0, NULL, NULL, NULL,
                           NULL, &alone, NULL) == QUENBY_OK);
  used = 0;
  CHECK(quenby_filter_file(photo.data, photo.size, "AE0", "slider=0.4;", NULL, 0, &options, NULL,
                           NULL, NULL, &shared_file, NULL) == QUENBY_OK);
  CHECK(used && quenby_file_size(alone) == quenby_file_size(shared_file) &&
        memcmp(quenby_file_data(alone), quenby_file_data(shared_file), quenby_file_size(alone)) ==
            0);
  quenby_file_free(shared_file);

  /* What goes wrong in a task comes back. */
  CHECK(quenby_filter_file(photo.data, photo.size / 2, "AE0", "slider=0.4;", NULL, 0, &options,
                           NULL, NULL, NULL, &shared_file, NULL) == QUENBY_TRUNCATED);

  /* Options of a program that knew no workers. */
  options.struct_size = offsetof(quenby_open_options, workers);
  used = 0;
  CHECK(quenby_filter_file(photo.data, photo.size, "AE0", "slider=0.4;", NULL, 0, &options, NULL,
                           NULL, NULL, &shared_file, NULL) == QUENBY_OK);
  CHECK(!used);
  quenby_file_free(shared_file);
  quenby_file_free(alone);
}

static void with_the_librarys_threads(void) {
  for (size_t count = 0; count <= 3; ++count) {
    quenby_threads* threads = NULL;
    quenby_workers lent = {sizeof(lent), 0, NULL, NULL};
    CHECK(quenby_threads_new(count, &threads, NULL) == QUENBY_OK);
    CHECK(quenby_threads_lend(threads, &lent, NULL) == QUENBY_OK);
    CHECK(count == 0 ? lent.count >= 1 : lent.count == count);
    quenby_session* session = NULL;
    CHECK(quenby_session_open(&pixels, NULL, 0, 0, &session, NULL) == QUENBY_OK);
    CHECK(quenby_session_share(session, &lent, NULL) == QUENBY_OK);
    CHECK(apply_all(session));
    quenby_session_free(session);
    quenby_threads_free(threads);
  }
}

/* Works until it is cancelled. */
static void* until_cancelled(void* cancel) {
  int32_t kind = QUENBY_OK;
  while (kind == QUENBY_OK) {
    quenby_file* file = NULL;
    kind = quenby_filter_file(photo.data, photo.size, "AE0", "slider=0.4;", NULL, 0, NULL, NULL,
                              NULL, cancel, &file, NULL);
    quenby_file_free(file);
  }
  return kind == QUENBY_CANCELLED ? wanted : NULL;
}

/* Cancels after some tasks, and counts those that follow. */
struct cancelling_workers {
  quenby_cancel* cancel;
  int tasks_before;
};

static void run_and_cancel(void* context, size_t tasks, void (*task)(void* state, size_t index),
                           void* state) {
  struct cancelling_workers* const workers = context;
  for (size_t i = 0; i < tasks; ++i) {
    if (workers->tasks_before-- == 0) quenby_cancel_request(workers->cancel);
    task(state, i);
  }
}

/* After the first tasks of a filter, which begins at the top, the last row is as it was; after any
 * number of them the session is as good as new. */
static void cancelled_at_work(void) {
  static const char* const filters[] = {"AE0", "AE08bit", "WinterRGB", "PassThrough"};
  uint8_t out[bytes], row[width * 4];
  memset(row, 77, sizeof row);
  for (int filter = 0; filter < 4; ++filter) {
    const char* const wish = filter < 2 ? "slider=0.2;" : "";
    uint8_t usual[bytes];
    quenby_session* session = NULL;
    DONE(quenby_session_open(&pixels, NULL, 0, 0, &session, &error));
    DONE(quenby_session_apply(session, filters[filter], wish, usual, width * 4, NULL, &error));
    quenby_session_free(session);
    int cancelled = 0;
    for (int tasks = 1; tasks < 100; tasks += 7) {
      struct cancelling_workers own = {NULL, tasks};
      const quenby_workers workers = {sizeof(workers), 1, &own, run_and_cancel};
      DONE(quenby_cancel_new(&own.cancel, &error));
      DONE(quenby_session_open(&pixels, NULL, 0, 0, &session, &error));
      DONE(quenby_session_share(session, &workers, &error));
      memset(out, 77, sizeof out);
      const int32_t kind =
          quenby_session_apply(session, filters[filter], wish, out, width * 4, own.cancel, NULL);
      CHECK(kind == (own.tasks_before < 0 ? QUENBY_CANCELLED : QUENBY_OK));
      cancelled += kind == QUENBY_CANCELLED;
      if (tasks == 1 && kind == QUENBY_CANCELLED)
        CHECK(memcmp(out + bytes - width * 4, row, sizeof row) == 0);
      if (kind == QUENBY_OK) CHECK(memcmp(out, usual, bytes) == 0);
      DONE(quenby_session_apply(session, filters[filter], wish, out, width * 4, NULL, &error));
      CHECK(memcmp(out, usual, bytes) == 0);
      quenby_session_free(session);
      quenby_cancel_free(own.cancel);
    }
    CHECK(cancelled > 0);
  }
}

static void cancelled_by_another_thread(void) {
  quenby_cancel* cancel = NULL;
  DONE(quenby_cancel_new(&cancel, &error));
  pthread_t all[2];
  for (int i = 0; i < 2; ++i) CHECK(pthread_create(&all[i], NULL, until_cancelled, cancel) == 0);
  quenby_file* file = NULL; /* gives them time to begin */
  DONE(quenby_filter_file(photo.data, photo.size, "AE0", "slider=0.4;", NULL, 0, NULL, NULL, NULL,
                          NULL, &file, &error));
  quenby_file_free(file);
  quenby_cancel_request(cancel);
  for (int i = 0; i < 2; ++i) {
    void* right = NULL;
    CHECK(pthread_join(all[i], &right) == 0 && right != NULL);
  }
  quenby_cancel_free(cancel);
}

static void cancelled_by_the_time(void) {
  quenby_cancel *at_once = NULL, *in_weeks = NULL, *asked = NULL;
  DONE(quenby_cancel_new_after(0, &at_once, &error));
  DONE(quenby_cancel_new_after(UINT32_MAX, &in_weeks, &error));
  DONE(quenby_cancel_new_after(UINT32_MAX, &asked, &error));
  quenby_cancel_request(asked);
  quenby_photo* made = NULL;
  DONE(quenby_photo_open(photo.data, photo.size, NULL, in_weeks, &made, &error));
  quenby_photo_free(made);
  quenby_cancel* const over[] = {at_once, asked};
  for (size_t i = 0; i < 2; ++i) {
    int32_t kind = QUENBY_OK;
    while (kind == QUENBY_OK) { /* once its thread has run */
      kind = quenby_photo_open(photo.data, photo.size, NULL, over[i], &made, &error);
      quenby_photo_free(made);
      made = NULL;
    }
    CHECK(kind == QUENBY_CANCELLED);
  }
  quenby_cancel_free(at_once);
  quenby_cancel_free(in_weeks);
  quenby_cancel_free(asked);
}

/* Every function that looks at one. */
static void cancelled_before(void) {
  quenby_cancel *cancel = NULL, *other = NULL;
  DONE(quenby_cancel_new(&cancel, &error));
  DONE(quenby_cancel_new(&other, &error));
  quenby_photo *made = NULL, *open = NULL;
  quenby_file* file = NULL;
  quenby_shot shots[2];
  quenby_pairs pairs;
  uint8_t out[bytes];
  DONE(quenby_read_shot(photo.data, photo.size, NULL, other, &shots[0], &error));
  shots[1] = shots[0];
  DONE(quenby_photo_open(photo.data, photo.size, NULL, other, &open, &error));
  quenby_cancel_request(cancel);
  quenby_cancel_request(cancel);
  const int32_t c = QUENBY_CANCELLED;
  REFUSED(c, quenby_photo_open(photo.data, photo.size, NULL, cancel, &made, &error));
  REFUSED(c, quenby_photo_save(open, NULL, NULL, NULL, cancel, &file, &error));
  REFUSED(c, quenby_write(&pixels, "PNG", NULL, cancel, &file, &error));
  REFUSED(c, quenby_filter_file(photo.data, photo.size, "AE0", "slider=0.4;", NULL, 0, NULL, NULL,
                                NULL, cancel, &file, &error));
  REFUSED(c, quenby_read_shot(photo.data, photo.size, NULL, cancel, &shots[0], &error));
  REFUSED(c, quenby_find_pairs(shots, 2, 0, cancel, &pairs, &error));
  REFUSED(c, quenby_session_apply(shared, "AE0", params[0], out, width * 4, cancel, &error));
  CHECK(made == NULL && file == NULL && pairs.count == 0);
  DONE(quenby_session_apply(shared, "AE0", params[0], out, width * 4, other, &error));
  CHECK(memcmp(out, wanted[0], bytes) == 0);
  quenby_photo_free(open);
  quenby_cancel_free(cancel);
  quenby_cancel_free(other);
}

int main(void) {
  photo = made_photo(200, 150, 1);
  pixels = made_pixels(width, height, 4);
  DONE(quenby_session_open(&pixels, NULL, 0, 0, &shared, &error));
  for (int move = 0; move < moves; ++move)
    DONE(quenby_session_apply(shared, "AE0", params[move], wanted[move], width * 4, NULL, &error));
  quenby_session_free(shared);
  DONE(quenby_session_open(&pixels, NULL, 0, QUENBY_BORROW_PIXELS, &shared, &error));
  same_bytes(0);
  same_bytes(1);
  with_workers();
  with_the_librarys_threads();
  cancelled_at_work();
  cancelled_before();
  cancelled_by_the_time();
  cancelled_by_another_thread();
  quenby_session_free(shared);
  free_pixels(&pixels);
  free(photo.data);
  return failures > 0;
}
