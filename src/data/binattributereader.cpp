#include "data/binattributereader.h"

#include "base/exactsums.h"
#include "base/makestatus.h"
#include "data/bindatapreparator.h"
#include "data/tally.h"
#include "data/tuplesort.h"

#include <mcobnqrt/binvarlist.h>

#include <algorithm>

using MCBinning::BinaryRecordIterator;
using MCBinning::MCStatus;
using MCMV::gMissingValue;

namespace
{

/// Null if the memory doesn't suffice.
template<class Tuple>
std::unique_ptr<std::vector<Tuple>> MakeTuples(unsigned int count)
{
    try
    {
        return std::make_unique<std::vector<Tuple>>(count);
    }
    catch (...) // bad_alloc, length_error, or whatever the program's own operator new throws
    {
        return nullptr; // the caller's status says so
    }
}

template<class Tuple>
Tuple MakeTuple(double value, double code, double weight);

template<>
BINSortTuple MakeTuple(double value, double code, double weight)
{
    return {value, static_cast<std::uint8_t>(code), weight};
}

template<>
BINValueTuple MakeTuple(double value, double, double weight)
{
    return {value, weight};
}

} // namespace

BINAttributeReader::BINAttributeReader(IBINRecordSource* source, BINDataPreparator* preparator, TupleKind kind)
    : fRecordSource(source), fPreparator(preparator), fTupleKind(kind)
{
}

BINAttributeReader::~BINAttributeReader() = default;

void BINAttributeReader::SetNumDistinctValueThreshold(unsigned int threshold)
{
    if (threshold == 0)
        return;
    fUseThreshold = true;
    fNumDistinctValueThreshold = threshold;
}

MCStatus BINAttributeReader::ReadRecords()
{
    const MCStatus status = fPreparator->PrepareData(fRecordSource);
    if (status.IsError())
        return status;
    const BINVarList& list = *fPreparator->GetVarList();
    fWeightPosition = fPreparator->GetLayout().PositionOf(list.GetWeightIndex());
    fHasWeight = fWeightPosition >= 0;
    fHasTarget = fTupleKind == TupleKind::kWithTarget;
    fNumRecords = fPreparator->GetNumRecords();
    fFileNames = fPreparator->GetFileNames();

    if (fHasTarget)
        fTargetTuples = MakeTuples<BINSortTuple>(fNumRecords);
    else
        fValueTuples = MakeTuples<BINValueTuple>(fNumRecords);
    if (fTargetTuples == nullptr && fValueTuples == nullptr)
        return MakeError(MCBinning::BINStatusOutOfMemory);

    if (fHasTarget && list.GetTargetIndex() >= 0)
        fTargetIterator = OpenPosition(fTargetPosition);
    if (fHasWeight)
        fWeightIterator = OpenPosition(fWeightPosition);
    return status; // a file that didn't open is tried again at each read, and fails that read alone
}

MCStatus BINAttributeReader::IsVariableUsable(int variable, bool* usable) const
{
    if (variable < 0)
        return MakeError(MCBinning::BINStatusTargetUnusable);
    return fPreparator->IsVariableUsable(fPreparator->GetLayout().PositionOf(variable), usable);
}

MCStatus BINAttributeReader::GetAttributeTargetData(int attribute, int target, std::vector<BINSortTuple>** tuples)
{
    *tuples = nullptr;
    if (fTargetTuples == nullptr)
        return MakeError(MCBinning::BINStatusNoRecords);
    bool isUsable = false;
    if (IsVariableUsable(target, &isUsable).IsError() || !isUsable)
        return MakeError(MCBinning::BINStatusTargetUnusable);

    const int targetPosition = fPreparator->GetLayout().PositionOf(target);
    fNumTargetCats =
        static_cast<unsigned int>(fPreparator->GetMaxCodes()[static_cast<std::size_t>(targetPosition)]) + 1;
    if (!PutOn(targetPosition, fTargetIterator, fTargetPosition))
        return MakeError(MCBinning::BINStatusCannotOpenTempFile);
    const MCStatus status = LoadVariable(attribute);
    if (status.IsError())
        return status;
    SortAndMeasure(*fTargetTuples);
    fUseEFAsPreprocess = fUseThreshold && fNumDistinct > fNumDistinctValueThreshold;
    *tuples = fTargetTuples.get();
    return status;
}

MCStatus BINAttributeReader::GetAttributeData(int attribute, std::vector<BINValueTuple>** tuples)
{
    *tuples = nullptr;
    if (fValueTuples == nullptr)
        return MakeError(MCBinning::BINStatusNoRecords);
    const MCStatus status = LoadVariable(attribute);
    if (status.IsError())
        return status;
    SortAndMeasure(*fValueTuples);
    *tuples = fValueTuples.get();
    return status;
}

MCStatus BINAttributeReader::TallyBins(const std::vector<double>* cuts, bool rightBorderClosed,
                                       std::vector<double>& table) const
{
    if (cuts == nullptr)
        return MakeWarning(MCBinning::BINStatusBadBinTable);
    return ::TallyBins(*fTargetTuples, fNumTuples, fNumTargetCats, *cuts, rightBorderClosed, table);
}

std::unique_ptr<BinaryRecordIterator> BINAttributeReader::OpenPosition(int position) const
{
    const auto index = static_cast<std::size_t>(position);
    return std::make_unique<Iterator>(fFileNames[index], fPreparator->GetPlatform(),
                                      &fPreparator->GetSpoolFiles()[index].fIdentity);
}

/// Puts an iterator on the file of `position`. False if that can't be opened, and then all is as it was.
bool BINAttributeReader::PutOn(int position, std::unique_ptr<Iterator>& iterator, int& iteratorPosition) const
{
    if (iterator != nullptr && iterator->HasFile() && iteratorPosition == position)
        return true;
    std::unique_ptr<Iterator> opened = OpenPosition(position);
    if (!opened->HasFile())
        return false;
    iterator = std::move(opened);
    iteratorPosition = position;
    return true;
}

MCStatus BINAttributeReader::LoadVariable(int attribute)
{
    const int position = fPreparator->GetLayout().PositionOf(attribute);
    if (position < 0)
        return MakeError(MCBinning::BINStatusIndexOutOfRange);
    if (fPreparator->IsCutShort(position))
        return AboutIndex(MakeError(MCBinning::BINStatusTooManyCategories), attribute);
    return LoadAttribute(position);
}

/// Makes the tuples of one position. The k-th values of all files belong to one record.
MCStatus BINAttributeReader::LoadAttribute(int position)
{
    fNumTuples = 0;
    fNumDistinct = 0;
    fTotalWeight = 0.0;
    fTotalWeightWithMissing = 0.0;
    if (fHasWeight && !PutOn(fWeightPosition, fWeightIterator, fWeightPosition))
        return MakeError(MCBinning::BINStatusCannotOpenTempFile);
    if (fHasWeight)
        fWeightIterator->Rewind();
    if (fHasTarget)
        fTargetIterator->Rewind();
    const std::unique_ptr<Iterator> attribute = OpenPosition(position);

    for (std::size_t numLeft = fNumRecords; numLeft > 0;)
    {
        if (!HasNextInAll(*attribute))
            return MakeError(MCBinning::BINStatusCannotOpenTempFile);
        const std::size_t count = std::min(numLeft, CommonBlockSize(*attribute));
        const bool isAdded = fHasTarget ? AddTuples(*fTargetTuples, attribute->GetBlock(), count)
                                        : AddTuples(*fValueTuples, attribute->GetBlock(), count);
        if (!isAdded)
            return MakeError(MCBinning::BINStatusCannotOpenTempFile);
        attribute->Skip(count);
        if (fHasTarget)
            fTargetIterator->Skip(count);
        if (fHasWeight)
            fWeightIterator->Skip(count);
        numLeft -= count;
    }
    return MCStatus();
}

bool BINAttributeReader::HasNextInAll(const Iterator& attribute) const
{
    return attribute.IsOK() && (!fHasTarget || fTargetIterator->IsOK()) && (!fHasWeight || fWeightIterator->IsOK());
}

/// How many records can be joined from what is read ahead of their files.
std::size_t BINAttributeReader::CommonBlockSize(const Iterator& attribute) const
{
    std::size_t size = attribute.GetBlockSize();
    if (fHasTarget)
        size = std::min(size, fTargetIterator->GetBlockSize());
    if (fHasWeight)
        size = std::min(size, fWeightIterator->GetBlockSize());
    return size;
}

/// Joins the next `count` records, whose values of the attribute are given. Each sum is in the order of the records.
/// False if the target's file holds a code that the pass can't have written: somebody else has.
template<class Tuple>
bool BINAttributeReader::AddTuples(std::vector<Tuple>& tuples, const double* values, std::size_t count)
{
    const double* const targets = fHasTarget ? fTargetIterator->GetBlock() : nullptr;
    const double* const weights = fHasWeight ? fWeightIterator->GetBlock() : nullptr;
    // The sums are local variables: as members they would be reloaded after each tuple stored, which might alias them.
    unsigned int numTuples = fNumTuples;
    double total = fTotalWeight;
    double totalWithMissing = fTotalWeightWithMissing;
    for (std::size_t i = 0; i < count; ++i)
    {
        const double weight = weights != nullptr ? weights[i] : 1.0;
        if (weight == gMissingValue)
            continue;
        totalWithMissing += weight;
        const double code = targets != nullptr ? targets[i] : 0.0;
        if (code == gMissingValue || values[i] == gMissingValue)
            continue;
        if (targets != nullptr && !(code > -1.0 && code < fNumTargetCats))
            return false;
        total += weight;
        tuples[numTuples++] = MakeTuple<Tuple>(values[i], code, weight);
    }
    fNumTuples = numTuples;
    fTotalWeight = total;
    fTotalWeightWithMissing = totalWithMissing;
    return true;
}

/// Whether every sum of weights of the current tuples is exact, whatever its order.
template<class Tuple>
bool BINAttributeReader::AreSumsExact(const std::vector<Tuple>& tuples) const
{
    ExactSums sums(fTotalWeight);
    for (unsigned int i = 0; i < fNumTuples; ++i) sums.Add(tuples[i].fWeight);
    return sums.AreExact();
}

/// Sorts the current tuples and works out the figures that hang on their order.
template<class Tuple>
void BINAttributeReader::SortAndMeasure(std::vector<Tuple>& tuples)
{
    SortTuples(tuples, fNumTuples, !fHasWeight || AreSumsExact(tuples) ? TieOrder::kAny : TieOrder::kComplete);
    fMinValue = fMaxValue = gMissingValue;
    fNumDistinct = 0;
    if (fNumTuples == 0)
        return;
    fNumDistinct = 1;
    for (unsigned int i = 1; i < fNumTuples; ++i)
    {
        if (tuples[i].fValue != tuples[i - 1].fValue)
            ++fNumDistinct;
    }
    fMinValue = tuples[0].fValue;
    fMaxValue = tuples[fNumTuples - 1].fValue;
}
