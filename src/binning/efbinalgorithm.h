#ifndef MCOBNQRT_EFBINALGORITHM_H
#define MCOBNQRT_EFBINALGORITHM_H

#include "binning/binningdriver.h"

#include <mcobnqrt/efbinoutput.h>
#include <mcobnqrt/efbinsettings.h>
#include <mcobnqrt/iefbinalgorithm.h>

#include <iosfwd>
#include <vector>

class BINEFPreProcess;

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
    /// What a call of Run is to treat.
    struct Entry
    {
        int fAttribute;
        MCBinning::MCStatus fVerdict; ///< OK, or why the attribute can't be binned
    };

    std::vector<Entry> ListAll() const;
    std::vector<Entry> CheckAttributeList(const std::vector<int>& attributes) const;
    MCBinning::MCStatus CheckAttribute(int attribute) const;
    MCBinning::MCStatus BinAllEntries(const std::vector<Entry>& entries, int numberOfBins);
    MCBinning::MCStatus BinAttribute(int attribute, const BINEFPreProcess& preProcess);
};

#endif
