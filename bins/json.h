#ifndef MCOBNQRT_BINS_JSON_H
#define MCOBNQRT_BINS_JSON_H

#include "bins/bins.h"

#include <stdexcept>
#include <string>

struct JsonValue;

// Bins as JSON, in the form that docs/json.md describes.

/// What keeps a document from being one of bins: the path in it, such as "results[0].bins[2].left", and what is wrong
/// there. Without the name of the file, which the host puts in front.
class JsonFault : public std::runtime_error
{
public:
    using std::runtime_error::runtime_error;
};

JsonValue MakeDocument(const Bins& bins);

/// The text of the document.
std::string ToJson(const Bins& bins);

/// What becomes of bins whose cut points were edited by hand, so that they are not those of the bins any more.
enum class Edits
{
    kRefused,
    kRecut ///< they are marked as edited, and have no weight until records are counted in them
};

/// The bins of a document of this version or of an earlier one.
/// \throw JsonFault if the document is not of the form, or contradicts itself.
Bins ReadBins(const JsonValue& document, Edits edits = Edits::kRefused);

/// The fault of a text that is not JSON, for all hosts to tell alike. `line` counts from 1.
JsonFault MakeNotJson(long line);

/// The name and the version of the form.
inline constexpr const char* kSchema = "mcobnqrt-bins";
inline constexpr int kSchemaVersion = 3;

#endif
