#ifndef MCOBNQRT_BINSETTINGS_H
#define MCOBNQRT_BINSETTINGS_H

#include <mcobnqrt/export.h>

#include <iosfwd>
#include <string>

class MCQueryCancel;
class ProgressListener;

/// Configures supervised binning. The host fills one and hands it to a BINFactory; the algorithm works on a copy, which
/// IBINAlgorithm's GetSettings gives access to. Only the number of bins has to be set: its default is refused by Run.
///
/// A setter that returns a bool refuses a bad value with false and leaves the setting as it was. What is said to be
/// read with the records is read by the Run that reads them, and a later change through GetSettings does nothing.
class MCOBNQRT_EXPORT BINSettings
{
public:
    BINSettings();

    /// Whether the reports to skip, the closed border, the distinct value threshold and the number of bins are equal.
    /// The host's pointers, the temporary directory and the small-bin threshold take no part.
    bool operator==(const BINSettings& other) const;

    /// Who is told of the progress; stays the host's and must outlive the algorithm. Default null: nobody. The reading
    /// of the records reports to the listener set when it begins, each attribute loop to the one set at its own
    /// beginning.
    void SetProgressListener(ProgressListener* listener) { fProgressListener = listener; }
    ProgressListener* GetProgressListener() const { return fProgressListener; }

    /// How many attributes go by between two reports. Default 0: a report after each. Refuses what is below 0.
    bool SetNSkippedAttReports(int value);
    int GetNSkippedAttReports() const { return fNSkippedAttReports; }

    /// After how many records each report comes while they are read; 0 means never. Default 100000. Refuses what is
    /// below 0. Read with the records.
    bool SetNSkippedCasesReports(int value);
    int GetNSkippedCasesReports() const { return fNSkippedCasesReports; }

    /// Who is asked whether to stop; stays the host's and must outlive the algorithm. Default null: nobody. Read when
    /// the algorithm is made; afterwards its own SetCancelPointer replaces the query.
    void SetCancelPointer(MCQueryCancel* query) { fCancelPointer = query; }
    MCQueryCancel* GetCancelPointer() const { return fCancelPointer; }

    /// With true, the default, a bin holds its right border, (left, right]; with false its left one, [left, right).
    /// Read with the records.
    void SetRightBorderClosed(bool closed) { fRightBorderClosed = closed; }
    bool IsRightBorderClosed() const { return fRightBorderClosed; }

    /// An attribute with more distinct values than this is pre-binned: GetNumberOfBins() equal-frequency bins, not its
    /// values, are what the search for cut points starts from. 0 means never, and so does the default of -1, which
    /// can't be set again. Refuses what is below 0. Read with the records.
    bool SetNumDistinctValueThreshold(int value);
    int GetNumDistinctValueThreshold() const { return fNumDistinctValueThreshold; }

    /// The number of bins that pre-binning aims at. Refuses what is below 2. The default of -1 stands for not set, and
    /// Run refuses it whether or not it would pre-bin. Read by each Run.
    bool SetNumberOfBins(int value);
    int GetNumberOfBins() const { return fNumberOfBins; }

    /// Where the temporary files go; any name is taken, and Run finds out whether files can be made there. Default:
    /// what TMPDIR of the environment names, if that is a directory that files can be made in, without trailing
    /// separator; else /tmp, if that is one; else "./". Read with the records.
    void SetTempDirName(const std::string& name) { fTempDirName = name; }
    std::string GetTempDirName() const { return fTempDirName; }

    /// An inner bin whose weight is below this share of its lighter neighbour's is merged into one of the two. From
    /// 0.0, the default, with which there is no such bin, to 1.0, both included; refuses everything else, a NaN too.
    /// Read for each attribute.
    bool SetSmallBinDetectionThreshold(double value);
    double GetSmallBinDetectionThreshold() const { return fSmallBinDetectionThreshold; }

    /// Dumps what operator== compares, for a programmer's eye.
    void Display(std::ostream& os) const;

private:
    ProgressListener* fProgressListener = nullptr; ///< the host's
    int fNSkippedAttReports = 0;
    int fNSkippedCasesReports;
    MCQueryCancel* fCancelPointer = nullptr; ///< the host's
    bool fRightBorderClosed = true;
    int fNumDistinctValueThreshold = -1; ///< -1 never set: as an unsigned number, above every count of values
    int fNumberOfBins = -1;              ///< -1 never set
    std::string fTempDirName;
    double fSmallBinDetectionThreshold = 0.0;
};

#endif
