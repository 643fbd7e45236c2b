"""native.py LIBRARY PIXELS WIDTH HEIGHT FILTER PARAMETERS RUNS: the median processor time in ms that the C
library takes to apply a filter once more."""

import ctypes
import statistics
import sys
import time

library, path, width, height, name, parameters, runs = sys.argv[1:]
width, height = int(width), int(height)
quenby = ctypes.CDLL(library)


class Pixels(ctypes.Structure):
    _fields_ = [("rgba", ctypes.c_void_p), ("width", ctypes.c_uint32), ("height", ctypes.c_uint32),
                ("stride", ctypes.c_size_t)]


class Error(ctypes.Structure):
    _fields_ = [("kind", ctypes.c_int32), ("message", ctypes.c_char * 508)]


data = open(path, "rb").read()
buffer = ctypes.create_string_buffer(data, len(data))
out = ctypes.create_string_buffer(len(data))
pixels = Pixels(ctypes.addressof(buffer), width, height, 4 * width)
session, error = ctypes.c_void_p(), Error()


def check(code):
    if code != 0:
        sys.exit(error.message.decode())


check(quenby.quenby_session_open(ctypes.byref(pixels), None, ctypes.c_size_t(0), 0, ctypes.byref(session),
                                 ctypes.byref(error)))


def apply():
    start = time.process_time()
    check(quenby.quenby_session_apply(session, name.encode(), parameters.encode(), out,
                                      ctypes.c_size_t(4 * width), None, ctypes.byref(error)))
    return 1000 * (time.process_time() - start)


for _ in range(3):
    apply()
print(statistics.median(apply() for _ in range(int(runs))))
