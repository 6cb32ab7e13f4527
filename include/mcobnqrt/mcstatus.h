#ifndef MCOBNQRT_MCSTATUS_H
#define MCOBNQRT_MCSTATUS_H

#include <mcobnqrt/export.h>

#include <array>
#include <cstdint>

namespace MCBinning
{

/// The codes of an MCStatus. The library has no words for them: they are the host's to say, in its user's language. An
/// OK status has the code 0. A code stands for an error and leaves the data slots at zero, unless its comment says
/// otherwise.
///
/// A code *of a result* reaches the host with the entry of an attribute or pair in the output store; the other codes
/// come from Run or a factory, unless a store is named.
enum BINStatusCode : int
{
    /// The host cancelled. The results found before that are there and good. From Run, unless the cancel came ahead of
    /// the first record: then BINStatusNoRecords.
    BINStatusCancelled = 1,
    /// No memory for the algorithm, its record buffer or its table of values, or more than 4294967295 records with a
    /// weight above 0.
    BINStatusOutOfMemory = 3,
    /// The temporary directory doesn't exist, or no file can be made in it.
    BINStatusTempDirNotFound = 120001,
    /// Of a result: the values don't fit the rows made for them, and there are no cut points. A warning where the rows
    /// are filled: with the left border closed, a value of 1.7976931348623157e308 does that.
    BINStatusBadBinTable = 120002,
    /// The variable list can't be worked with. Discrete slot 1: the index of a variable without categories; else of one
    /// with a single category; else of one without a part in the analysis; else -1: no variable at all, or no
    /// attribute.
    BINStatusInvalidVarList = 120003,
    /// There is no source, or it has no record, or none whose weight is above 0, or none ahead of a cancel.
    BINStatusNoRecords = 120004,
    /// Of a result: a variable can't play the part it was listed for, being the weight, the target, or both of a pair.
    BINStatusRoleConflict = 120005,
    /// Of a result: the listed target is not categorical.
    BINStatusTargetNotCategorical = 120006,
    /// The lists are of different lengths, empty, without attributes, or hold no pair that can be binned.
    BINStatusNoValidPairs = 120008,
    /// The number of bins in the settings is not above 0: nobody has set it.
    BINStatusBadNumberOfBins = 120009,
    /// The list has no target, or the target's codes are not usable. Also of a result.
    BINStatusTargetUnusable = 120010,
    /// Of a result: no variable has the attribute's index. From an equal-frequency Run: no entry of its list can be
    /// binned.
    BINStatusBadAttributeIndex = 120011,
    /// A categorical variable has a code that is neither missing nor from 0 to 255. From Run it is the target, being
    /// the only categorical variable, and of a result it is the attribute. Discrete slot 0: the variable's index.
    BINStatusTooManyCategories = 120012,
    /// Of a result: an index of the pair names no variable. From an output store: an impossible index, or no such
    /// result.
    BINStatusIndexOutOfRange = 120013,
    /// Of a result, warning: all valid values of the attribute are equal. Discrete slot 0: the attribute's index. It
    /// hides the codes that say that there is no cut point.
    BINStatusSingleValueAttribute = 120014,
    /// Of a result, warning: no record has a valid value of the attribute, and of the target if there is one.
    BINStatusNoValidValues = 120015,
    /// Of a result, warning: the data hold a single category of the target. Discrete slot 0: the target's index. It
    /// hides BINStatusSingleValueAttribute, and what that one hides.
    BINStatusSingleCategoryTarget = 120016,
    /// Of a result, warning: no cut separates the target's categories well enough; the result is one bin.
    BINStatusNoCutPoints = 120017,
    /// Warning: the run is done, and the result of an attribute or pair that this or an earlier run has treated carries
    /// a status of its own, to be read there. Entries of a list that were refused for their indices or roles don't
    /// count.
    BINStatusSomeResultsFlagged = 120018,
    /// Of a result, warning: no equal-frequency cut point; the result is one bin. Discrete slot 0: the attribute's
    /// index.
    BINStatusNoEFCutPoints = 120019,
    /// From an output store: it holds no result at all.
    BINStatusNoResults = 120020,
    /// A temporary file can't be opened, written or read: a full disk, too many open files, a file that is gone. Also
    /// of a result.
    BINStatusCannotOpenTempFile = 120021
};

/// The value in which every outcome travels: a code, a severity (OK, warning or error) and data slots that tell a host
/// which variable is meant. Three slots hold whole numbers and three hold doubles; BINStatusCode tells which are used.
///
/// An error means that what was asked for isn't there; a warning, that it is, with something to be said about it. The
/// severity doesn't follow from the code.
class MCOBNQRT_EXPORT MCStatus
{
public:
    /// OK: code 0, all slots zero.
    MCStatus() = default;

    /// A warning or, with `isWarning` false, an error; all slots zero. Codes are numbers of 32 bits.
    MCStatus(long code, bool isWarning);

    /// Whether code, severity and all slots are equal. A NaN in a slot equals nothing, and so its status not even
    /// itself.
    bool operator==(const MCStatus& other) const;

    long GetErrorCode() const { return fErrorCode; }
    bool IsOK() const { return fSeverity == 0; }
    bool IsError() const { return fSeverity < 0; }
    bool IsWarning() const { return fSeverity > 0; }

    /// The slots go from 0 to 2. A slot that doesn't exist reads as 0, and writing it does nothing.
    long GetDiscreteDatum(unsigned int index) const;
    double GetScaleDatum(unsigned int index) const;
    /// Takes numbers of 32 bits.
    void SetDiscreteDatum(unsigned int index, long value);
    void SetScaleDatum(unsigned int index, double value);

private:
    std::int32_t fErrorCode = 0;
    std::int16_t fSeverity = 0; ///< 0 OK, 1 warning, -1 error; from the construction on
    std::array<std::int32_t, 3> fDiscreteData{};
    std::array<double, 3> fScaleData{};
};

} // namespace MCBinning

#endif
