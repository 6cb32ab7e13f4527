#include <mcobnqrt/binattributetargetresults.h>

#include "results/resultparts.h"

void BINAttributeTargetResults::Display(std::ostream& os) const
{
    DisplayHead(os, "BINAttributeTargetResults", *this);
    os << "target = " << fTargetIndex << std::endl;
    DisplayFigures(os, *this);
    os << "Model Entropy = " << fModelEntropy << std::endl;
    DisplayCutPoints(os, *this);
    for (const std::vector<double>& row : fCellCounts) DisplayCounts(os, row);
    os << std::endl;
    os << "End of BINAttributeTargetResults display" << std::endl;
}
