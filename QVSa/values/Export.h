#pragma once

// What a program outside the shared library may use: all else is hidden in there.
#if defined(__GNUC__)
#define QVSA_EXPORT __attribute__((visibility("default")))
#else
#define QVSA_EXPORT
#endif
