#ifndef MCOBNQRT_BENCH_MEASURE_H
#define MCOBNQRT_BENCH_MEASURE_H

#include <functional>
#include <optional>
#include <vector>

// What a piece of work costs this process. Linux alone tells all of it.

/// Processor time, of the program and of the system on its behalf. Other programs on the machine can slow it down
/// through the caches, but what they take of the processor doesn't count.
double Seconds(const std::function<void()>& work);

/// How far the memory of the process rises above where it stands, in MiB.
double PeakMemory(const std::function<void()>& work);

/// Instructions of the program itself, by the processor's own counter. Nothing where that can't be had, as on many
/// virtual machines.
std::optional<double> Instructions(const std::function<void()>& work);

/// The upper one of the two in the middle, if they are even in number.
double Median(std::vector<double> values);

#endif
