#pragma once

#include "tools/output/OutputSink.h"

namespace lumenkey::tools {

/// Standard output through a buffer, with every failure noticed: a full disk, a closed pipe (SIGPIPE must be
/// ignored).
class StandardOutput : public OutputSink {
public:
    StandardOutput() = default;
    StandardOutput(StandardOutput const&) = delete;
    StandardOutput& operator=(StandardOutput const&) = delete;

    void write(std::string_view text) override;
    /// The last of the text is out only after this.
    void flush();

private:
    std::string _buffer;
};

/// Writes all of it to a descriptor; 0, or the number of the error.
int writeFully(int descriptor, std::string_view text) noexcept;

} // namespace lumenkey::tools
