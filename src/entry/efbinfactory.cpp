#include <mcobnqrt/efbinfactory.h>

#include "binning/efbinalgorithm.h"
#include "entry/createalgorithm.h"

using MCBinning::MCStatus;

EFBINFactory::EFBINFactory() = default;

EFBINFactory::EFBINFactory(const EFBINFactory& other) : fStatus(other.fStatus) {}

EFBINFactory& EFBINFactory::operator=(const EFBINFactory& other)
{
    fStatus = other.fStatus;
    return *this;
}

EFBINFactory::~EFBINFactory() = default;

IEFBINAlgorithm* EFBINFactory::CreateEFBINAlgorithm(EFBINSettings& settings, BINVarList& varList)
{
    return CreateAlgorithm<EFBINAlgorithm>(settings, varList, fStatus, fAlgorithm);
}

MCStatus EFBINFactory::GetStatus() const
{
    return fStatus;
}
