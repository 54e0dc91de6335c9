#include "tools/cli/NearMatch.h"

#include <algorithm>
#include <vector>

namespace lumenkey::tools {

namespace {

constexpr std::size_t kLongestName = 300;

std::string lowerCase(std::string_view text) {
    std::string lower(text);
    for (char& c : lower) {
        c = c >= 'A' && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c;
    }
    return lower;
}

/// The least number of letters to add, drop or change (Levenshtein 1965), by the table of Wagner and Fischer
/// 1974 with one row of it in memory.
std::size_t editDistance(std::string const& a, std::string const& b) {
    std::vector<std::size_t> row(b.size() + 1);
    for (std::size_t j = 0; j <= b.size(); ++j) {
        row[j] = j;
    }
    for (std::size_t i = 1; i <= a.size(); ++i) {
        std::size_t diagonal = row[0];
        row[0] = i;
        for (std::size_t j = 1; j <= b.size(); ++j) {
            std::size_t const change = diagonal + (a[i - 1] == b[j - 1] ? 0 : 1);
            diagonal = row[j];
            row[j] = std::min({change, row[j] + 1, row[j - 1] + 1});
        }
    }
    return row[b.size()];
}

} // namespace

NearMatch::NearMatch(std::string_view wanted)
    : _wanted(lowerCase(wanted)), _distance(std::max<std::size_t>(wanted.size() / 3, 2) + 1) {}

void NearMatch::offer(std::string const& candidate) {
    ++_offers;
    if (candidate.size() > kLongestName || _wanted.size() > kLongestName) {
        return;
    }
    std::string const lower = lowerCase(candidate);
    bool const isPart = !_wanted.empty() && (lower.starts_with(_wanted) || lower.ends_with("." + _wanted));
    std::size_t const distance = isPart ? 1 : editDistance(_wanted, lower);
    if (distance < _distance) {
        _distance = distance;
        _best = candidate;
    }
}

} // namespace lumenkey::tools
