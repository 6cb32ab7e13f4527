#include "metadata/categorycodes.h"

#include <mcobnqrt/ibinusermissing.h>

#include <cstddef>
#include <ostream>
#include <utility>

void ReplaceLabels(std::vector<std::string>& labels, const std::vector<std::string>& replacement)
{
    // An assignment that runs out of memory would leave a mixture of old and new labels.
    std::vector<std::string> copy(replacement);
    labels.swap(copy);
}

void StoreLabel(std::vector<std::string>& labels, int numberOfCategories, int code, const std::string& label)
{
    // Copied before anything grows: `label` may be one of the labels, and the copying may fail.
    std::string copy(label);
    if (labels.size() < static_cast<std::size_t>(numberOfCategories))
        labels.resize(static_cast<std::size_t>(numberOfCategories));
    if (code >= 0 && code < numberOfCategories)
        labels[static_cast<std::size_t>(code)] = std::move(copy);
}

void DisplayUserMissingOfEncoder(std::ostream& os, const IBINUserMissing* userMissing)
{
    if (!userMissing)
        return;
    os << "\t\tUser-missing values for this encoder:\n\t\t";
    userMissing->Display(os);
}
