#ifndef MCOBNQRT_EFBINALGORITHM_H
#define MCOBNQRT_EFBINALGORITHM_H

#include "binning/binningdriver.h"

#include <mcobnqrt/efbinoutput.h>
#include <mcobnqrt/efbinsettings.h>
#include <mcobnqrt/iefbinalgorithm.h>

#include <iosfwd>
#include <vector>

/// The driver of equal-frequency runs: has the records read once, takes each attribute in turn, has it cut, and stores
/// what was found.
class EFBINAlgorithm : public BinningDriver<IEFBINAlgorithm, EFBINSettings, EFBINOutput>
{
public:
    EFBINAlgorithm(const EFBINSettings& settings, const BINVarList& varList, Platform* platform = SystemPlatform());
    ~EFBINAlgorithm() override;

    MCBinning::MCStatus Run(IBINRecordSource* source, const std::vector<int>* attributes) override;
    void Display(std::ostream& os) override;

private:
    bool CheckAttributeList(const std::vector<int>& attributes);
    MCBinning::MCStatus CheckAttribute(int attribute) const;
    MCBinning::MCStatus BinAllAttributes(const std::vector<int>* attributes);
    MCBinning::MCStatus BinAttribute(int attribute);

    std::vector<MCBinning::MCStatus> fAttributeStatus; ///< a verdict for each entry of the last list
    std::vector<BINValueTuple>* fTuples = nullptr;     ///< the reader's, for the current attribute
};

#endif
