#ifndef MCOBNQRT_BINPROGRESSREPORTER_H
#define MCOBNQRT_BINPROGRESSREPORTER_H

#include <mcobnqrt/export.h>
#include <mcobnqrt/mccommon.h>
#include <mcobnqrt/progressreport.h>

#include <cstdint>
#include <string>

/// The report that the library hands to a ProgressListener. It knows two measures, by their exact names: the discrete
/// "IndexVar", a number of records or a variable index, and the scale "elapsedTime", seconds since the phase began.
class MCOBNQRT_EXPORT BINProgressReporter : public ProgressReport
{
public:
    /// A report of index 0 and no elapsed time.
    BINProgressReporter() = default;

    /// Sets both measures; `elapsed` is in seconds.
    void SetValues(unsigned int index, double elapsed);

    /// The index for "IndexVar", -1 for any other name.
    int DiscreteMeasure(const std::string& name) override;

    /// The elapsed time for "elapsedTime", gMissingValue for any other name.
    double ScaleMeasure(const std::string& name) override;

private:
    std::uint32_t fIndexVar = 0;
    double fElapsedTime = MCMV::gMissingValue;
};

#endif
