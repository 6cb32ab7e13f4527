#include <mcobnqrt/binprogressreporter.h>

void BINProgressReporter::SetValues(unsigned int index, double elapsed)
{
    fIndexVar = index;
    fElapsedTime = elapsed;
}

int BINProgressReporter::DiscreteMeasure(const std::string& name)
{
    return name == "IndexVar" ? static_cast<int>(fIndexVar) : -1;
}

double BINProgressReporter::ScaleMeasure(const std::string& name)
{
    return name == "elapsedTime" ? fElapsedTime : MCMV::gMissingValue;
}
