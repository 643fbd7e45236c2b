#pragma once

// The log of everything beside the engine. Priorities are those of Android's log: 2 verbose,
// 3 debug, 4 info, 5 warning, 6 error, 7 fatal, 8 silent.

/// Writes one line to standard error: local time, the priority's letter, the tag and the formatted
/// text, in which control characters are escaped ("\x1b", "\u009b") and which is cut after a thousand
/// bytes. One write a line, so lines of several threads never
/// mix; nothing is allocated, and a line that cannot be written is dropped. Any thread may call. A
/// build for Android writes to that platform's log instead.
extern "C" void pn_printLog(int priority, const char* tag, const char* format, ...)
    __attribute__((format(printf, 3, 4)));

/// Drops lines below `priority` from now on, in the whole process; with 8 there are none. At first
/// that is 4: progress lines are for whoever asks for them.
extern "C" void pn_setLogPriority(int priority);
