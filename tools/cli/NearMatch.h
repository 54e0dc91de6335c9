#pragma once

#include <cstddef>
#include <string>
#include <string_view>

namespace lumenkey::tools {

/// Finds what was perhaps meant by a name that doesn't exist: the candidate with the fewest letters to
/// change, without regard to case. The beginning of a name and its end behind a dot count as near.
class NearMatch {
public:
    explicit NearMatch(std::string_view wanted);

    void offer(std::string const& candidate);
    /// False when looking further isn't worth the time.
    bool wantsMore() const { return _offers < kMostOffers; }

    /// Empty when nothing is near.
    std::string const& best() const { return _best; }

private:
    static constexpr std::size_t kMostOffers = 10'000;

    std::string _wanted;
    std::string _best;
    std::size_t _distance;
    std::size_t _offers = 0;
};

} // namespace lumenkey::tools
