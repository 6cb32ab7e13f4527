#ifndef MCOBNQRT_EFBINSETTINGS_H
#define MCOBNQRT_EFBINSETTINGS_H

#include <mcobnqrt/export.h>

#include <iosfwd>
#include <string>

class MCQueryCancel;
class ProgressListener;

/// Configures equal-frequency binning. The host fills one and hands it to an EFBINFactory; the algorithm works on a
/// copy, which IEFBINAlgorithm's GetSettings gives access to. Only the number of bins has to be set: its default is
/// refused by Run.
///
/// A setter that returns a bool refuses a bad value with false and leaves the setting as it was. What is said to be
/// read with the records is read by the Run that reads them, and a later change through GetSettings does nothing.
class MCOBNQRT_EXPORT EFBINSettings
{
public:
    EFBINSettings();

    /// Whether the reports to skip, the closed border and the number of bins are equal. The host's pointers and the
    /// temporary directory take no part.
    bool operator==(const EFBINSettings& other) const;

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

    /// The number of bins to aim at; equal values stay in one bin, so there can be fewer. Refuses what is below 2. The
    /// default of -1 stands for not set, and Run refuses it. Read by each Run.
    bool SetNumberOfBins(int value);
    int GetNumberOfBins() const { return fNumberOfBins; }

    /// Where the temporary files go; any name is taken, and Run finds out whether files can be made there. Default:
    /// what TMPDIR of the environment names, if that is a directory that files can be made in, without trailing
    /// separator; else /tmp, if that is one; else "./". Read with the records.
    void SetTempDirName(const std::string& name) { fTempDirName = name; }
    std::string GetTempDirName() const { return fTempDirName; }

    /// Dumps what operator== compares, for a programmer's eye.
    void Display(std::ostream& os) const;

private:
    ProgressListener* fProgressListener = nullptr; ///< the host's
    int fNSkippedAttReports = 0;
    int fNSkippedCasesReports;
    MCQueryCancel* fCancelPointer = nullptr; ///< the host's
    bool fRightBorderClosed = true;
    int fNumberOfBins = -1; ///< -1 never set
    std::string fTempDirName;
};

#endif
