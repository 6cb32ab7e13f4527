#ifndef MCOBNQRT_PROGRESSREPORT_H
#define MCOBNQRT_PROGRESSREPORT_H

#include <mcobnqrt/export.h>

#include <string>

/// What a ProgressListener is handed: figures that are asked for by name. Which names there are, and what an unknown
/// name gives, is told by the class behind it; the library's reports are of the class BINProgressReporter.
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
