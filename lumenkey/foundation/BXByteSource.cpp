#include "lumenkey/foundation/BXByteSource.h"

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <system_error>

namespace {

std::string withReason(char const* what, int error) {
    return what + std::string(": ") + std::generic_category().message(error);
}

} // namespace

BXByteSource::~BXByteSource() = default;

std::string BXByteSource::open() { return {}; }
std::string BXByteSource::problem() const { return {}; }

std::optional<std::size_t> BXMemorySource::read(void* out, std::size_t size) {
    std::size_t const taken = std::min(size, _rest.size());
    if (taken != 0) {
        std::memcpy(out, _rest.data(), taken);
        _rest = _rest.subspan(taken);
    }
    return taken;
}

std::string BXFileSource::open() {
    // "e": a program that the host starts meanwhile doesn't inherit the file.
    _file.reset(std::fopen(_path.c_str(), "rbe"));
    if (!_file) {
        return withReason("the file can't be opened", errno);
    }
    // Blocks are large enough; a buffer would only copy them.
    std::setvbuf(_file.get(), nullptr, _IONBF, 0);
    return {};
}

std::optional<std::size_t> BXFileSource::read(void* out, std::size_t size) {
    std::size_t const taken = std::fread(out, 1, size, _file.get());
    if (taken < size && std::ferror(_file.get()) != 0) {
        _problem = withReason("the file can't be read", errno);
        return std::nullopt;
    }
    return taken;
}
