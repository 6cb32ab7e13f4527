#ifndef MCOBNQRT_OWNERSHIP_H
#define MCOBNQRT_OWNERSHIP_H

#include <mcobnqrt/ibinusermissing.h>

#include <memory>

/// A deep copy of what `held` holds, null if it holds nothing.
template<class Interface>
std::unique_ptr<Interface> CloneOf(const std::unique_ptr<Interface>& held)
{
    return std::unique_ptr<Interface>(held ? held->Clone() : nullptr);
}

/// What SetUserMissingInfo does with an object that is to be owned: replaces `held` by `object`, which may be null.
/// False, with nothing changed and the object left to the caller, if it is of another data type.
bool AdoptUserMissing(std::unique_ptr<IBINUserMissing>& held, IBINUserMissing* object, IBINUserMissing::DataType type);

#endif
