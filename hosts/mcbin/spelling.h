#ifndef MCBIN_SPELLING_H
#define MCBIN_SPELLING_H

#include <optional>
#include <string>
#include <vector>

/// The first name that `word` may stand for: one that begins with it, or differs from it by a few letters.
std::optional<std::string> FindNear(const std::string& word, const std::vector<std::string>& names);

#endif
