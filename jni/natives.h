#pragma once

#include <jni.h>

namespace pelorin::quenby {

// The natives of QuenbyEngine and ImageDupeDetector, to be registered through the exception
// wrapper. Any thread that the virtual machine knows may call, several at once on one session too.

/// Opens a session on a copy of an RGBA_8888 bitmap.
/// @returns its handle, or 0 with a line in the log when the bitmap cannot be read, or with an
///          OutOfMemoryError pending.
jlong init(JNIEnv* env, jobject caller, jobject bitmap);

/// Gives the session its faces (RectF objects in fractions of the photo's size; a null array is
/// none) and forgets the filters prepared so far. When it raises, the session is as it was.
void preprocess(JNIEnv* env, jobject caller, jobjectArray faces, jlong handle);

/// Writes the filtered photo into the upper left corner of `outBitmap`, RGBA_8888 and at least as
/// large. An unknown filter name gives the photo as it is. Nothing is written, and a line logged,
/// for a bitmap that will not do, an unknown handle, or a session that was never preprocessed.
void applyAutoEnhanceFilter(JNIEnv* env, jobject caller, jlong handle, jobject outBitmap,
                            jstring filterName, jstring params);

/// Ends a session; calls at work on it finish first. 0 does nothing.
void releaseSession(JNIEnv* env, jobject caller, jlong handle);

/// Filters a JPEG file into another, which may be the same.
/// @param rotation     degrees clockwise, a multiple of 90; other than 0 leaves a rotated copy at
///                     `outputPath` whatever fails later.
/// @param faces        in fractions of the rotated and scaled picture; null is none.
/// @param decodeScale  see `NativeImageProcessor::decodeJpeg`.
/// @returns whether the file was written; true as well with "ran out of memory" pending after
///          decoding.
jboolean applyAutoEnhanceFilterToJpegFile(JNIEnv* env, jobject caller, jstring inputPath,
                                          jstring outputPath, jint rotation, jobjectArray faces,
                                          jint decodeScale, jstring filterName, jstring params);

/// How likely two photos are near-duplicates, or SIMILARITY_ERROR, with a line in the log, when a
/// bitmap cannot be read. Only the difference of the times and the equality of the orientations
/// count.
jfloat similarityScore(JNIEnv* env, jobject caller, jobject bitmap1, jdouble time1,
                       jint orientation1, jobject bitmap2, jdouble time2, jint orientation2);

}  // namespace pelorin::quenby
