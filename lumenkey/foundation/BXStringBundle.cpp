#include "lumenkey/foundation/BXStringBundle.h"

namespace {
struct Text {
    std::string_view key;
    std::string_view text;
};

constexpr Text kTexts[] = {
    {"Channel Over Range Range Name", "Range"},
    {"Channel X", "X"},
    {"Channel Y", "Y"},
    {"Channel Z", "Z"},
};
} // namespace

std::string_view BXStringBundleText(std::string_view key) noexcept {
    for (Text const& entry : kTexts) {
        if (entry.key == key) {
            return entry.text;
        }
    }
    return key;
}
