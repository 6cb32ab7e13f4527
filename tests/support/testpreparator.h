#ifndef MCOBNQRT_TESTS_TESTPREPARATOR_H
#define MCOBNQRT_TESTS_TESTPREPARATOR_H

#include "base/bincancelmonitor.h"
#include "data/binaryrecorditerator.h"
#include "data/bindatapreparator.h"
#include "tests/support/faultyplatform.h"
#include "tests/support/hostdata.h"
#include "tests/support/tempdir.h"

#include <gtest/gtest.h>

#include <limits>
#include <string>
#include <vector>

/// What a file of doubles holds.
inline std::vector<double> ValuesOf(const std::string& path)
{
    std::vector<double> values;
    MCBinning::BinaryRecordIterator iterator(path);
    while (iterator.IsOK()) values.push_back(iterator.Next());
    return values;
}

/// A data preparator in a directory of its own.
class TestPreparator
{
public:
    explicit TestPreparator(const BINVarList& list, ProgressListener* listener = nullptr, int interval = 0,
                            MCQueryCancel* query = nullptr,
                            unsigned int maxNumRecords = std::numeric_limits<unsigned int>::max())
        : fList(list), fMonitor(query),
          fPreparator(&fList, &fMonitor, fDirectory.Path(), listener, interval, &fPlatform, maxNumRecords)
    {
    }

    /// What the temporary file of a position holds.
    std::vector<double> Values(int position) const
    {
        return ValuesOf(fPreparator.GetFileNames()[static_cast<std::size_t>(position)]);
    }

    bool IsUsable(int position) const
    {
        bool isUsable = false;
        EXPECT_TRUE(fPreparator.IsVariableUsable(position, &isUsable).IsOK());
        return isUsable;
    }

    BINDataPreparator* operator->() { return &fPreparator; }
    BINDataPreparator& operator*() { return fPreparator; }

    TempDir fDirectory;
    FaultyPlatform fPlatform;

private:
    BINVarList fList;
    BINCancelMonitor fMonitor;
    BINDataPreparator fPreparator;
};

#endif
