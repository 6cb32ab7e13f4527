#include "bench/measure.h"

#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <ctime>
#include <fstream>
#include <string>

#include <linux/perf_event.h>
#include <malloc.h>
#include <sys/ioctl.h>
#include <sys/syscall.h>
#include <unistd.h>

namespace
{

/// A field of the kernel's account of this process, in KiB.
long ProcessMemory(const char* field)
{
    std::ifstream status("/proc/self/status");
    std::string line;
    while (std::getline(status, line))
    {
        if (line.rfind(field, 0) == 0)
            return std::atol(line.c_str() + std::strlen(field));
    }
    return 0;
}

/// The descriptor of a stopped counter, -1 without one.
int OpenInstructionCounter()
{
    perf_event_attr wanted{};
    wanted.type = PERF_TYPE_HARDWARE;
    wanted.size = sizeof(wanted);
    wanted.config = PERF_COUNT_HW_INSTRUCTIONS;
    wanted.disabled = 1;
    wanted.exclude_kernel = 1;
    wanted.exclude_hv = 1;
    constexpr int kThisProcess = 0;
    constexpr int kAnyProcessor = -1;
    constexpr int kNoGroup = -1;
    return static_cast<int>(syscall(SYS_perf_event_open, &wanted, kThisProcess, kAnyProcessor, kNoGroup, 0UL));
}

} // namespace

double Seconds(const std::function<void()>& work)
{
    const std::clock_t start = std::clock();
    work();
    return static_cast<double>(std::clock() - start) / CLOCKS_PER_SEC;
}

double PeakMemory(const std::function<void()>& work)
{
    malloc_trim(0);
    std::ofstream("/proc/self/clear_refs") << "5"; // sets the peak back to the present
    const long before = ProcessMemory("VmRSS:");
    work();
    return static_cast<double>(ProcessMemory("VmHWM:") - before) / 1024.0;
}

std::optional<double> Instructions(const std::function<void()>& work)
{
    const int counter = OpenInstructionCounter();
    if (counter < 0)
        return std::nullopt;
    ioctl(counter, PERF_EVENT_IOC_ENABLE, 0);
    work();
    ioctl(counter, PERF_EVENT_IOC_DISABLE, 0);
    std::uint64_t count = 0;
    const bool isRead = read(counter, &count, sizeof(count)) == sizeof(count);
    close(counter);
    return isRead ? std::optional<double>(static_cast<double>(count)) : std::nullopt;
}

double Median(std::vector<double> values)
{
    const auto middle = values.begin() + static_cast<std::ptrdiff_t>(values.size() / 2);
    std::nth_element(values.begin(), middle, values.end());
    return *middle;
}
