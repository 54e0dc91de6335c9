// lumenkey-make-motion: writes a motion capture file of the project's own making, for demonstrations and
// tests.

#include "tools/generate/MotionText.h"
#include "tools/generate/WalkCycle.h"

#include <cerrno>
#include <charconv>
#include <cstdio>
#include <cstring>
#include <exception>
#include <optional>
#include <string_view>

namespace {

using namespace lumenkey::generate;

constexpr char const* kUsage =
    "usage: lumenkey-make-motion OUT.bvh [--joints N] [--frames N] [--rate R] [--seed S]\n"
    "  --joints  1 to 100000 (else 17, a whole person)\n"
    "  --frames  1 to 100000000 (else 480)\n"
    "  --rate    frames a second, such as 24 or 30000/1001 (else 120)\n"
    "  --seed    the manner of the walk (else 1)\n"
    "Example: lumenkey-make-motion walk.bvh --frames 1000 --rate 60\n";

struct Options {
    char const* file = nullptr;
    std::uint64_t joints = 17;
    std::uint64_t frames = 480;
    FrameRate rate;
    std::uint64_t seed = 1;
};

bool readNumber(std::string_view text, std::uint64_t least, std::uint64_t most, std::uint64_t& number) {
    auto const [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
    return error == std::errc{} && end == text.data() + text.size() && number >= least && number <= most;
}

bool readRate(std::string_view text, FrameRate& rate) {
    std::size_t const slash = text.find('/');
    std::uint64_t frames = 0;
    std::uint64_t seconds = 1;
    bool const isSound = readNumber(text.substr(0, slash), 1, 1'000'000, frames) &&
                         (slash == text.npos || readNumber(text.substr(slash + 1), 1, 1'000'000, seconds));
    rate = {static_cast<std::uint32_t>(frames), static_cast<std::uint32_t>(seconds)};
    return isSound;
}

bool readOption(std::string_view name, std::string_view value, Options& options) {
    if (name == "--joints") {
        return readNumber(value, 1, 100'000, options.joints);
    }
    if (name == "--frames") {
        return readNumber(value, 1, 100'000'000, options.frames);
    }
    if (name == "--rate") {
        return readRate(value, options.rate);
    }
    return name == "--seed" && readNumber(value, 0, UINT64_MAX, options.seed);
}

std::optional<Options> readOptions(int argc, char** argv) {
    Options options;
    for (int i = 1; i < argc; ++i) {
        if (argv[i][0] != '-') {
            if (options.file != nullptr) {
                return std::nullopt;
            }
            options.file = argv[i];
            continue;
        }
        if (i + 1 == argc || !readOption(argv[i], argv[i + 1], options)) {
            return std::nullopt;
        }
        ++i;
    }
    return options.file == nullptr ? std::nullopt : std::optional(options);
}

int failForFile(char const* file) {
    std::fprintf(stderr, "lumenkey-make-motion: %s: %s\n", file, std::strerror(errno));
    return 1;
}

int run(Options const& options) {
    WalkCycle const walk(options.joints, options.seed);
    std::FILE* const file = std::fopen(options.file, "wb");
    if (file == nullptr) {
        return failForFile(options.file);
    }
    auto const write = [file](std::string_view text) {
        return std::fwrite(text.data(), 1, text.size(), file) == text.size();
    };
    bool const isWritten = writeMotion(walk, options.frames, options.rate, write);
    if (std::fclose(file) != 0 || !isWritten) {
        int const code = failForFile(options.file);
        std::remove(options.file);
        return code;
    }
    return 0;
}

} // namespace

int main(int argc, char** argv) {
    try {
        if (argc == 2 && std::string_view(argv[1]) == "--help") {
            std::fputs(kUsage, stdout);
            return 0;
        }
        std::optional<Options> const options = readOptions(argc, argv);
        if (!options) {
            std::fputs(kUsage, stderr);
            return 2;
        }
        return run(*options);
    } catch (std::exception const& error) {
        std::fprintf(stderr, "lumenkey-make-motion: %s\n", error.what());
        return 1;
    }
}
