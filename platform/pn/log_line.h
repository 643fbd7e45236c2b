#pragma once

/// Puts one line into the log: standard error, or the platform's own where there is one. Allocates
/// nothing; any thread may call.
/// @param text  at most a thousand bytes, without an end of line.
void pn_writeLogLine(int priority, const char* tag, const char* text);
