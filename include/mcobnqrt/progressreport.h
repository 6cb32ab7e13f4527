#ifndef MCOBNQRT_PROGRESSREPORT_H
#define MCOBNQRT_PROGRESSREPORT_H

#include <mcobnqrt/export.h>

#include <string>

/// The figures that a ProgressListener is handed, each under a name. The concrete class tells which names there are and
/// what an unknown name gives; the library's reports are of the class BINProgressReporter.
class MCOBNQRT_EXPORT ProgressReport
{
public:
    virtual ~ProgressReport() = default;

    /// The whole-numbered figure of that name.
    virtual int DiscreteMeasure(const std::string& name) = 0;

    /// The figure of that name.
    virtual double ScaleMeasure(const std::string& name) = 0;
};

#endif
