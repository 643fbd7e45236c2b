/* Quenby for C and for every language that can call C: sessions on pixels, whole photos from bytes to
 * bytes, near-duplicates, the NIQE score, corners and their descriptors.
 *
 * Errors. A function that can fail returns QUENBY_OK or a kind of error, and tells more in a struct of
 * the caller's, which may be null. After an error, results are as they were, save that pointers to new
 * objects are null and counts 0. Null where nothing says that it may be is QUENBY_INVALID_ARGUMENT, as
 * is whatever else a function cannot mean; every function may also end with QUENBY_OUT_OF_MEMORY.
 *
 * Threads. Nothing here keeps state outside of its objects or starts a thread, but for quenby_threads_new
 * and quenby_cancel_new_after: a call does its work on the thread that calls, and on those that the
 * caller lends it (quenby_workers). Functions that take an object as const, and quenby_session_apply, may
 * be called by any number of threads at once; objects are freed when no call uses them any more.
 *
 * Ownership. What a call is given it has done with when it returns, unless it says otherwise. Every
 * kind of object has one function that frees it, which takes null in silence.
 *
 * Texts are UTF-8 and end with 0. Sizes are in bytes unless something else is named.
 *
 * Growth. Structs that may grow begin with struct_size, which the caller sets to sizeof the struct:
 * fields that an older library does not know must be 0 (QUENBY_INVALID_ARGUMENT otherwise), and those
 * that an older caller does not know are left out. In options, 0 is always the default. Other structs
 * stay as they are. */
#ifndef QUENBY_QUENBY_H
#define QUENBY_QUENBY_H

#include <stddef.h>
#include <stdint.h>

#if defined(__GNUC__)
#define QUENBY_API __attribute__((visibility("default")))
#else
#define QUENBY_API
#endif

#ifdef __cplusplus
extern "C" {
#endif

/* ---- The library ---- */

/** What this header was written for; compare with quenby_abi(). */
#define QUENBY_ABI 1

/** The number in the library's soname: libraries with the same number serve the same programs. */
QUENBY_API uint32_t quenby_abi(void);

/** "0.1.0"; lives as long as the library. */
QUENBY_API const char* quenby_version(void);

/* ---- Errors ---- */

enum {
  QUENBY_OK = 0,
  QUENBY_INVALID_ARGUMENT = 1, /**< What was passed cannot be meant; the message names it. */
  QUENBY_OUT_OF_MEMORY = 2,
  QUENBY_CANCELLED = 3,  /**< The call's cancel object asked for it. */
  QUENBY_EMPTY_FILE = 4, /**< No bytes at all. */
  QUENBY_NOT_A_PHOTO = 5,
  QUENBY_UNSUPPORTED = 6, /**< A known format, or kind of file of it, that is not read. */
  QUENBY_DAMAGED = 7,     /**< Bytes that break the rules of their format. */
  QUENBY_TRUNCATED = 8,   /**< The beginning of a photo. */
  QUENBY_TOO_LARGE = 9,   /**< More work than the limits allow. */
  QUENBY_FAILED = 10      /**< Anything else. */
};

/** Why a call failed. The message is one clause for a user, "truncated: the picture data ends early",
 * cut between two characters where it is longer; after QUENBY_OK it is empty. */
typedef struct quenby_error {
  int32_t kind;
  char message[508];
} quenby_error;

/* ---- Cancelling ---- */

/** A wish that work ends. Calls look at it between their steps: while they decode, filter and encode from
 * some rows to the next, and from pair to pair. */
typedef struct quenby_cancel quenby_cancel;

/** @param cancel  receives an object that asks for nothing yet. */
QUENBY_API int32_t quenby_cancel_new(quenby_cancel** cancel, quenby_error* error);

/** One that asks by itself when so many milliseconds have gone by since this call, whatever is at work then;
 * it has a thread of its own. */
QUENBY_API int32_t quenby_cancel_new_after(uint32_t milliseconds, quenby_cancel** cancel,
                                           quenby_error* error);

/** Asks every call with this object to end with QUENBY_CANCELLED, also those that only begin. From any
 * thread, as often as wanted; nothing takes it back. Null is nothing. */
QUENBY_API void quenby_cancel_request(quenby_cancel* cancel);

QUENBY_API void quenby_cancel_free(quenby_cancel* cancel);

/* ---- Workers ---- */

/** Threads of the caller's that share the work on one picture. What comes out is the same, to the byte,
 * for any number of them. */
typedef struct quenby_workers {
  size_t struct_size;
  size_t count;  /**< How many tasks can be at work at the same time, 1 ... 1024. */
  void* context; /**< For `run`. */
  /** Calls task(state, 0) ... task(state, tasks - 1), each once and on any thread, and returns when all
   * have returned. None waits for another: one thread is enough. Any thread may call it, several at
   * once as well; tasks do not. */
  void (*run)(void* context, size_t tasks, void (*task)(void* state, size_t index), void* state);
} quenby_workers;

/** Threads that sleep until they are lent work. */
typedef struct quenby_threads quenby_threads;

/** Starts threads to lend.
 * @param count    0 ... 1024: how many tasks they do at the same time with the thread that calls, so that
 *                 one fewer is started; 0 for as many as the process has cores.
 * @param threads  receives the object; it outlives what is lent it. */
QUENBY_API int32_t quenby_threads_new(size_t count, quenby_threads** threads, quenby_error* error);

/** Workers that are these threads, for any number of calls at once.
 * @param workers  its struct_size set; the rest is written. */
QUENBY_API int32_t quenby_threads_lend(quenby_threads* threads, quenby_workers* workers,
                                       quenby_error* error);

/** Ends them; while no call uses them. */
QUENBY_API void quenby_threads_free(quenby_threads* threads);

/* ---- Pixels and faces ---- */

/** Pixels of the caller's: four bytes each, red, green, blue, alpha, not multiplied in; the top row
 * first, each `stride` bytes behind the one above. Both sides are at least 1 and the stride at least
 * 4 * width. */
typedef struct quenby_pixels {
  const uint8_t* rgba;
  uint32_t width;
  uint32_t height;
  size_t stride;
} quenby_pixels;

/** A face in the upright picture: fractions of its width and height (0,0 the top left corner), or
 * pixels of its full size. It may reach beyond the picture; sides are finite. */
typedef struct quenby_face {
  float left, top, right, bottom;
  uint32_t in_pixels; /**< 0 for fractions. */
} quenby_face;

/* ---- Filters and what they take ---- */

/** One filter or look. All texts live as long as the library. */
typedef struct quenby_filter {
  size_t struct_size;
  const char* name;         /**< "AE0": what functions below want. */
  const char* display_name; /**< What users see; several filters may share one. */
  const char* description;  /**< One or more sentences. */
  const char* required;     /**< The parameters it cannot do without, "slider=0.4;" or "". */
  uint32_t parameter_count;
  uint32_t reads_faces; /**< Whether faces change the result. */
} quenby_filter;

enum {
  QUENBY_NUMBER = 0,
  QUENBY_BOOLEAN = 1,
  QUENBY_NUMBERS = 2 /**< A list; every number, the last as well, is followed by a comma. */
};

/** One key of a filter's parameters, which are texts of "key=value;" items. Nothing is clamped to the
 * range. All texts live as long as the library. */
typedef struct quenby_parameter {
  size_t struct_size;
  const char* name;        /**< "slider" */
  const char* description; /**< One sentence, without the full stop. */
  const char* wanted;      /**< "a number from 0 to 1", "true or false" */
  const char* only_with;   /**< The boolean without which this key does nothing; mostly "". */
  int32_t kind;            /**< QUENBY_NUMBER ... */
  uint32_t required;       /**< Whether the filter refuses to work without it. */
  float lowest, highest; /**< Of a number, or of each in a list; infinite where there is no end. */
  uint32_t above_lowest; /**< Whether `lowest` itself is outside. */
  uint32_t fewest;       /**< Numbers of a list; a shorter one is ignored. */
  float standard;        /**< What counts without the key, or where to begin with a required one;
                                NaN when no parameter can say it. */
} quenby_parameter;

enum {
  QUENBY_UNKNOWN = 0,    /**< The filter has no such key. */
  QUENBY_MISSING = 1,    /**< A required key is not there. */
  QUENBY_UNREADABLE = 2, /**< A value is no number. */
  QUENBY_MISREAD = 3,    /**< The value counts as another one, or is outside the range. */
  QUENBY_IGNORED = 4     /**< The filter does not see this text. */
};

/** Something in parameters that does not mean what it seems to. Filters are not begun with the first
 * three kinds, and take the others in silence. */
typedef struct quenby_fault {
  int32_t kind;
  char key[60]; /**< Empty where the text belongs to none. */
  char message[448];
} quenby_fault;

QUENBY_API int32_t quenby_filter_count(size_t* count, quenby_error* error);

/** @param index  0 ... count - 1; filters are in the order of their names. */
QUENBY_API int32_t quenby_filter_at(size_t index, quenby_filter* filter, quenby_error* error);

QUENBY_API int32_t quenby_filter_named(const char* name, quenby_filter* filter,
                                       quenby_error* error);

/** @param index  0 ... parameter_count - 1. */
QUENBY_API int32_t quenby_parameter_at(const char* filter, size_t index,
                                       quenby_parameter* parameter, quenby_error* error);

/** What is wrong with parameters, in the order of the text, what is missing last.
 * @param params    may be null for none.
 * @param faults    room for `capacity` of them, null for none.
 * @param count     receives how many there are, which may be more than `capacity`. */
QUENBY_API int32_t quenby_check_parameters(const char* filter, const char* params,
                                           quenby_fault* faults, size_t capacity, size_t* count,
                                           quenby_error* error);

/* ---- Photos: bytes in, bytes out ---- */

/** Bits of quenby_open_options.flags. */
enum {
  QUENBY_AS_STORED = 1u,         /**< The picture is not turned upright, and `rotate` idle. */
  QUENBY_IGNORE_KNOWN_FACES = 2u /**< Of the faces that the file knows of, none are read. */
};

/** How a photo is opened, and how much work it may be. */
typedef struct quenby_open_options {
  size_t struct_size;
  int32_t scale;       /**< 1, 2, 4 or 8: what the sides are divided by, rounded up. */
  int32_t rotate;      /**< Degrees clockwise beyond upright, a multiple of 90. */
  uint64_t max_pixels; /**< Of the picture as stored: 268435456 unless given; then of compressed
                            pixels as well, unless those are given. */
  int32_t max_scans;   /**< Of a progressive file: 100 unless given. */
  uint32_t flags;
  const quenby_workers* workers;  /**< Of quenby_filter_file alone; null for none. */
  uint64_t max_scanned_pixels;    /**< Pixels times scans, beside 4096 for each byte of a file of
                                      several scans: 536870912 unless given. */
  uint64_t max_compressed_pixels; /**< Pixels, beside 128 for each byte of a PNG or arithmetic coded
                                       JPEG file: 40000000 unless given. */
  int32_t max_segments;           /**< Before a JPEG file's picture data: 4096 unless given. */
  uint64_t max_bytes;             /**< Of the file: 1073741824 unless given. */
} quenby_open_options;

/** Bits of quenby_save_options.flags. */
enum {
  QUENBY_DROP_METADATA = 1u, /**< All but the colour profile. */
  QUENBY_DROP_LOCATION = 2u,
  QUENBY_DROP_THUMBNAIL = 4u,
  QUENBY_DROP_GAIN_MAP = 8u,
  QUENBY_NO_MARK = 16u,        /**< quenby_filter_file: the file does not tell of the edit. */
  QUENBY_SOURCE_QUALITY = 32u, /**< Whatever `quality`: what the photo's own file seems to have. */
  QUENBY_SUBSAMPLING_444 =
      64u, /**< Of a JPEG file, one of the three; else as in the photo's own, */
  QUENBY_SUBSAMPLING_422 = 128u, /**< and 4:2:0 where there is none. */
  QUENBY_SUBSAMPLING_420 = 256u
};

/** Bits of quenby_save_options.keep. */
enum {
  QUENBY_KEEP_COPYRIGHT = 1u, /**< Who made it and who may use it, in EXIF, XMP, IPTC and texts. */
  QUENBY_KEEP_TIME = 2u,      /**< When it was taken, likewise. */
  QUENBY_KEEP_EXIF = 4u,
  QUENBY_KEEP_XMP = 8u,
  QUENBY_KEEP_IPTC = 16u,
  QUENBY_KEEP_GAIN_MAP = 32u
};

/** How a file is coded, and what goes into it. */
typedef struct quenby_save_options {
  size_t struct_size;
  int32_t quality; /**< 1 ... 100, 90 unless given; for formats that lose something. */
  uint32_t flags;
  uint32_t keep; /**< These kinds of metadata and the colour profile alone; 0 for all kinds. */
} quenby_save_options;

/** What a file says before its picture data. */
typedef struct quenby_facts {
  size_t struct_size;
  uint32_t width, height; /**< As stored, before any turning. */
  int32_t channels;       /**< 1 grey, 2 grey and alpha, 3 colour, 4 CMYK or colour and alpha. */
  int32_t orientation;    /**< EXIF, 1 ... 8. */
  uint32_t progressive;
  uint32_t has_alpha;
  double wall_clock;     /**< Capture time in seconds since 1970 by the clock of its place, ... */
  double utc;            /**< ... and in UTC; NaN where it is not known. */
  char format[16];       /**< "JPEG" */
  char capture_time[64]; /**< "2024-05-01T12:30:45+02:00", empty where it is not known. */
  char last_edit[96];    /**< By Quenby, as the file tells: "AE0, slider 0.4"; empty without one. */
} quenby_facts;

/** A face that a file knows of, in fractions of the upright picture. */
typedef struct quenby_known_face {
  double left, top, right, bottom;
  char name[96]; /**< Of the person; empty where none is stated. */
} quenby_known_face;

/** A decoded photo with what its file says. */
typedef struct quenby_photo quenby_photo;

/** The bytes of a file that was made, and what of the metadata is not in it. */
typedef struct quenby_file quenby_file;

/** Something that the photo had and the file has not; texts live as long as the file. */
typedef struct quenby_loss {
  size_t struct_size;
  const char* what; /**< "transparency" */
  const char* why;  /**< "a JPEG file has none" */
} quenby_loss;

/** What a file says, without decoding it. */
QUENBY_API int32_t quenby_read_facts(const uint8_t* file, size_t size, quenby_facts* facts,
                                     quenby_error* error);

/** The same within limits.
 * @param options  its limits count and nothing else of it; may be null. */
QUENBY_API int32_t quenby_read_facts_within(const uint8_t* file, size_t size,
                                            const quenby_open_options* options, quenby_facts* facts,
                                            quenby_error* error);

/** Decodes a JPEG or PNG file and turns the picture upright: all of it or an error, never half.
 * @param options  may be null.
 * @param cancel   may be null, here and below. */
QUENBY_API int32_t quenby_photo_open(const uint8_t* file, size_t size,
                                     const quenby_open_options* options,
                                     const quenby_cancel* cancel, quenby_photo** photo,
                                     quenby_error* error);

QUENBY_API void quenby_photo_free(quenby_photo* photo);

/** The decoded picture, in memory that the photo owns. */
QUENBY_API int32_t quenby_photo_pixels(const quenby_photo* photo, quenby_pixels* pixels,
                                       quenby_error* error);

QUENBY_API int32_t quenby_photo_facts(const quenby_photo* photo, quenby_facts* facts,
                                      quenby_error* error);

/** @param faces  room for `capacity` of them, null for none.
 * @param count   receives how many there are, which may be more. */
QUENBY_API int32_t quenby_photo_faces(const quenby_photo* photo, quenby_known_face* faces,
                                      size_t capacity, size_t* count, quenby_error* error);

/** What a user should know of how the file was read, "16 bits a channel, read as 8"; null from the
 * first index on that has none. Lives as long as the photo. */
QUENBY_API const char* quenby_photo_notice(const quenby_photo* photo, size_t index);

/** A file with another picture of the photo's size and the photo's metadata, made to say what the
 * picture is.
 * @param pixels   null for the photo's own.
 * @param format   "JPEG" or "PNG"; null for the photo's own.
 * @param options  may be null.
 * @param file     receives the file. */
QUENBY_API int32_t quenby_photo_save(const quenby_photo* photo, const quenby_pixels* pixels,
                                     const char* format, const quenby_save_options* options,
                                     const quenby_cancel* cancel, quenby_file** file,
                                     quenby_error* error);

/** A file with a picture and no metadata; see quenby_photo_save.
 * @param format  not null. */
QUENBY_API int32_t quenby_write(const quenby_pixels* pixels, const char* format,
                                const quenby_save_options* options, const quenby_cancel* cancel,
                                quenby_file** file, quenby_error* error);

/** The file that `quenby enhance` makes: opened, turned upright, filtered, saved with its metadata
 * and a mark that tells of the edit. A photo that carries such a mark is edited all the same.
 * @param params        may be null for none.
 * @param faces         beside those that the file knows of; null for none.
 * @param open, save    may be null.
 * @param format        null for that of `file`. */
QUENBY_API int32_t quenby_filter_file(const uint8_t* file, size_t size, const char* filter,
                                      const char* params, const quenby_face* faces,
                                      size_t face_count, const quenby_open_options* open,
                                      const char* format, const quenby_save_options* save,
                                      const quenby_cancel* cancel, quenby_file** result,
                                      quenby_error* error);

/** The bytes, which the file owns; null for null. */
QUENBY_API const uint8_t* quenby_file_data(const quenby_file* file);

/** How many they are; 0 for null. */
QUENBY_API size_t quenby_file_size(const quenby_file* file);

/** 0 for null. */
QUENBY_API size_t quenby_file_loss_count(const quenby_file* file);

/** @param index  0 ... quenby_file_loss_count() - 1. */
QUENBY_API int32_t quenby_file_loss(const quenby_file* file, size_t index, quenby_loss* loss,
                                    quenby_error* error);

QUENBY_API void quenby_file_free(quenby_file* file);

/* ---- Sessions: filters on pixels ---- */

/** One picture that filters are applied to, again and again: what a filter finds out about the picture
 * is kept for the next time, so that moving a slider costs a fraction of the first application. */
typedef struct quenby_session quenby_session;

/** Bits of quenby_session_open's flags. */
enum {
  /** Rows without gaps (stride = 4 * width) are not copied: they must stay as they are until the
   * session is freed. Others are copied all the same. */
  QUENBY_BORROW_PIXELS = 1u
};

/** @param faces  null for none.
 * @param flags   0 or QUENBY_BORROW_PIXELS. */
QUENBY_API int32_t quenby_session_open(const quenby_pixels* pixels, const quenby_face* faces,
                                       size_t face_count, uint32_t flags, quenby_session** session,
                                       quenby_error* error);

/** A session on a photo's picture, which it shares: the photo may be freed before.
 * @param faces  beside those that the photo's file knows of; null for none. */
QUENBY_API int32_t quenby_session_open_photo(const quenby_photo* photo, const quenby_face* faces,
                                             size_t face_count, quenby_session** session,
                                             quenby_error* error);

/** Applies a filter to the picture that the session was opened with.
 * @param params  may be null for none.
 * @param rgba    written: as many pixels as that picture has, no byte of them the session's.
 * @param stride  from one of its rows to the next, at least 4 * width; what lies between rows is
 *                left alone.
 * After an error the pixels are as they were, unless it is QUENBY_CANCELLED. */
QUENBY_API int32_t quenby_session_apply(quenby_session* session, const char* filter,
                                        const char* params, uint8_t* rgba, size_t stride,
                                        const quenby_cancel* cancel, quenby_error* error);

/** Lets workers share the work of a session from here on, before any other call uses it.
 * @param workers  copied; what they are made of outlives the session. */
QUENBY_API int32_t quenby_session_share(quenby_session* session, const quenby_workers* workers,
                                        quenby_error* error);

QUENBY_API void quenby_session_free(quenby_session* session);

/* ---- Near-duplicates ---- */

/** What is compared of a photo. */
typedef struct quenby_shot {
  /** The share of pixels whose green byte is at most i; ends at 1 up to rounding. */
  float green_cdf[256];
  int32_t orientation; /**< EXIF; only compared for equality. */
  /** Over how many pixels green_cdf was counted, 0 when unknown: with it a search takes a third of the
   * memory for each shot. */
  uint32_t pixel_count;
  double
      wall_clock; /**< Capture time in seconds by the clock of its place, NaN when unknown, ... */
  double utc;     /**< ... and in UTC, NaN when unknown. */
} quenby_shot;

/** Two shots that reach the threshold. */
typedef struct quenby_pair {
  uint64_t first, second; /**< Places in the list, first < second. */
  double seconds;         /**< Between them; 0 where not both times are known. */
  float score, distance;
  uint32_t times_known, same_orientation;
} quenby_pair;

/** What quenby_find_pairs found; quenby_pairs_free frees it. */
typedef struct quenby_pairs {
  quenby_pair* data;
  size_t count;
} quenby_pairs;

/** The distribution of the green bytes of a picture.
 * @param green_cdf  receives 256 values. */
QUENBY_API int32_t quenby_green_cdf(const quenby_pixels* pixels, float* green_cdf,
                                    quenby_error* error);

/** What is compared of a file, decoded at the size that `quenby dupes` reads.
 * @param options  its limits count and nothing else of it; may be null. */
QUENBY_API int32_t quenby_read_shot(const uint8_t* file, size_t size,
                                    const quenby_open_options* options, const quenby_cancel* cancel,
                                    quenby_shot* shot, quenby_error* error);

/** How far apart the light of two photos is once a difference in exposure is taken out, 0 ... 1; a
 * photo's distance to itself is about 0.001.
 * @param a, b  256 values each. */
QUENBY_API int32_t quenby_distance(const float* a, const float* b, float* distance,
                                   quenby_error* error);

/** The duplicate score: larger is more likely, 0 the even chance, the same photo twice about 3.65.
 * @param seconds  between the two photos, of either sign. */
QUENBY_API int32_t quenby_dupe_score(float distance, double seconds, int32_t same_orientation,
                                     float* score, quenby_error* error);

/** The longest time between two photos, in seconds, that may reach `threshold`: negative when none
 * does, infinite when any does.
 * @param threshold  not NaN. */
QUENBY_API int32_t quenby_dupe_window(float threshold, int32_t same_orientation, double* seconds,
                                      quenby_error* error);

/** Every pair of shots that reaches `threshold`, by `first`, then `second`. Shots without a time are
 * compared with all others, the time between taken as 0.
 * @param shots      may be null when `count` is 0.
 * @param threshold  not NaN; 1.5 is what `quenby dupes` takes.
 * @param pairs      receives them; quenby_pairs_free frees them. */
QUENBY_API int32_t quenby_find_pairs(const quenby_shot* shots, size_t count, float threshold,
                                     const quenby_cancel* cancel, quenby_pairs* pairs,
                                     quenby_error* error);

QUENBY_API void quenby_pairs_free(quenby_pairs* pairs);

/** The groups of pairs: in each, every two shots are a pair.
 * @param pairs       `pair_count` pairs of places below `shot_count`, first < second, with scores that
 *                    are numbers; may be null when there are none.
 * @param first_of    `shot_count` numbers, written: of each shot the first of its group, its own place
 *                    when it is in none. */
QUENBY_API int32_t quenby_group_pairs(const quenby_pair* pairs, size_t pair_count,
                                      size_t shot_count, uint64_t* first_of, quenby_error* error);

/* ---- Quality: NIQE ---- */

/** The side of a block in pixels. */
#define QUENBY_NIQE_BLOCK 96

/** How natural a picture looks. */
typedef struct quenby_niqe_result {
  size_t struct_size;
  float score; /**< Lower is better; NaN when a side is below QUENBY_NIQE_BLOCK. */
  uint32_t block_columns, block_rows; /**< Whole blocks from the top left: width / 96, height / 96;
                                           0 when one of them is. */
  float features[36];                 /**< What is scored; NaN when the picture is too small. */
} quenby_niqe_result;

/** Names the model of pristine photos that scores refer to; scores compare only under one model. */
QUENBY_API const char* quenby_niqe_model(void);

/** The NIQE score of a picture; the command scores the upright picture at its full size.
 * @param block_distances  what each block alone would score, in raster order; null for none.
 * @param capacity         room in it, at least block_columns * block_rows. */
QUENBY_API int32_t quenby_niqe(const quenby_pixels* pixels, quenby_niqe_result* result,
                               float* block_distances, size_t capacity, quenby_error* error);

/* ---- Corners and descriptors ---- */

/** A grey picture of the caller's, a byte a pixel, otherwise as quenby_pixels. Sides are at most
 * 2147483647. */
typedef struct quenby_grey {
  const uint8_t* pixels;
  uint32_t width;
  uint32_t height;
  size_t stride;
} quenby_grey;

/** A FAST corner: column, row, and the largest threshold at which it is one. */
typedef struct quenby_corner {
  int32_t x, y, score;
} quenby_corner;

/** What quenby_fast found; quenby_corners_free frees it. */
typedef struct quenby_corners {
  quenby_corner* data;
  size_t count;
} quenby_corners;

/** The BRIEF descriptor of a corner: bit i is bit i mod 32 of word i / 32. The number of bits in which
 * two differ tells how unlike the corners are. */
typedef struct quenby_descriptor {
  int32_t x, y;
  uint32_t words[8];
} quenby_descriptor;

/** What quenby_brief made; quenby_descriptors_free frees it. */
typedef struct quenby_descriptors {
  quenby_descriptor* data;
  size_t count;
} quenby_descriptors;

/** The grey picture that corners are looked for in: the green channel.
 * @param grey    written, a byte a pixel.
 * @param stride  from one of its rows to the next, at least width. */
QUENBY_API int32_t quenby_grey_of(const quenby_pixels* pixels, uint8_t* grey, size_t stride,
                                  quenby_error* error);

/** FAST corners in raster order.
 * @param arc        how many neighbouring pixels of the circle differ, 9 to 12.
 * @param threshold  by more than how much; any number, and none differ by more than 254.
 * @param suppress   whether only corners that score higher than all their neighbours are wanted.
 * @param corners    receives them; quenby_corners_free frees them. */
QUENBY_API int32_t quenby_fast(const quenby_grey* grey, int32_t arc, int32_t threshold,
                               int32_t suppress, quenby_corners* corners, quenby_error* error);

QUENBY_API void quenby_corners_free(quenby_corners* corners);

/** BRIEF descriptors of corners, in their order; those within 15 pixels of a border are left out.
 * @param corners      any positions; may be null when `count` is 0.
 * @param descriptors  receives them; quenby_descriptors_free frees them. */
QUENBY_API int32_t quenby_brief(const quenby_grey* grey, const quenby_corner* corners, size_t count,
                                quenby_descriptors* descriptors, quenby_error* error);

QUENBY_API void quenby_descriptors_free(quenby_descriptors* descriptors);

#ifdef __cplusplus
}
#endif

#endif
