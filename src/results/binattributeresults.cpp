#include <mcobnqrt/binattributeresults.h>

#include "results/resultparts.h"

void BINAttributeResults::Display(std::ostream& os) const
{
    DisplayHead(os, "BINAttributeResults", *this);
    DisplayFigures(os, *this);
    DisplayCutPoints(os, *this);
    DisplayCounts(os, fCellCounts);
    os << "End of BINAttributeResults display" << std::endl;
}
