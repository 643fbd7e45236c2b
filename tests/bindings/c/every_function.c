/* Calls everything as it is meant, and compares files with the command's:
 * every_function COMMAND VERSION FOLDER */
#include <math.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>

#include "checks.h"

static const char* command;
static const char* folder;

static void library(const char* version) {
  CHECK(quenby_abi() == QUENBY_ABI);
  CHECK(strcmp(quenby_version(), version) == 0);
  CHECK(strlen(quenby_niqe_model()) > 0);
}

static void filters(void) {
  size_t count = 0;
  DONE(quenby_filter_count(&count, &error));
  CHECK(count > 5);
  int sliders = 0, faces = 0;
  for (size_t i = 0; i < count; ++i) {
    quenby_filter filter = {.struct_size = sizeof(filter)};
    quenby_filter named = {.struct_size = sizeof(named)};
    DONE(quenby_filter_at(i, &filter, &error));
    DONE(quenby_filter_named(filter.name, &named, &error));
    CHECK(memcmp(&filter, &named, sizeof(filter)) == 0);
    CHECK(strlen(filter.display_name) > 0 && strlen(filter.description) > 0);
    size_t faults = 1;
    DONE(quenby_check_parameters(filter.name, filter.required, NULL, 0, &faults, &error));
    CHECK(faults == 0);
    faces += filter.reads_faces != 0;
    for (size_t p = 0; p < filter.parameter_count; ++p) {
      quenby_parameter row = {.struct_size = sizeof(row)};
      DONE(quenby_parameter_at(filter.name, p, &row, &error));
      CHECK(strlen(row.name) > 0 && strlen(row.description) > 0 && strlen(row.wanted) > 0);
      CHECK(row.kind >= QUENBY_NUMBER && row.kind <= QUENBY_NUMBERS && row.only_with != NULL);
      if (strcmp(row.name, "slider") == 0) {
        ++sliders;
        CHECK(row.kind == QUENBY_NUMBER && row.required && row.lowest == 0 && row.highest == 1);
      }
    }
  }
  CHECK(sliders >= 2 && faces >= 2);
  quenby_fault faults[2];
  size_t found = 0;
  DONE(quenby_check_parameters("AE0", "slide=1;slider=x;slider2=3;", faults, 2, &found, &error));
  CHECK(found == 3);
  CHECK(faults[0].kind == QUENBY_UNKNOWN && strcmp(faults[0].key, "slide") == 0);
  CHECK(faults[1].kind == QUENBY_UNREADABLE && strstr(faults[1].message, "slider") != NULL);
}

/* The file that the command makes of `photo.jpg` with these options. */
static struct bytes by_command(const char* options, const char* result) {
  char line[2000], path[1000];
  snprintf(path, sizeof(path), "%s/%s", folder, result);
  snprintf(line, sizeof(line), "'%s' %s '%s/photo.jpg' -o '%s' --overwrite -q 2>&1", command,
           options, folder, path);
  CHECK(system(line) == 0);
  return read_bytes(path);
}

static void same_file(const quenby_file* file, struct bytes wanted) {
  CHECK(wanted.size > 0 && quenby_file_size(file) == wanted.size &&
        memcmp(quenby_file_data(file), wanted.data, wanted.size) == 0);
  free(wanted.data);
}

static void files(struct bytes photo) {
  quenby_file* made = NULL;
  DONE(quenby_filter_file(photo.data, photo.size, "AE0", "slider=0.4;", NULL, 0, NULL, NULL, NULL,
                          NULL, &made, &error));
  same_file(made, by_command("enhance", "plain.jpg"));
  CHECK(quenby_file_loss_count(made) == 0);
  quenby_file_free(made);

  const quenby_open_options turned = {.struct_size = sizeof(turned), .scale = 2, .rotate = 90};
  const quenby_save_options smaller = {.struct_size = sizeof(smaller), .quality = 70};
  const quenby_face faces[] = {{0.2f, 0.1f, 0.6f, 0.7f, 0}, {50, 60, 90, 110, 1}};
  DONE(quenby_filter_file(photo.data, photo.size, "AE0", "slider=0.9;", faces, 2, &turned, "JPEG",
                          &smaller, NULL, &made, &error));
  same_file(made, by_command("enhance --scale 2 --rotate 90 --quality 70 --slider 0.9 "
                             "--face 0.2,0.1,0.6,0.7 --face 50,60,90,110",
                             "turned.jpg"));
  quenby_file_free(made);

  const quenby_open_options alone = {.struct_size = sizeof(alone),
                                     .flags = QUENBY_IGNORE_KNOWN_FACES};
  const quenby_save_options told = {.struct_size = sizeof(told), .keep = QUENBY_KEEP_TIME};
  DONE(quenby_filter_file(photo.data, photo.size, "AE0", "slider=0.4;", NULL, 0, NULL, NULL, &told,
                          NULL, &made, &error));
  same_file(made, by_command("enhance --keep time", "told.jpg"));
  quenby_file_free(made);

  const quenby_save_options bare = {.struct_size = sizeof(bare), .flags = QUENBY_DROP_METADATA};
  DONE(quenby_filter_file(photo.data, photo.size, "AE08bit", "slider=0.4;", NULL, 0, &alone, "PNG",
                          &bare, NULL, &made, &error));
  same_file(made, by_command("enhance --filter AE08bit --faces none --strip all", "bare.png"));
  quenby_file_free(made);

  DONE(quenby_filter_file(photo.data, photo.size, "AE08bit", "slider=0.4;", NULL, 0, NULL, "PNG",
                          NULL, NULL, &made, &error));
  same_file(made, by_command("enhance --filter AE08bit", "whole.png"));
  quenby_file_free(made);

  const quenby_save_options like = {.struct_size = sizeof(like),
                                    .flags = QUENBY_SOURCE_QUALITY | QUENBY_SUBSAMPLING_422};
  DONE(quenby_filter_file(photo.data, photo.size, "AE0", "slider=0.4;", NULL, 0, NULL, NULL, &like,
                          NULL, &made, &error));
  same_file(made, by_command("enhance --quality auto --subsampling 422", "like.jpg"));
  quenby_facts facts = {.struct_size = sizeof(facts)};
  DONE(quenby_read_facts(quenby_file_data(made), quenby_file_size(made), &facts, &error));
  CHECK(strcmp(facts.last_edit, "AE0, slider 0.4") == 0);
  quenby_file_free(made);

  const uint8_t transparent[] = {1, 2, 3, 4};
  const quenby_pixels pixel = {transparent, 1, 1, 4};
  quenby_loss loss = {.struct_size = sizeof(loss)};
  DONE(quenby_write(&pixel, "JPEG", NULL, NULL, &made, &error));
  CHECK(quenby_file_loss_count(made) == 1);
  DONE(quenby_file_loss(made, 0, &loss, &error));
  CHECK(strcmp(loss.what, "transparency") == 0 && strlen(loss.why) > 0);
  quenby_file_free(made);
}

/* What a function that reads a file says to limits. */
static void limited(struct bytes file, quenby_open_options limits, const char* words) {
  quenby_facts facts = {.struct_size = sizeof(facts)};
  quenby_photo* photo = NULL;
  quenby_file* made = NULL;
  quenby_shot shot;
  const int kinds[] = {quenby_read_facts_within(file.data, file.size, &limits, &facts, &error),
                       quenby_photo_open(file.data, file.size, &limits, NULL, &photo, &error),
                       quenby_read_shot(file.data, file.size, &limits, NULL, &shot, &error),
                       quenby_filter_file(file.data, file.size, "WinterRGB", NULL, NULL, 0, &limits,
                                          NULL, NULL, NULL, &made, &error)};
  for (size_t i = 0; i < sizeof(kinds) / sizeof(*kinds); ++i)
    CHECK(kinds[i] == (words == NULL ? QUENBY_OK : QUENBY_TOO_LARGE));
  CHECK(words == NULL ? error.message[0] == 0 : strstr(error.message, words) != NULL);
  quenby_photo_free(photo);
  quenby_file_free(made);
}

static void limits(struct bytes file) {
  const size_t size = sizeof(quenby_open_options);
  limited(file, (quenby_open_options){.struct_size = size, .max_bytes = file.size}, NULL);
  limited(file, (quenby_open_options){.struct_size = size, .max_bytes = file.size - 1},
          "larger than");
  limited(file, (quenby_open_options){.struct_size = size, .max_pixels = 30000}, NULL);
  limited(file, (quenby_open_options){.struct_size = size, .max_pixels = 29999}, "at most 29999");
  limited(file, (quenby_open_options){.struct_size = size, .max_segments = 1}, "segments");
  limited(file, (quenby_open_options){.struct_size = size, .max_scans = 1}, NULL);
}

static void photos(struct bytes file) {
  quenby_facts facts = {.struct_size = sizeof(facts)};
  DONE(quenby_read_facts(file.data, file.size, &facts, &error));
  CHECK(facts.width == 200 && facts.height == 150 && facts.orientation == 6);
  CHECK(facts.channels == 3 && !facts.progressive && !facts.has_alpha);
  CHECK(strcmp(facts.format, "JPEG") == 0);
  CHECK(strncmp(facts.capture_time, "2024-05-01T12:30:45", 19) == 0);
  CHECK(facts.wall_clock == 1714566645.0 && isnan(facts.utc));

  quenby_photo* photo = NULL;
  DONE(quenby_photo_open(file.data, file.size, NULL, NULL, &photo, &error));
  quenby_pixels pixels;
  DONE(quenby_photo_pixels(photo, &pixels, &error));
  CHECK(pixels.width == 150 && pixels.height == 200 && pixels.stride == 600);
  quenby_facts again = {.struct_size = sizeof(again)};
  DONE(quenby_photo_facts(photo, &again, &error));
  CHECK(again.orientation == 6 && again.width == 200);
  size_t count = 0;
  quenby_known_face face;
  DONE(quenby_photo_faces(photo, &face, 1, &count, &error));
  CHECK(count == 1 && strcmp(face.name, "Ada") == 0 && face.left < face.right);
  CHECK(quenby_photo_notice(photo, 0) == NULL);

  /* The steps that quenby_filter_file is made of. */
  uint8_t* const out = malloc(pixels.stride * pixels.height);
  quenby_session* session = NULL;
  DONE(quenby_session_open_photo(photo, NULL, 0, &session, &error));
  DONE(quenby_session_apply(session, "AE0", "slider=0.4;", out, pixels.stride, NULL, &error));
  quenby_session_free(session);
  quenby_file *stepwise = NULL, *at_once = NULL;
  const quenby_pixels filtered = {out, pixels.width, pixels.height, pixels.stride};
  DONE(quenby_photo_save(photo, &filtered, NULL, NULL, NULL, &stepwise, &error));
  const quenby_save_options unmarked = {.struct_size = sizeof(unmarked), .flags = QUENBY_NO_MARK};
  DONE(quenby_filter_file(file.data, file.size, "AE0", "slider=0.4;", NULL, 0, NULL, NULL,
                          &unmarked, NULL, &at_once, &error));
  CHECK(quenby_file_size(stepwise) == quenby_file_size(at_once) &&
        memcmp(quenby_file_data(stepwise), quenby_file_data(at_once), quenby_file_size(at_once)) ==
            0);
  DONE(quenby_read_facts(quenby_file_data(at_once), quenby_file_size(at_once), &facts, &error));
  CHECK(facts.orientation == 1 && facts.width == 150);
  quenby_file_free(stepwise);
  quenby_file_free(at_once);

  /* Every pixel of a PNG file comes back. */
  quenby_file* png = NULL;
  DONE(quenby_photo_save(photo, NULL, "PNG", NULL, NULL, &png, &error));
  quenby_photo* reread = NULL;
  const quenby_open_options stored = {.struct_size = sizeof(stored), .flags = QUENBY_AS_STORED};
  DONE(quenby_photo_open(quenby_file_data(png), quenby_file_size(png), &stored, NULL, &reread,
                         &error));
  quenby_pixels same;
  DONE(quenby_photo_pixels(reread, &same, &error));
  CHECK(same.height == 200 && memcmp(same.rgba, pixels.rgba, pixels.stride * 200) == 0);
  quenby_photo_free(reread);
  quenby_file_free(png);
  quenby_photo_free(photo);
  free(out);
}

static void sessions(void) {
  quenby_pixels pixels = made_pixels(120, 90, 3);
  const size_t packed = 120 * 4, wide = packed + 12;
  uint8_t* const gaps = malloc(wide * 90);
  for (size_t y = 0; y < 90; ++y) memcpy(gaps + y * wide, pixels.rgba + y * packed, packed);
  const quenby_pixels strided = {gaps, 120, 90, wide};
  quenby_session *copying = NULL, *borrowing = NULL, *gapped = NULL;
  const quenby_face face = {0.3f, 0.2f, 0.7f, 0.8f, 0}, in_pixels = {36, 18, 84, 72, 1};
  DONE(quenby_session_open(&pixels, &face, 1, 0, &copying, &error));
  DONE(quenby_session_open(&pixels, &in_pixels, 1, QUENBY_BORROW_PIXELS, &borrowing, &error));
  DONE(quenby_session_open(&strided, &face, 1, QUENBY_BORROW_PIXELS, &gapped, &error));
  uint8_t *a = malloc(packed * 90), *b = malloc(packed * 90), *c = malloc(wide * 90);
  memset(c, 7, wide * 90);
  for (int move = 1; move <= 3; ++move) {
    char params[40];
    snprintf(params, sizeof(params), "slider=0.%d;", 3 * move);
    DONE(quenby_session_apply(copying, "AE0", params, a, packed, NULL, &error));
    DONE(quenby_session_apply(borrowing, "AE0", params, b, packed, NULL, &error));
    DONE(quenby_session_apply(gapped, "AE0", params, c, wide, NULL, &error));
    CHECK(memcmp(a, pixels.rgba, packed * 90) != 0);
    CHECK(memcmp(a, b, packed * 90) == 0);
    for (size_t y = 0; y < 90; ++y) {
      CHECK(memcmp(a + y * packed, c + y * wide, packed) == 0);
      CHECK(c[y * wide + packed] == 7 && c[y * wide + wide - 1] == 7);
    }
  }
  DONE(quenby_session_apply(copying, "WinterRGB", NULL, a, packed, NULL, &error));
  DONE(quenby_session_apply(copying, "PassThrough", "", b, packed, NULL, &error));
  CHECK(memcmp(b, pixels.rgba, packed * 90) == 0 && memcmp(a, b, packed * 90) != 0);
  quenby_session_free(copying);
  quenby_session_free(borrowing);
  quenby_session_free(gapped);
  free_pixels(&pixels);
  free(gaps);
  free(a);
  free(b);
  free(c);
}

static void duplicates(struct bytes photo) {
  quenby_shot shots[3];
  DONE(quenby_read_shot(photo.data, photo.size, NULL, NULL, &shots[0], &error));
  CHECK(shots[0].orientation == 6 && shots[0].wall_clock == 1714566645.0);
  CHECK(shots[0].pixel_count == 200 * 150);
  shots[1] = shots[2] = shots[0];
  shots[1].wall_clock += 2;
  shots[2].wall_clock += 1e6;
  shots[1].pixel_count = 0; /* unknown, or wrong: the same pairs */
  shots[2].pixel_count = 7;
  float distance = -1, score = -1;
  double window = -1;
  DONE(quenby_distance(shots[0].green_cdf, shots[1].green_cdf, &distance, &error));
  CHECK(distance >= 0 && distance < 0.01f);
  DONE(quenby_dupe_score(distance, -2, 1, &score, &error));
  DONE(quenby_dupe_window(0, 1, &window, &error));
  CHECK(window > 100 && window < 200);
  quenby_pairs pairs;
  DONE(quenby_find_pairs(shots, 3, 0, NULL, &pairs, &error));
  CHECK(pairs.count == 1 && pairs.data[0].first == 0 && pairs.data[0].second == 1);
  CHECK(pairs.data[0].score == score && pairs.data[0].seconds == 2 && pairs.data[0].times_known);
  uint64_t first_of[3] = {9, 9, 9};
  DONE(quenby_group_pairs(pairs.data, pairs.count, 3, first_of, &error));
  CHECK(first_of[0] == 0 && first_of[1] == 0 && first_of[2] == 2);
  quenby_pairs_free(&pairs);
  CHECK(pairs.data == NULL && pairs.count == 0);
  DONE(quenby_find_pairs(NULL, 0, 0, NULL, &pairs, &error));
  CHECK(pairs.count == 0);
  quenby_pairs_free(&pairs);

  quenby_pixels pixels = made_pixels(50, 40, 1);
  float cdf[256];
  DONE(quenby_green_cdf(&pixels, cdf, &error));
  CHECK(cdf[0] >= 0 && fabsf(cdf[255] - 1) < 1e-5f);
  for (int i = 1; i < 256; ++i) CHECK(cdf[i] >= cdf[i - 1]);
  free_pixels(&pixels);
}

static void quality(void) {
  quenby_pixels pixels = made_pixels(300, 200, 5);
  quenby_niqe_result niqe = {.struct_size = sizeof(niqe)};
  float distances[6];
  DONE(quenby_niqe(&pixels, &niqe, distances, 6, &error));
  CHECK(niqe.block_columns == 3 && niqe.block_rows == 2 && niqe.score > 0);
  for (int i = 0; i < 36; ++i) CHECK(isfinite(niqe.features[i]));
  for (int i = 0; i < 6; ++i) CHECK(distances[i] > 0);
  const float score = niqe.score;
  DONE(quenby_niqe(&pixels, &niqe, NULL, 0, &error));
  CHECK(niqe.score == score);
  pixels.width = 95;
  DONE(quenby_niqe(&pixels, &niqe, NULL, 0, &error));
  CHECK(isnan(niqe.score) && niqe.block_columns == 0 && isnan(niqe.features[0]));
  pixels.width = 300;

  /* The score that the command prints of the same pixels. */
  quenby_file* png = NULL;
  DONE(quenby_write(&pixels, "PNG", NULL, NULL, &png, &error));
  char path[1000], line[2000], said[400] = "", wanted[40];
  snprintf(path, sizeof(path), "%s/scored.png", folder);
  write_bytes(path, quenby_file_data(png), quenby_file_size(png));
  snprintf(line, sizeof(line), "'%s' score '%s' > '%s/score.txt'", command, path, folder);
  CHECK(system(line) == 0);
  snprintf(path, sizeof(path), "%s/score.txt", folder);
  struct bytes text = read_bytes(path);
  memcpy(said, text.data, text.size < sizeof(said) ? text.size : sizeof(said) - 1);
  snprintf(wanted, sizeof(wanted), "%.6g", (double)score);
  CHECK(strstr(said, wanted) != NULL);
  free(text.data);
  quenby_file_free(png);
  free_pixels(&pixels);
}

static void corners(void) {
  quenby_pixels pixels = made_pixels(160, 120, 2);
  uint8_t* const grey = malloc(170 * 120);
  DONE(quenby_grey_of(&pixels, grey, 170, &error));
  for (size_t y = 0; y < 120; ++y) {
    for (size_t x = 0; x < 160; ++x) CHECK(grey[y * 170 + x] == pixels.rgba[4 * (y * 160 + x) + 1]);
  }
  const quenby_grey picture = {grey, 160, 120, 170};
  quenby_corners all, strongest;
  DONE(quenby_fast(&picture, 9, 10, 0, &all, &error));
  DONE(quenby_fast(&picture, 9, 10, 1, &strongest, &error));
  CHECK(strongest.count > 0 && strongest.count < all.count);
  for (size_t i = 0; i < all.count; ++i) {
    CHECK(all.data[i].x >= 3 && all.data[i].y >= 3 && all.data[i].score >= 10);
  }
  quenby_descriptors described;
  DONE(quenby_brief(&picture, strongest.data, strongest.count, &described, &error));
  CHECK(described.count > 0 && described.count <= strongest.count);
  unsigned bits = 0;
  for (int i = 0; i < 8; ++i) bits |= described.data[0].words[i];
  CHECK(bits != 0);
  quenby_corners_free(&all);
  quenby_corners_free(&strongest);
  quenby_descriptors_free(&described);
  DONE(quenby_brief(&picture, NULL, 0, &described, &error));
  CHECK(described.count == 0 && described.data == NULL);
  DONE(quenby_fast(&picture, 12, 255, 0, &all, &error));
  CHECK(all.count == 0);
  quenby_corners_free(&all);
  free(grey);
  free_pixels(&pixels);
}

int main(int argc, char** argv) {
  if (argc != 4) return 2;
  command = argv[1];
  folder = argv[3];
  char path[1000];
  snprintf(path, sizeof(path), "%s/photo.jpg", folder);
  struct bytes photo = made_photo(200, 150, 1);
  write_bytes(path, photo.data, photo.size);
  library(argv[2]);
  filters();
  files(photo);
  photos(photo);
  limits(photo);
  sessions();
  duplicates(photo);
  quality();
  corners();
  free(photo.data);
  if (failures > 0) fprintf(stderr, "%d checks failed\n", failures);
  return failures > 0;
}
