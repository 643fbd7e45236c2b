#pragma once

#include <jni.h>

namespace pelorin::quenby {

// The natives of PhotoBytes, to be registered through `photoNative`. Any thread that the virtual
// machine knows may call, any number at once.
//
// A photo is given as an array or a direct buffer, see FileBytes, and `cancel` is a handle of
// Cancellations or 0; `maxBytes`, `maxPixels`, `maxScans` and `maxSegments` are those of
// photo::DecodeLimits, 0 for what it has. Beside what single natives say: PhotoException for what is no photo, damaged or
// beyond the limits, CancellationException after a cancellation, IllegalArgumentException that names
// the argument, OutOfMemoryError.

/// The file that `quenby enhance` makes of it, see photo::FilterRequest.
/// @param quality      1 ... 100, or -1 for what the photo's own file seems to have.
/// @param subsampling  444, 422 or 420; 0 for that of the photo's own file.
/// @param mark   whether the file tells of the edit.
/// @param lost   of one element, which receives what of the metadata is not in the file: what and
///               why of each, in UTF-8, a zero byte behind either; may be null.
/// @param png    whether it is a PNG file; a JPEG file else.
/// @param faces  left, top, right, bottom of each as fractions of the upright, turned picture; null
///               is none. Those that the file knows of come with them.
jbyteArray filterBytes(JNIEnv* env, jobject caller, jbyteArray array, jobject buffer, jint offset,
                       jint length, jint quality, jint subsampling, jint rotation,
                       jfloatArray faces, jint scale, jstring filter, jstring params, jboolean mark,
                       jlong cancel, jobjectArray lost, jlong maxBytes, jlong maxPixels,
                       jint maxScans, jint maxSegments, jboolean png);

/// The NIQE score of the upright picture; NaN when a side is below 96 pixels.
jfloat niqe(JNIEnv* env, jobject caller, jbyteArray array, jobject buffer, jint offset, jint length,
            jlong cancel, jlong maxBytes, jlong maxPixels, jint maxScans, jint maxSegments);

/// The 36 mean features behind the score; none when a side is below 96 pixels.
jfloatArray niqeMeanFeatures(JNIEnv* env, jobject caller, jbyteArray array, jobject buffer,
                             jint offset, jint length, jlong cancel, jlong maxBytes,
                             jlong maxPixels, jint maxScans, jint maxSegments);

/// The 256 values of the green CDF, of the picture at the size that `quenby dupes` reads.
jfloatArray greenCdf(JNIEnv* env, jobject caller, jbyteArray array, jobject buffer, jint offset,
                     jint length, jlong cancel, jlong maxBytes, jlong maxPixels, jint maxScans,
                     jint maxSegments);

/// Width and height as stored, EXIF orientation, capture time in seconds since 1970 by the clock of
/// its place and in UTC, each NaN when it is not known; from the header alone.
jdoubleArray facts(JNIEnv* env, jobject caller, jbyteArray array, jobject buffer, jint offset,
                   jint length, jlong maxBytes, jlong maxPixels, jint maxScans, jint maxSegments);

/// How far apart two green CDFs are, 0 ... 1.
jfloat distance(JNIEnv* env, jobject caller, jfloatArray a, jfloatArray b);

/// The duplicate score of two photos so far apart.
jfloat score(JNIEnv* env, jobject caller, jfloat distance, jdouble seconds,
             jboolean sameOrientation);

/// The longest time between two photos that may reach `threshold`; see longestDupeTimeDifference.
jdouble window(JNIEnv* env, jobject caller, jfloat threshold, jboolean sameOrientation);

/// The version of this library.
jstring version(JNIEnv* env, jobject caller);

jlong newCancel(JNIEnv* env, jobject caller);
void cancel(JNIEnv* env, jobject caller, jlong handle);
void freeCancel(JNIEnv* env, jobject caller, jlong handle);

/// Registers them all.
/// @throws JniError, as a rule with a Java exception pending, when PhotoBytes or one of its methods
///         is missing.
void registerPhotoNatives();

}  // namespace pelorin::quenby
