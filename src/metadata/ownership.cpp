#include "metadata/ownership.h"

bool AdoptUserMissing(std::unique_ptr<IBINUserMissing>& held, IBINUserMissing* object, IBINUserMissing::DataType type)
{
    if (object && object->GetDataType() != type)
        return false;
    // The object already held comes back here when a host sets what it has got from GetUserMissingInfo: reset would
    // delete it and keep the pointer.
    if (object != held.get())
        held.reset(object);
    return true;
}
