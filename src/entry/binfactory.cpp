#include <mcobnqrt/binfactory.h>

#include "binning/binalgorithm.h"
#include "entry/createalgorithm.h"

using MCBinning::MCStatus;

BINFactory::BINFactory() = default;

BINFactory::BINFactory(const BINFactory& other) : fStatus(other.fStatus) {}

BINFactory& BINFactory::operator=(const BINFactory& other)
{
    fStatus = other.fStatus;
    return *this;
}

BINFactory::~BINFactory() = default;

IBINAlgorithm* BINFactory::CreateBINAlgorithm(BINSettings& settings, BINVarList& varList)
{
    return CreateAlgorithm<BINAlgorithm>(settings, varList, fStatus, fAlgorithm);
}

MCStatus BINFactory::GetStatus() const
{
    return fStatus;
}
