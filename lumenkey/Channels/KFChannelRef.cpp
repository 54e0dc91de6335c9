#include "lumenkey/Channels/KFChannelRef.h"

#include "lumenkey/Channels/KFChannelFolder.h"

#include <charconv>
#include <cstdint>
#include <cstring>
#include <limits>
#include <string_view>
#include <vector>

namespace {

/// The ID at which `getCobaltOnlyPath` cuts a path.
constexpr unsigned int kCutID = 9999;

/// Decimal digits only, at least one, of a value within 32 bits.
bool readID(std::string_view part, unsigned int* id) noexcept {
    char const* const end = part.data() + part.size();
    auto const [stop, error] = std::from_chars(part.data(), end, *id);
    return error == std::errc() && stop == end && !part.empty();
}

/// Takes the part in front of the next "/" off the text, and that "/".
std::string_view takePart(std::string_view* text) noexcept {
    std::string_view const part = text->substr(0, text->find('/'));
    text->remove_prefix(part.size() < text->size() ? part.size() + 1 : part.size());
    return part;
}

bool isAtOrAbove(KFChannelBase const* root, KFChannelBase const* channel) noexcept {
    while (channel != nullptr && channel != root) {
        channel = channel->getParent();
    }
    return channel != nullptr;
}

void appendID(std::string* text, unsigned int id) {
    char digits[10];
    auto const written = std::to_chars(std::begin(digits), std::end(digits), id);
    text->append(digits, written.ptr);
}

} // namespace

KFChannelRef::KFChannelRef(BXString const& path) : std::string(path.str()) {}

KFChannelRef::KFChannelRef(char const* path) : std::string(path != nullptr ? path : "") {}

KFChannelRef::KFChannelRef(KFChannelBase const* channel, KFChannelBase const* root) {
    if (channel == nullptr) {
        return;
    }
    if (channel == root) {
        appendID(this, channel->getID());
        return;
    }
    if (!isAtOrAbove(root, channel)) {
        root = nullptr;
    }
    std::vector<unsigned int> upwards;
    for (KFChannelBase const* node = channel; node != root; node = node->getParent()) {
        upwards.push_back(node->getID());
    }
    if (root != nullptr) {
        push_back('.');
    }
    for (auto id = upwards.rbegin(); id != upwards.rend(); ++id) {
        if (!empty()) {
            push_back('/');
        }
        appendID(this, *id);
    }
}

KFChannelRef& KFChannelRef::operator=(BXString const& path) {
    std::string::assign(path.str());
    return *this;
}

KFChannelRef& KFChannelRef::operator=(char const* path) {
    std::string::assign(path != nullptr ? path : "");
    return *this;
}

KFChannelBase* KFChannelRef::getChannel(KFChannelBase* root) const {
    if (root == nullptr || empty()) {
        return nullptr;
    }
    std::string_view rest = *this;
    KFChannelBase* current = nullptr;
    if (rest.front() == '.') {
        rest.remove_prefix(rest.starts_with("./") ? 2 : 1);
        current = root;
    }
    while (!rest.empty()) {
        unsigned int id = 0;
        if (!readID(takePart(&rest), &id)) {
            return nullptr;
        }
        if (current == nullptr) {
            current = root->getID() == id ? root : nullptr;
        } else {
            current = current->testFlag(kChannelFlagIsFolder)
                          ? static_cast<KFChannelFolder*>(current)->getDescendant(id)
                          : nullptr;
        }
        if (current == nullptr) {
            return nullptr;
        }
    }
    return current;
}

unsigned int KFChannelRef::getID() const noexcept {
    size_type const separator = find_last_of("./");
    unsigned int id = 0;
    if (separator == npos || !readID(std::string_view(*this).substr(separator + 1), &id)) {
        return 0;
    }
    return id;
}

void KFChannelRef::setID(unsigned int id) {
    size_type const separator = find_last_of("./");
    if (separator != npos) {
        resize(separator + 1);
        appendID(this, id);
    }
}

char const* KFChannelRef::getCobaltOnlyPath() const noexcept {
    std::string_view rest = *this;
    std::string_view part = rest;
    while (!rest.empty()) {
        part = takePart(&rest);
        unsigned int id = 0;
        if (readID(part, &id) && id == kCutID) {
            return part.data();
        }
    }
    return ends_with('/') ? c_str() : part.data();
}

bool KFChannelRef::writeToData(BXData& data) const {
    if (size() > std::numeric_limits<std::uint32_t>::max()) {
        return false;
    }
    std::uint32_t const length = static_cast<std::uint32_t>(size());
    std::uint8_t lengthBytes[sizeof length];
    std::memcpy(lengthBytes, &length, sizeof length);
    data.insert(data.end(), std::begin(lengthBytes), std::end(lengthBytes));
    data.insert(data.end(), begin(), end());
    return true;
}

int KFChannelRef::readFromData(BXData const& data, int offset) {
    std::uint32_t length = 0;
    if (offset < 0 || data.size() < sizeof length ||
        static_cast<std::size_t>(offset) > data.size() - sizeof length) {
        return offset;
    }
    std::size_t const begin = static_cast<std::size_t>(offset) + sizeof length;
    std::memcpy(&length, data.data() + offset, sizeof length);
    if (length > data.size() - begin || begin + length > std::numeric_limits<int>::max()) {
        return offset;
    }
    auto const text = data.begin() + static_cast<std::ptrdiff_t>(begin);
    std::string::assign(text, text + static_cast<std::ptrdiff_t>(length));
    return static_cast<int>(begin + length);
}
