#include <jni.h>

#include "platform/pn/log.h"

/// The native of com.pelorin.photos.quenby.desktop.NativeLog.
extern "C" JNIEXPORT void JNICALL
Java_com_pelorin_photos_quenby_desktop_NativeLog_setLeastPriority(JNIEnv*, jclass, jint priority) {
  pn_setLogPriority(priority);
}
