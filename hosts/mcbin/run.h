#ifndef MCBIN_RUN_H
#define MCBIN_RUN_H

#include "hosts/mcbin/outcome.h"

class Progress;
class TableReader;
struct BinOptions;

/// Reads the table twice, for its columns and for its records, and has the library bin it.
///
/// A signal that asks for the end stops it, and what has been found so far is given, with the status
/// BINStatusCancelled.
/// \throw Failure if the table can't be analysed, Interrupted if a signal came before there was anything to tell.
Outcome FindBins(TableReader& table, const BinOptions& options, Progress& progress);

#endif
