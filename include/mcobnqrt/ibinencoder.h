#ifndef MCOBNQRT_IBINENCODER_H
#define MCOBNQRT_IBINENCODER_H

#include <mcobnqrt/export.h>

#include <iosfwd>
#include <string>
#include <vector>

class IBINUserMissing;

/// Turns a raw value of a variable into the number that stands for it.
///
/// A category becomes a code: 0, 1, 2, ... in the order in which the values are first seen, in a double; -1.0 stands
/// for a missing category. The host encodes its categories and puts the codes into its records. A weight, which goes
/// into the record as it is, is rounded when the records are read.
///
/// Encode, EncodeConst and Decode stand on the concrete classes: GetEncoderType tells which class it is.
class MCOBNQRT_EXPORT IBINEncoder
{
public:
    /// The numbers are those of the measure levels that the encoders belong to.
    enum EncoderType : int
    {
        EncoderTypeCatNum = 2, ///< BINCatNumEncoder
        EncoderTypeString = 3, ///< BINStringEncoder
        EncoderTypeRound = 4   ///< BINRoundEncoder
    };

    IBINEncoder() = default;
    IBINEncoder(const IBINEncoder&) = default;
    IBINEncoder& operator=(const IBINEncoder&) = default;
    virtual ~IBINEncoder() = default;

    virtual EncoderType GetEncoderType() const = 0;

    /// How many categories have been seen so far; 0 where there are none by nature.
    virtual int GetNumberOfCategories() const = 0;

    /// Replaces all labels by `labels`, which are in the order of the codes. There may be more or fewer of them than
    /// there are categories.
    virtual void SetValueLabels(const std::vector<std::string>& labels) = 0;

    /// Sets the label of one code. Labels that are lacking up to the number of categories become empty ones first, also
    /// if no category has this code and nothing else happens.
    virtual void SetValueLabel(int code, const std::string& label) = 0;

    /// The labels in the order of the codes, perhaps too few or too many; null where there are none by nature.
    virtual const std::vector<std::string>* GetValueLabels() const = 0;

    /// Declares the values that count as missing; what was declared before is gone. Null declares that there are
    /// none. A value that has become a category already keeps its code, but is no longer given it.
    ///
    /// The categorical encoders own the object from now on; BINRoundEncoder only borrows it. To hand over the object
    /// that is held already changes nothing.
    ///
    /// \return false if the object is of the wrong data type: nothing has changed, and it stays the caller's.
    virtual bool SetUserMissingInfo(IBINUserMissing* userMissing) = 0;

    /// The declared values, or null. The object is the holder's.
    virtual IBINUserMissing* GetUserMissingInfo() const = 0;

    /// \return a new deep copy, which the caller owns.
    virtual IBINEncoder* Clone() const = 0;

    /// Writes the categories and the user-missing values, line by line, for the programmer's eye.
    virtual void Display(std::ostream& os) const = 0;
};

#endif
