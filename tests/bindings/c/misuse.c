/* Every function with what it cannot be meant to be called with: null, 0, extremes, NaN. */
#include <limits.h>
#include <math.h>
#include <stddef.h>
#include <stdlib.h>
#include <string.h>

#include "checks.h"

/* Once with an error to fill and once without. */
#define INVALID(call_with_error)                         \
  do {                                                   \
    quenby_error* e = &error;                            \
    REFUSED(QUENBY_INVALID_ARGUMENT, call_with_error);   \
    e = NULL;                                            \
    CHECK((call_with_error) == QUENBY_INVALID_ARGUMENT); \
  } while (0)

static uint8_t few[16];

static void pixels_of_every_function(const quenby_pixels* p) {
  quenby_session* session = NULL;
  quenby_file* file = NULL;
  quenby_niqe_result niqe = {.struct_size = sizeof(niqe)};
  float cdf[256];
  INVALID(quenby_session_open(p, NULL, 0, 0, &session, e));
  INVALID(quenby_session_open(p, NULL, 0, QUENBY_BORROW_PIXELS, &session, e));
  INVALID(quenby_write(p, "JPEG", NULL, NULL, &file, e));
  INVALID(quenby_niqe(p, &niqe, NULL, 0, e));
  INVALID(quenby_green_cdf(p, cdf, e));
  INVALID(quenby_grey_of(p, few, 16, e));
  CHECK(session == NULL && file == NULL);
}

static void grey_of_every_function(const quenby_grey* g) {
  quenby_corners corners;
  quenby_descriptors descriptors;
  INVALID(quenby_fast(g, 9, 10, 0, &corners, e));
  INVALID(quenby_brief(g, NULL, 0, &descriptors, e));
}

static void pixels(void) {
  pixels_of_every_function(NULL);
  const quenby_pixels wrong[] = {{NULL, 2, 2, 8},
                                 {few, 0, 2, 8},
                                 {few, 2, 0, 8},
                                 {few, 0, 0, 0},
                                 {few, 2, 2, 0},
                                 {few, 2, 2, 7},
                                 {few, UINT32_MAX, 1, 8},
                                 {few, UINT32_MAX, UINT32_MAX, SIZE_MAX},
                                 {few, 1, UINT32_MAX, SIZE_MAX / 2},
                                 {few, 1, 2, SIZE_MAX}};
  for (size_t i = 0; i < sizeof(wrong) / sizeof(*wrong); ++i) pixels_of_every_function(&wrong[i]);
  grey_of_every_function(NULL);
  const quenby_grey grey[] = {{NULL, 2, 2, 2}, {few, 0, 2, 2},        {few, 2, 0, 2},
                              {few, 4, 4, 3},  {few, 1, 2, SIZE_MAX}, {few, UINT32_MAX, 1, 4}};
  for (size_t i = 0; i < sizeof(grey) / sizeof(*grey); ++i) grey_of_every_function(&grey[i]);
}

static void filters(void) {
  quenby_filter filter = {.struct_size = sizeof(filter)};
  quenby_parameter parameter = {.struct_size = sizeof(parameter)};
  quenby_fault fault;
  size_t count = 0;
  INVALID(quenby_filter_count(NULL, e));
  INVALID(quenby_filter_at(SIZE_MAX, &filter, e));
  INVALID(quenby_filter_at(0, NULL, e));
  INVALID(quenby_filter_named(NULL, &filter, e));
  INVALID(quenby_filter_named("", &filter, e));
  INVALID(quenby_filter_named("ae0", &filter, e));
  INVALID(quenby_filter_named("AE0", NULL, e));
  INVALID(quenby_parameter_at(NULL, 0, &parameter, e));
  INVALID(quenby_parameter_at("none", 0, &parameter, e));
  INVALID(quenby_parameter_at("AE0", SIZE_MAX, &parameter, e));
  INVALID(quenby_parameter_at("PassThrough", 0, &parameter, e));
  INVALID(quenby_parameter_at("AE0", 0, NULL, e));
  INVALID(quenby_check_parameters(NULL, "", &fault, 1, &count, e));
  INVALID(quenby_check_parameters("none", "", &fault, 1, &count, e));
  INVALID(quenby_check_parameters("AE0", "", NULL, 1, &count, e));
  INVALID(quenby_check_parameters("AE0", "", &fault, SIZE_MAX, &count, e));
  INVALID(quenby_check_parameters("AE0", "", &fault, 1, NULL, e));
  const size_t sizes[] = {0, sizeof(size_t), sizeof(filter) - 1, SIZE_MAX};
  for (size_t i = 0; i < 4; ++i) {
    filter.struct_size = parameter.struct_size = sizes[i];
    INVALID(quenby_filter_at(0, &filter, e));
    INVALID(quenby_filter_named("AE0", &filter, e));
    if (i != 2) INVALID(quenby_parameter_at("AE0", 0, &parameter, e));
  }
}

static void structs_that_grow(struct bytes photo) {
  /* A caller of a newer header: fields that are 0 pass, others are refused. */
  struct {
    quenby_open_options known;
    uint64_t newer[2];
  } open = {{.struct_size = sizeof(open)}, {0, 0}};
  quenby_photo* made = NULL;
  DONE(quenby_photo_open(photo.data, photo.size, &open.known, NULL, &made, &error));
  quenby_photo_free(made);
  open.newer[1] = 1;
  INVALID(quenby_photo_open(photo.data, photo.size, &open.known, NULL, &made, e));
  struct {
    quenby_facts known;
    uint64_t newer[2];
  } facts = {{.struct_size = sizeof(facts)}, {5, 6}};
  DONE(quenby_read_facts(photo.data, photo.size, &facts.known, &error));
  CHECK(facts.known.struct_size == sizeof(facts) && facts.known.width == 200);
  CHECK(facts.newer[0] == 5 && facts.newer[1] == 6);
}

static void open_options_of_every_function(struct bytes photo, quenby_open_options options) {
  quenby_photo* made = NULL;
  quenby_file* file = NULL;
  quenby_shot shot;
  quenby_facts facts = {.struct_size = sizeof(facts)};
  INVALID(quenby_photo_open(photo.data, photo.size, &options, NULL, &made, e));
  INVALID(quenby_read_facts_within(photo.data, photo.size, &options, &facts, e));
  INVALID(quenby_read_shot(photo.data, photo.size, &options, NULL, &shot, e));
  INVALID(quenby_filter_file(photo.data, photo.size, "WinterRGB", NULL, NULL, 0, &options, NULL,
                             NULL, NULL, &file, e));
  CHECK(made == NULL && file == NULL);
}

static void save_options_of_every_function(struct bytes photo, const quenby_photo* open,
                                           quenby_save_options options) {
  const quenby_pixels two = {few, 2, 2, 8};
  quenby_file* file = NULL;
  INVALID(quenby_photo_save(open, NULL, NULL, &options, NULL, &file, e));
  INVALID(quenby_write(&two, "PNG", &options, NULL, &file, e));
  INVALID(quenby_filter_file(photo.data, photo.size, "WinterRGB", NULL, NULL, 0, NULL, NULL,
                             &options, NULL, &file, e));
  CHECK(file == NULL);
}

static void files(struct bytes photo) {
  quenby_facts facts = {.struct_size = sizeof(facts)};
  quenby_photo* made = NULL;
  quenby_file* file = NULL;
  quenby_shot shot;
  INVALID(quenby_read_facts(NULL, 1, &facts, e));
  INVALID(quenby_read_facts(few, SIZE_MAX, &facts, e));
  INVALID(quenby_read_facts(photo.data, photo.size, NULL, e));
  INVALID(quenby_read_facts_within(photo.data, photo.size, NULL, NULL, e));
  INVALID(quenby_photo_open(NULL, 1, NULL, NULL, &made, e));
  INVALID(quenby_photo_open(few, SIZE_MAX, NULL, NULL, &made, e));
  INVALID(quenby_photo_open(photo.data, photo.size, NULL, NULL, NULL, e));
  INVALID(quenby_read_shot(NULL, 1, NULL, NULL, &shot, e));
  INVALID(quenby_read_shot(photo.data, photo.size, NULL, NULL, NULL, e));
  INVALID(
      quenby_filter_file(NULL, 1, "AE0", "slider=1;", NULL, 0, NULL, NULL, NULL, NULL, &file, e));
  INVALID(quenby_filter_file(photo.data, photo.size, "AE0", "slider=1;", NULL, 0, NULL, NULL, NULL,
                             NULL, NULL, e));
  const char* const filters[][2] = {
      {NULL, ""}, {"", ""}, {"none", ""}, {"AE0", NULL}, {"AE0", "slide=1;"}, {"AE0", "slider=x;"}};
  for (size_t i = 0; i < 6; ++i) {
    INVALID(quenby_filter_file(photo.data, photo.size, filters[i][0], filters[i][1], NULL, 0, NULL,
                               NULL, NULL, NULL, &file, e));
  }
  const quenby_face face = {0, 0, 1, NAN, 0}, infinite = {0, -INFINITY, 1, 1, 0},
                    beside = {900, 900, 990, 990, 1};
  INVALID(quenby_filter_file(photo.data, photo.size, "AE0", "slider=1;", &face, 1, NULL, NULL, NULL,
                             NULL, &file, e));
  INVALID(quenby_filter_file(photo.data, photo.size, "AE0", "slider=1;", &infinite, 1, NULL, NULL,
                             NULL, NULL, &file, e));
  INVALID(quenby_filter_file(photo.data, photo.size, "AE0", "slider=1;", &beside, 1, NULL, NULL,
                             NULL, NULL, &file, e));
  INVALID(quenby_filter_file(photo.data, photo.size, "AE0", "slider=1;", NULL, 1, NULL, NULL, NULL,
                             NULL, &file, e));
  INVALID(quenby_filter_file(photo.data, photo.size, "AE0", "slider=1;", &face, SIZE_MAX, NULL,
                             NULL, NULL, NULL, &file, e));
  const size_t size = sizeof(quenby_open_options);
  const quenby_open_options open[] = {{.struct_size = 0},
                                      {.struct_size = offsetof(quenby_open_options, workers) - 1},
                                      {.struct_size = SIZE_MAX},
                                      {.struct_size = size, .scale = 3},
                                      {.struct_size = size, .scale = -1},
                                      {.struct_size = size, .scale = INT_MAX},
                                      {.struct_size = size, .rotate = 45},
                                      {.struct_size = size, .rotate = INT_MIN},
                                      {.struct_size = size, .max_scans = -1},
                                      {.struct_size = size, .max_segments = -1},
                                      {.struct_size = size, .flags = 4},
                                      {.struct_size = size, .flags = UINT32_MAX}};
  for (size_t i = 0; i < sizeof(open) / sizeof(*open); ++i)
    open_options_of_every_function(photo, open[i]);

  DONE(quenby_photo_open(photo.data, photo.size, NULL, NULL, &made, &error));
  const size_t save_size = sizeof(quenby_save_options);
  const quenby_save_options save[] = {
      {.struct_size = 0},
      {.struct_size = SIZE_MAX},
      {.struct_size = save_size, .quality = -1},
      {.struct_size = save_size, .quality = 101},
      {.struct_size = save_size, .quality = INT_MIN},
      {.struct_size = save_size, .flags = 512},
      {.struct_size = save_size, .flags = QUENBY_SUBSAMPLING_422 | QUENBY_SUBSAMPLING_444},
      {.struct_size = save_size, .keep = 64}};
  for (size_t i = 0; i < sizeof(save) / sizeof(*save); ++i)
    save_options_of_every_function(photo, made, save[i]);

  const quenby_pixels two = {few, 2, 2, 8};
  quenby_pixels inside;
  size_t count = 0;
  INVALID(quenby_photo_pixels(NULL, &inside, e));
  INVALID(quenby_photo_pixels(made, NULL, e));
  INVALID(quenby_photo_facts(NULL, &facts, e));
  INVALID(quenby_photo_facts(made, NULL, e));
  INVALID(quenby_photo_faces(NULL, NULL, 0, &count, e));
  INVALID(quenby_photo_faces(made, NULL, 1, &count, e));
  INVALID(quenby_photo_faces(made, NULL, 0, NULL, e));
  CHECK(quenby_photo_notice(NULL, 0) == NULL && quenby_photo_notice(made, SIZE_MAX) == NULL);
  INVALID(quenby_photo_save(NULL, NULL, NULL, NULL, NULL, &file, e));
  INVALID(quenby_photo_save(made, &two, NULL, NULL, NULL, &file, e));
  INVALID(quenby_photo_save(made, NULL, "GIF", NULL, NULL, &file, e));
  INVALID(quenby_photo_save(made, NULL, "", NULL, NULL, &file, e));
  INVALID(quenby_photo_save(made, NULL, "raw pixels", NULL, NULL, &file, e));
  INVALID(quenby_photo_save(made, NULL, NULL, NULL, NULL, NULL, e));
  INVALID(quenby_write(&two, NULL, NULL, NULL, &file, e));
  INVALID(quenby_write(&two, "GIF", NULL, NULL, &file, e));
  INVALID(quenby_write(&two, "JPEG", NULL, NULL, NULL, e));
  facts.struct_size = 0;
  INVALID(quenby_photo_facts(made, &facts, e));
  INVALID(quenby_read_facts(photo.data, photo.size, &facts, e));

  quenby_loss loss = {.struct_size = sizeof(loss)};
  DONE(quenby_write(&two, "PNG", NULL, NULL, &file, &error));
  INVALID(quenby_file_loss(NULL, 0, &loss, e));
  INVALID(quenby_file_loss(file, 0, &loss, e));
  INVALID(quenby_file_loss(file, SIZE_MAX, &loss, e));
  CHECK(quenby_file_data(NULL) == NULL && quenby_file_size(NULL) == 0);
  CHECK(quenby_file_loss_count(NULL) == 0);
  quenby_file_free(file);
  quenby_photo_free(made);
}

/* Each kind of bad file by its own kind of error. */
static void bad_files(struct bytes photo) {
  uint8_t* const huge = malloc(photo.size);
  memcpy(huge, photo.data, photo.size);
  for (size_t i = 0; i + 9 < photo.size; ++i) {
    if (huge[i] == 0xFF && huge[i + 1] == 0xC0) memset(huge + i + 5, 0xF0, 4);
  }
  const struct {
    const uint8_t* data;
    size_t size;
    int32_t kind;
  } files[] = {{photo.data, 0, QUENBY_EMPTY_FILE},
               {NULL, 0, QUENBY_EMPTY_FILE},
               {(const uint8_t*)"some text, no photo", 19, QUENBY_NOT_A_PHOTO},
               {(const uint8_t*)"GIF89a\1\0\1\0\0\0\0", 13, QUENBY_UNSUPPORTED},
               {photo.data, photo.size / 2, QUENBY_TRUNCATED},
               {huge, photo.size, QUENBY_TOO_LARGE}};
  for (size_t i = 0; i < sizeof(files) / sizeof(*files); ++i) {
    quenby_photo* made = NULL;
    quenby_file* file = NULL;
    quenby_shot shot;
    REFUSED(files[i].kind,
            quenby_photo_open(files[i].data, files[i].size, NULL, NULL, &made, &error));
    REFUSED(files[i].kind,
            quenby_read_shot(files[i].data, files[i].size, NULL, NULL, &shot, &error));
    REFUSED(files[i].kind, quenby_filter_file(files[i].data, files[i].size, "WinterRGB", NULL, NULL,
                                              0, NULL, NULL, NULL, NULL, &file, &error));
    CHECK(made == NULL && file == NULL);
  }
  free(huge);
  const quenby_open_options few_pixels = {.struct_size = sizeof(few_pixels), .max_pixels = 29999};
  const quenby_open_options few_segments = {.struct_size = sizeof(few_segments), .max_segments = 1};
  const quenby_open_options* const limits[] = {&few_pixels, &few_segments};
  for (size_t i = 0; i < sizeof(limits) / sizeof(*limits); ++i) {
    quenby_photo* made = NULL;
    quenby_shot shot;
    REFUSED(QUENBY_TOO_LARGE,
            quenby_photo_open(photo.data, photo.size, limits[i], NULL, &made, &error));
    REFUSED(QUENBY_TOO_LARGE,
            quenby_read_shot(photo.data, photo.size, limits[i], NULL, &shot, &error));
  }
}

static void leave_a_task_out(void* context, size_t tasks, void (*task)(void* state, size_t index),
                             void* state) {
  (void)context;
  for (size_t i = 1; i < tasks; ++i) task(state, i);
}

static void run_one_that_is_not(void* context, size_t tasks,
                                void (*task)(void* state, size_t index), void* state) {
  (void)context;
  for (size_t i = 1; i <= tasks; ++i) task(state, i);
}

static void workers(void) {
  quenby_pixels pixels = made_pixels(40, 30, 1);
  uint8_t* const out = malloc(40 * 30 * 4);
  quenby_workers some = {sizeof(some), 2, NULL, leave_a_task_out};
  quenby_session* session = NULL;
  CHECK(quenby_session_open(&pixels, NULL, 0, 0, &session, &error) == QUENBY_OK);
  INVALID(quenby_session_share(NULL, &some, e));
  INVALID(quenby_session_share(session, NULL, e));
  some.count = 0;
  INVALID(quenby_session_share(session, &some, e));
  some.count = 2;
  some.run = NULL;
  INVALID(quenby_session_share(session, &some, e));
  some.run = leave_a_task_out;
  some.struct_size = 3;
  INVALID(quenby_session_share(session, &some, e));
  some.struct_size = sizeof(some);
  CHECK(quenby_session_share(session, &some, &error) == QUENBY_OK);
  INVALID(quenby_session_apply(session, "AE0", "slider=0.4;", out, 160, NULL, e));
  some.run = run_one_that_is_not;
  CHECK(quenby_session_share(session, &some, &error) == QUENBY_OK);
  INVALID(quenby_session_apply(session, "AE0", "slider=0.4;", out, 160, NULL, e));
  quenby_session_free(session);
  free(out);
  free_pixels(&pixels);

  quenby_threads* threads = NULL;
  INVALID(quenby_threads_new(1, NULL, e));
  INVALID(quenby_threads_new(1025, &threads, e));
  CHECK(threads == NULL);
  CHECK(quenby_threads_new(1, &threads, &error) == QUENBY_OK);
  INVALID(quenby_threads_lend(NULL, &some, e));
  INVALID(quenby_threads_lend(threads, NULL, e));
  some.struct_size = 3;
  INVALID(quenby_threads_lend(threads, &some, e));
  quenby_threads_free(threads);
  quenby_threads_free(NULL);
}

static void sessions(void) {
  const quenby_pixels two = {few, 2, 2, 8};
  quenby_session* session = NULL;
  const quenby_face unreal = {NAN, 0, 1, 1, 0}, beside = {9, 9, 10, 10, 1};
  INVALID(quenby_session_open(&two, NULL, 0, 0, NULL, e));
  INVALID(quenby_session_open(&two, NULL, 0, 2, &session, e));
  INVALID(quenby_session_open(&two, NULL, 1, 0, &session, e));
  INVALID(quenby_session_open(&two, &unreal, 1, 0, &session, e));
  INVALID(quenby_session_open(&two, &beside, 1, 0, &session, e));
  INVALID(quenby_session_open(&two, &unreal, SIZE_MAX, 0, &session, e));
  INVALID(quenby_session_open_photo(NULL, NULL, 0, &session, e));
  DONE(quenby_session_open(&two, NULL, 0, 0, &session, &error));
  uint8_t out[16];
  INVALID(quenby_session_apply(NULL, "AE0", "slider=1;", out, 8, NULL, e));
  INVALID(quenby_session_apply(session, NULL, "", out, 8, NULL, e));
  INVALID(quenby_session_apply(session, "none", "", out, 8, NULL, e));
  INVALID(quenby_session_apply(session, "AE0", NULL, out, 8, NULL, e));
  INVALID(quenby_session_apply(session, "AE0", "slider=;", out, 8, NULL, e));
  INVALID(quenby_session_apply(session, "AE0", "slide=1;slider=1;", out, 8, NULL, e));
  INVALID(quenby_session_apply(session, "WinterRGB", "", NULL, 8, NULL, e));
  INVALID(quenby_session_apply(session, "WinterRGB", "", out, 7, NULL, e));
  INVALID(quenby_session_apply(session, "WinterRGB", "", out, 0, NULL, e));
  INVALID(quenby_session_apply(session, "WinterRGB", "", out, SIZE_MAX, NULL, e));
  const char* const extremes[] = {"slider=nan;", "slider=inf;", "slider=-1e30;", "slider=3e38;"};
  for (size_t i = 0; i < 4; ++i)
    DONE(quenby_session_apply(session, "AE0", extremes[i], out, 8, NULL, &error));
  quenby_session_free(session);
}

static void duplicates(void) {
  float cdf[256] = {0}, value;
  double seconds;
  quenby_pairs pairs;
  uint64_t first_of[2];
  const quenby_pixels two = {few, 2, 2, 8};
  INVALID(quenby_green_cdf(&two, NULL, e));
  INVALID(quenby_distance(NULL, cdf, &value, e));
  INVALID(quenby_distance(cdf, NULL, &value, e));
  INVALID(quenby_distance(cdf, cdf, NULL, e));
  INVALID(quenby_dupe_score(0, 0, 0, NULL, e));
  INVALID(quenby_dupe_window(0, 0, NULL, e));
  INVALID(quenby_dupe_window(NAN, 0, &seconds, e));
  INVALID(quenby_find_pairs(NULL, 1, 0, NULL, &pairs, e));
  INVALID(quenby_find_pairs(NULL, 0, NAN, NULL, &pairs, e));
  INVALID(quenby_find_pairs(NULL, 0, 0, NULL, NULL, e));
  static quenby_shot shot;
  INVALID(quenby_find_pairs(&shot, SIZE_MAX, 0, NULL, &pairs, e));
  shot.wall_clock = INFINITY;
  INVALID(quenby_find_pairs(&shot, 1, 0, NULL, &pairs, e));
  shot.wall_clock = 0;
  shot.utc = -INFINITY;
  INVALID(quenby_find_pairs(&shot, 1, 0, NULL, &pairs, e));
  quenby_pair pair = {.first = 0, .second = 2};
  INVALID(quenby_group_pairs(&pair, 1, 2, first_of, e));
  pair.first = UINT64_MAX;
  INVALID(quenby_group_pairs(&pair, 1, 2, first_of, e));
  pair.first = pair.second = 1;
  INVALID(quenby_group_pairs(&pair, 1, 2, first_of, e));
  pair.first = 0;
  pair.score = NAN;
  INVALID(quenby_group_pairs(&pair, 1, 2, first_of, e));
  INVALID(quenby_group_pairs(NULL, 1, 2, first_of, e));
  INVALID(quenby_group_pairs(NULL, 0, 2, NULL, e));
  INVALID(quenby_group_pairs(&pair, SIZE_MAX, 2, first_of, e));
  /* Any number is one. */
  for (int i = 0; i < 256; ++i) cdf[i] = i % 3 == 0 ? NAN : i % 3 == 1 ? -INFINITY : 3e38f;
  DONE(quenby_distance(cdf, cdf, &value, &error));
  DONE(quenby_dupe_score(NAN, INFINITY, 0, &value, &error));
  DONE(quenby_dupe_score(-INFINITY, NAN, -1, &value, &error));
  CHECK(isnan(value));
  DONE(quenby_dupe_window(-INFINITY, 1, &seconds, &error));
  DONE(quenby_dupe_window(INFINITY, 1, &seconds, &error));
  CHECK(seconds < 0);
}

static void the_rest(void) {
  const quenby_pixels two = {few, 2, 2, 8};
  const quenby_grey grey = {few, 4, 4, 4};
  quenby_niqe_result niqe = {.struct_size = sizeof(niqe)};
  INVALID(quenby_cancel_new(NULL, e));
  INVALID(quenby_cancel_new_after(0, NULL, e));
  INVALID(quenby_niqe(&two, NULL, NULL, 0, e));
  niqe.struct_size = 4;
  INVALID(quenby_niqe(&two, &niqe, NULL, 0, e));
  niqe.struct_size = sizeof(niqe);
  quenby_pixels large = made_pixels(96, 192, 1);
  float distance;
  INVALID(quenby_niqe(&large, &niqe, &distance, 1, e));
  INVALID(quenby_niqe(&large, &niqe, &distance, 0, e));
  free_pixels(&large);
  INVALID(quenby_grey_of(&two, NULL, 2, e));
  INVALID(quenby_grey_of(&two, few, 1, e));
  quenby_corners corners;
  const int32_t arcs[] = {INT_MIN, -1, 0, 8, 13, INT_MAX};
  for (size_t i = 0; i < 6; ++i) INVALID(quenby_fast(&grey, arcs[i], 10, 0, &corners, e));
  INVALID(quenby_fast(&grey, 9, 10, 0, NULL, e));
  DONE(quenby_fast(&grey, 9, INT_MIN, 1, &corners, &error));
  quenby_corners_free(&corners);
  DONE(quenby_fast(&grey, 9, INT_MAX, 1, &corners, &error));
  CHECK(corners.count == 0);
  const quenby_corner far[] = {{INT_MIN, INT_MAX, 0}, {-1, 2, 0}, {INT_MAX, 0, 0}};
  quenby_descriptors descriptors;
  DONE(quenby_brief(&grey, far, 3, &descriptors, &error));
  CHECK(descriptors.count == 0);
  INVALID(quenby_brief(&grey, NULL, 1, &descriptors, e));
  INVALID(quenby_brief(&grey, far, SIZE_MAX, &descriptors, e));
  INVALID(quenby_brief(&grey, far, 3, NULL, e));
  quenby_cancel_request(NULL);
  quenby_cancel_free(NULL);
  quenby_photo_free(NULL);
  quenby_file_free(NULL);
  quenby_session_free(NULL);
  quenby_pairs_free(NULL);
  quenby_corners_free(NULL);
  quenby_descriptors_free(NULL);
}

/* A message that is too long ends with a whole character. */
static void messages(void) {
  quenby_filter filter = {.struct_size = sizeof(filter)};
  for (int extra = 0; extra < 4; ++extra) {
    char name[2000] = "abc";
    name[extra] = 0;
    for (int i = 0; i < 300; ++i) strcat(name, "\xE2\x82\xAC"); /* a euro sign */
    REFUSED(QUENBY_INVALID_ARGUMENT, quenby_filter_named(name, &filter, &error));
    const size_t length = strlen(error.message);
    CHECK(length < sizeof(error.message) && length + 3 >= sizeof(error.message) - 1);
    CHECK(memcmp(error.message + length - 3, "\xE2\x82\xAC", 3) == 0);
  }
  /* Bytes that are no UTF-8 do no harm. */
  char bytes[1000];
  memset(bytes, 0x80, sizeof(bytes) - 1);
  bytes[sizeof(bytes) - 1] = 0;
  REFUSED(QUENBY_INVALID_ARGUMENT, quenby_filter_named(bytes, &filter, &error));
  CHECK(strlen(error.message) >= sizeof(error.message) - 5);
}

int main(void) {
  struct bytes photo = made_photo(200, 150, 1);
  pixels();
  filters();
  structs_that_grow(photo);
  files(photo);
  bad_files(photo);
  sessions();
  workers();
  duplicates();
  the_rest();
  messages();
  free(photo.data);
  return failures > 0;
}
