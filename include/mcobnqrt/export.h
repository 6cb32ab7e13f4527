#ifndef MCOBNQRT_EXPORT_H
#define MCOBNQRT_EXPORT_H

/// Marks the classes that a host sees. The library is built with hidden visibility: what does not bear this mark is not
/// part of its interface and can't be linked against.
#define MCOBNQRT_EXPORT __attribute__((visibility("default")))

#endif
