#ifndef MCBIN_PROGRESS_H
#define MCBIN_PROGRESS_H

#include <mcobnqrt/progresslistener.h>

#include <chrono>
#include <cstddef>
#include <string>
#include <utility>
#include <vector>

/// The line on a terminal that tells how far the work is. It stands on standard error, is written over as things go on,
/// and is gone at the end. All operations do nothing visible where it isn't to be shown.
class Progress : public ProgressListener
{
public:
    explicit Progress(bool isShown) : fIsShown(isShown) {}
    Progress(const Progress&) = delete;
    Progress& operator=(const Progress&) = delete;
    ~Progress() override { Erase(); }

    /// A pass over the rows begins; `what` tells what it is for.
    void BeginRows(const std::string& what);

    /// A row of the pass has been read. \throw Interrupted now and then, if a signal has asked for the end.
    void CountRow();

    /// So many attributes, or pairs, will be binned when all records have been read.
    void ExpectAttributes(std::size_t number) { fNumAttributes = number; }

    /// The records have been read: from now on the library reports attributes.
    void BeginAttributes();

    /// Called by the library.
    void ReportProgress(ProgressReport& report) override;

    /// What the reports call an attribute.
    void SetNames(std::vector<std::string> names) { fNames = std::move(names); }

    void Erase();

private:
    void ShowRows(long rows);
    void Show(const std::string& text);

    bool fIsShown;
    bool fIsOnScreen = false;
    bool fAreAttributes = false;
    std::string fWhat;
    long fRows = 0;
    std::size_t fNumAttributes = 0;
    std::size_t fAttributesDone = 0;
    std::vector<std::string> fNames; ///< by variable index
    std::chrono::steady_clock::time_point fBegin;
};

#endif
