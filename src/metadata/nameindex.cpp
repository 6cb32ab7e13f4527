#include "metadata/nameindex.h"

#include "base/growth.h"

#include <mcobnqrt/binvariable.h>

#include <algorithm>
#include <limits>
#include <utility>

BINVarList::NameIndex::NameIndex(const std::vector<std::unique_ptr<IBINVariable>>& variables)
{
    for (const auto& variable : variables) Append(*variable);
}

int BINVarList::NameIndex::Find(const std::string& name) const
{
    const auto [begin, end] = fNameOfText.equal_range(name);
    if (begin == end)
        return -1;
    std::uint64_t number = std::numeric_limits<std::uint64_t>::max(); // a weight may bear the name, too
    for (auto found = begin; found != end; ++found) number = std::min(number, found->second->fNumber);
    const auto found =
        std::lower_bound(fNames.begin(), fNames.end(), number,
                         [](const auto& candidate, std::uint64_t wanted) { return candidate->fNumber < wanted; });
    return static_cast<int>(found - fNames.begin());
}

void BINVarList::NameIndex::Append(IBINVariable& variable)
{
    auto made = std::make_unique<const Name>(Name{variable.GetVariableName(), fNextNumber});
    ReserveOneMore(fNames);
    fNameOfText.emplace(made->fText, made.get()); // the last step that can fail
    fNames.push_back(std::move(made));
    ++fNextNumber;
    static_cast<BINVariable&>(variable).WatchName(fIsRenamed); // a list makes no other variables
}

void BINVarList::NameIndex::Remove(int index)
{
    const auto name = fNames.begin() + index;
    const auto [begin, end] = fNameOfText.equal_range((*name)->fText);
    fNameOfText.erase(
        std::find_if(begin, end, [&name](const auto& candidate) { return candidate.second == name->get(); }));
    fNames.erase(name);
}
