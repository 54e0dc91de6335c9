#include "tools/output/StandardOutput.h"

#include "tools/output/TextForms.h"

#include <cerrno>
#include <unistd.h>

namespace lumenkey::tools {

namespace {

void failFor(int error) {
    if (error != 0) {
        throw OutputError{"standard output", systemErrorText(error)};
    }
}

} // namespace

int writeFully(int descriptor, std::string_view text) noexcept {
    while (!text.empty()) {
        ssize_t const count = ::write(descriptor, text.data(), text.size());
        if (count < 0 && errno != EINTR) {
            return errno;
        }
        text.remove_prefix(count > 0 ? static_cast<std::size_t>(count) : 0);
    }
    return 0;
}

void StandardOutput::write(std::string_view text) {
    constexpr std::size_t enough = 65'536;
    if (text.size() >= enough) {
        flush();
        failFor(writeFully(STDOUT_FILENO, text));
        return;
    }
    _buffer += text;
    if (_buffer.size() >= enough) {
        flush();
    }
}

void StandardOutput::flush() {
    int const error = writeFully(STDOUT_FILENO, _buffer);
    _buffer.clear();
    failFor(error);
}

} // namespace lumenkey::tools
