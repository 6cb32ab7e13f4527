#ifndef MCOBNQRT_NAMEINDEX_H
#define MCOBNQRT_NAMEINDEX_H

#include <mcobnqrt/binvarlist.h>

#include <cstdint>
#include <memory>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

/// Finds the variables of a list by their names without comparing each one.
///
/// It holds copies of the names, by variable index. Find() can be trusted as long as the index is up to date.
class BINVarList::NameIndex
{
public:
    explicit NameIndex(const std::vector<std::unique_ptr<IBINVariable>>& variables);

    /// False as soon as one of the variables has got another name.
    bool IsUpToDate() const { return !*fIsRenamed; }

    /// The first index of the name, or -1.
    int Find(const std::string& name) const;

    /// An exception leaves the object as it was.
    void Append(IBINVariable& variable);

    /// Every later index moves down by one.
    void Remove(int index);

private:
    struct Name
    {
        std::string fText;
        std::uint64_t fNumber; ///< rises with the index and stays when other names are removed
    };

    std::vector<std::unique_ptr<const Name>> fNames;                    ///< by index
    std::unordered_multimap<std::string_view, const Name*> fNameOfText; ///< the keys lie in the names
    std::uint64_t fNextNumber = 0;
    std::shared_ptr<bool> fIsRenamed = std::make_shared<bool>(false); ///< every variable of the index sets it
};

#endif
