#include <jni.h>

// A race on purpose: the proof that the thread sanitizer would report one in a virtual machine.

static long counter = 0;

extern "C" JNIEXPORT void JNICALL
Java_com_pelorin_photos_quenby_autoenhance_ThreadSanitizerTest_00024PlantedRace_count(JNIEnv*,
                                                                                      jclass) {
  counter = counter + 1;
}
