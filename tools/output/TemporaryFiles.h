#pragma once

#include <cstddef>
#include <string>

namespace lumenkey::tools {

/// Has the temporaries that are alive removed where a signal (`SIGINT`, `SIGTERM`, `SIGHUP`) ends the program,
/// which then ends as it would have. A signal that is ignored stays so. To be called once, before threads.
void removeTemporariesOnSignals();

/// The name of a temporary while it is alive, for the above; of more than a few dozen at once the others are
/// left behind.
class TemporaryName {
public:
    TemporaryName() = default;
    TemporaryName(TemporaryName&& other) noexcept;
    TemporaryName& operator=(TemporaryName&& other) noexcept;
    ~TemporaryName();

    /// Makes and opens a file, as `mkostemp` with `O_CLOEXEC` does, whose name `pattern` becomes: no signal
    /// ends the program between that and its being known here. -1 on failure, with `errno`. To be called once.
    int makeFile(std::string& pattern);

private:
    static constexpr std::size_t kNone = static_cast<std::size_t>(-1);

    std::size_t _slot = kNone;
};

} // namespace lumenkey::tools
