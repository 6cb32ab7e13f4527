#ifndef MCBIN_SPELLING_H
#define MCBIN_SPELLING_H

#include <optional>
#include <string>
#include <vector>

/// The first of the names that may be meant by `word`: one that begins with it, or that it is with a few letters mistyped.
std::optional<std::string> FindNear(const std::string& word, const std::vector<std::string>& names);

#endif
