#include "lumenkey/foundation/BXXMLWriteStream.h"

#include "lumenkey/foundation/BXBlockWriter.h"
#include "lumenkey/foundation/BXDocumentDepth.h"
#include "lumenkey/foundation/BXDocumentReader.h"
#include "lumenkey/foundation/BXTextForms.h"

#include <algorithm>
#include <array>
#include <cstring>
#include <string>
#include <type_traits>
#include <vector>

namespace {

constexpr std::string_view kSpaces = "                                ";
/// What is written in one go: nearly everything.
constexpr std::size_t kFastDepth = 64;
constexpr std::size_t kFastName = 64;
/// What a tag may hold beside its long strings.
constexpr std::size_t kRoomForShort = std::size_t{64} << 10;
constexpr std::size_t kShortString = std::size_t{1} << 10;

/// As readers count it: in attributes as it is written, in content behind XML's own escapes.
std::size_t sizeForReaders(std::string_view text, BXText::Place place) {
    std::array<char, 8> one{};
    std::size_t size = text.size();
    for (std::size_t at = 0; (at = BXText::plainEnd(text, at, place)) != text.size(); ++at) {
        char const* const end = BXText::escaped(one.data(), text, at);
        bool const isUndone = place == BXText::Place::Content && one[0] == '&';
        size += isUndone ? 0 : static_cast<std::size_t>(end - one.data()) - 1;
    }
    return size;
}

} // namespace

class BXXMLWriteStream::Writer {
public:
    Writer(BXStream& sink, unsigned int major, unsigned int minor);

    void start(std::uint32_t tag);
    void end();
    template <typename Value> void attribute(std::uint32_t tag, Value const& value);
    template <typename Value> void content(Value const& value);
    template <typename Value> void element(std::uint32_t tag, Value const& value);
    bool allowsNode();
    bool close();
    std::string const& failure();

    std::vector<BXScope const*> scopes;

private:
    enum class Holds { Nothing, Value, Elements };

    struct Open {
        std::uint32_t tag;
        std::string_view name;
        Holds holds;
    };

    std::string_view nameOf(std::uint64_t word) noexcept;
    void open(std::uint32_t tag, std::string_view name);
    char* indented(char* room) const noexcept;
    void closeInnermost();
    void endStartTag();
    void newLine();
    bool isNewAttribute(std::string_view name);
    template <typename Value> bool isTooLong(Value const& value, BXText::Place place);
    void fail(std::string_view why);

    template <typename Value> void put(Value const& value, BXText::Place) {
        char* const room = _out.room(BXText::kLongest);
        _out.taken(BXText::write(room, value));
    }
    void put(BXString const& value, BXText::Place place);

    BXBlockWriter _out;
    /// The root first.
    std::vector<Open> _open;
    /// Names that the innermost scope has given before.
    struct KnownName {
        BXScope const* scope = nullptr;
        std::uint64_t word = 0;
        std::string_view name;
    };
    std::array<KnownName, 64> _known{};
    /// The names of the innermost element's attributes, each behind a zero and followed by one.
    std::string _attributeNames;
    bool _isStartTagOpen = false;
    /// Of the long strings in the innermost element's tag.
    std::size_t _tagSize = 0;
    std::size_t _attributeCount = 0;
    /// Open elements that are left out, the innermost ones.
    std::size_t _leftOutDepth = 0;
    std::string _failure;
    bool _isClosed = false;
};

BXXMLWriteStream::Writer::Writer(BXStream& sink, unsigned int major, unsigned int minor) : _out(sink) {
    _out.append("<?xml version=\"1.0\" encoding=\"UTF-8\"?>");
    open(0, "kfml");
    _out.append(" version=\"");
    put(std::uint32_t{major}, BXText::Place::Attribute);
    _out.append(".");
    put(std::uint32_t{minor}, BXText::Place::Attribute);
    _out.append("\"");
}

/// Without data where no scope has one.
std::string_view BXXMLWriteStream::Writer::nameOf(std::uint64_t word) noexcept {
    if (scopes.empty()) {
        return {};
    }
    auto const place =
        reinterpret_cast<std::uintptr_t>(scopes.back()) / sizeof(BXScope) + word + (word >> 32) * 7;
    KnownName& known = _known[place % _known.size()];
    if (known.scope == scopes.back() && known.word == word) {
        return known.name;
    }
    for (auto scope = scopes.rbegin(); scope != scopes.rend(); ++scope) {
        for (BXScope const* row = *scope; row->name != nullptr; ++row) {
            if (row->word == word) {
                if (scope == scopes.rbegin()) {
                    known = {*scope, word, row->name};
                }
                return row->name;
            }
        }
    }
    return {};
}

void BXXMLWriteStream::Writer::start(std::uint32_t tag) {
    std::string_view const name = _leftOutDepth == 0 && !_isClosed ? nameOf(tag) : std::string_view();
    bool const isTooDeep = _open.size() >= kGreatestDepth;
    if (name.data() == nullptr || isTooDeep) {
        fail(isTooDeep ? BXTooDeepText() : "an element has no name or no place");
        _leftOutDepth += _isClosed ? 0 : 1;
        return;
    }
    endStartTag();
    _open.back().holds = Holds::Elements;
    open(tag, name);
}

void BXXMLWriteStream::Writer::open(std::uint32_t tag, std::string_view name) {
    if (_open.size() <= kFastDepth && name.size() <= kFastName) {
        char* to = indented(_out.room(2 + 2 * kFastDepth + kSpaces.size() + kFastName));
        *to++ = '<';
        std::memcpy(to, name.data(), name.size());
        _out.taken(to + name.size());
    } else {
        newLine();
        _out.append("<");
        _out.append(name);
    }
    _open.push_back({tag, name, Holds::Nothing});
    _attributeNames.clear();
    _tagSize = 0;
    _attributeCount = 0;
    _isStartTagOpen = true;
}

void BXXMLWriteStream::Writer::end() {
    if (_leftOutDepth != 0) {
        --_leftOutDepth;
    } else if (_open.size() > 1) {
        closeInnermost();
    }
}

void BXXMLWriteStream::Writer::closeInnermost() {
    Open const last = _open.back();
    _open.pop_back();
    if (_isStartTagOpen) {
        _out.append("/>");
        _isStartTagOpen = false;
    } else {
        if (last.holds == Holds::Elements) {
            newLine();
        }
        std::string_view const name = last.name;
        if (name.size() <= kFastName) {
            char* const to = _out.room(kFastName + 3);
            std::memcpy(to, "</", 2);
            std::memcpy(to + 2, name.data(), name.size());
            to[2 + name.size()] = '>';
            _out.taken(to + name.size() + 3);
        } else {
            _out.append("</");
            _out.append(name);
            _out.append(">");
        }
    }
}

void BXXMLWriteStream::Writer::endStartTag() {
    if (_isStartTagOpen) {
        _out.append(">");
        _isStartTagOpen = false;
    }
}

/// For depths up to `kFastDepth`: a line feed and the indentation, all of it in stores of a whole row of
/// spaces.
char* BXXMLWriteStream::Writer::indented(char* room) const noexcept {
    *room++ = '\n';
    std::size_t const width = 2 * _open.size();
    for (std::size_t i = 0; i <= width; i += kSpaces.size()) {
        std::memcpy(room + i, kSpaces.data(), kSpaces.size());
    }
    return room + width;
}

void BXXMLWriteStream::Writer::newLine() {
    if (_open.size() <= kFastDepth) {
        _out.taken(indented(_out.room(1 + 2 * kFastDepth + kSpaces.size())));
        return;
    }
    _out.append("\n");
    for (std::size_t left = 2 * _open.size(); left != 0;) {
        std::size_t const some = std::min(left, kSpaces.size());
        _out.append(kSpaces.substr(0, some));
        left -= some;
    }
}

bool BXXMLWriteStream::Writer::isNewAttribute(std::string_view name) {
    if (_attributeNames.empty()) {
        _attributeNames += '\0';
    }
    std::size_t const before = _attributeNames.size() - 1;
    _attributeNames += name;
    _attributeNames += '\0';
    std::string_view const all = _attributeNames;
    if (before == 0 || all.find(all.substr(before)) == before) {
        return true;
    }
    _attributeNames.resize(before + 1);
    return false;
}

/// Of all values only strings can be longer than readers take.
template <typename Value> bool BXXMLWriteStream::Writer::isTooLong(Value const& value, BXText::Place place) {
    if constexpr (std::is_same_v<Value, BXString>) {
        if (value.view().size() <= kShortString) {
            return false;
        }
        std::size_t const size = sizeForReaders(value.view(), place);
        bool const isContent = place == BXText::Place::Content;
        std::size_t const most = BXDocumentReader::kLongestText - (isContent ? 0 : kRoomForShort + _tagSize);
        if (size > most) {
            fail("a text is longer than readers take");
            return true;
        }
        _tagSize += isContent ? 0 : size;
    }
    return false;
}

template <typename Value> void BXXMLWriteStream::Writer::attribute(std::uint32_t tag, Value const& value) {
    if (_leftOutDepth != 0 || isTooLong(value, BXText::Place::Attribute)) {
        return;
    }
    bool const hasPlace = _isStartTagOpen && _open.size() > 1;
    std::string_view const name =
        hasPlace ? nameOf(_open.back().tag | std::uint64_t{tag} << 32) : std::string_view();
    if (name.data() == nullptr || !isNewAttribute(name)) {
        fail("an attribute has no name or no place");
        return;
    }
    if (_attributeCount == kMostAttributes) {
        fail(BXTooManyAttributesText());
        return;
    }
    ++_attributeCount;
    _out.append(" ");
    _out.append(name);
    _out.append("=\"");
    put(value, BXText::Place::Attribute);
    _out.append("\"");
}

template <typename Value> void BXXMLWriteStream::Writer::content(Value const& value) {
    if (_leftOutDepth != 0) {
        return;
    }
    if (_open.size() <= 1 || _open.back().holds == Holds::Elements) {
        fail("a value has no place");
        return;
    }
    if constexpr (std::is_same_v<Value, BXString>) {
        if (value.empty() || isTooLong(value, BXText::Place::Content)) {
            return;
        }
    }
    endStartTag();
    _open.back().holds = Holds::Value;
    put(value, BXText::Place::Content);
}

/// The usual case in one go, the others as they come.
template <typename Value> void BXXMLWriteStream::Writer::element(std::uint32_t tag, Value const& value) {
    std::string_view const name = _leftOutDepth == 0 && !_isClosed ? nameOf(tag) : std::string_view();
    if (name.data() == nullptr || name.size() > kFastName || _open.size() > kFastDepth) {
        start(tag);
        content(value);
        end();
        return;
    }
    endStartTag();
    _open.back().holds = Holds::Elements;
    char* to = indented(_out.room(5 + 2 * kFastDepth + kSpaces.size() + 2 * kFastName + BXText::kLongest));
    *to++ = '<';
    to = std::copy(name.begin(), name.end(), to);
    *to++ = '>';
    to = BXText::write(to, value);
    *to++ = '<';
    *to++ = '/';
    to = std::copy(name.begin(), name.end(), to);
    *to++ = '>';
    _out.taken(to);
}

void BXXMLWriteStream::Writer::put(BXString const& value, BXText::Place place) {
    std::string_view const text = value.view();
    for (std::size_t at = 0;;) {
        std::size_t const end = BXText::plainEnd(text, at, place);
        _out.append(text.substr(at, end - at));
        if (end == text.size()) {
            return;
        }
        _out.taken(BXText::escaped(_out.room(8), text, end));
        at = end + 1;
    }
}

bool BXXMLWriteStream::Writer::close() {
    if (!_isClosed) {
        _leftOutDepth = 0;
        while (!_open.empty()) {
            closeInnermost();
        }
        _out.append("\n");
        _out.flush();
        _isClosed = true;
    }
    return failure().empty();
}

bool BXXMLWriteStream::Writer::allowsNode() {
    bool const isAllowed = _open.size() < kGreatestDepthOfNodes;
    if (!isAllowed) {
        fail(BXNodeTooDeepText());
    }
    return isAllowed;
}

void BXXMLWriteStream::Writer::fail(std::string_view why) {
    if (_failure.empty()) {
        _failure = why;
    }
}

std::string const& BXXMLWriteStream::Writer::failure() {
    if (!_out.isGood()) {
        fail("the text was refused where it was to go");
    }
    return _failure;
}

BXXMLWriteStream::BXXMLWriteStream(BXStream& sink, unsigned int major, unsigned int minor)
    : _writer(std::make_unique<Writer>(sink, major, minor)) {}
BXXMLWriteStream::~BXXMLWriteStream() = default;

bool BXXMLWriteStream::close() { return _writer->close(); }
std::string const& BXXMLWriteStream::failure() const { return _writer->failure(); }

void BXXMLWriteStream::pushScope(BXScope const* scope) {
    static constexpr BXScope kEmpty[] = {BXScope::end()};
    _writer->scopes.push_back(scope != nullptr ? scope : kEmpty);
}

void BXXMLWriteStream::popScope() {
    if (!_writer->scopes.empty()) {
        _writer->scopes.pop_back();
    }
}

void BXXMLWriteStream::startElement(std::uint32_t tag) { _writer->start(tag); }
void BXXMLWriteStream::endElement() { _writer->end(); }
void BXXMLWriteStream::writeValue(bool value) { _writer->content(value); }
void BXXMLWriteStream::writeValue(std::uint32_t value) { _writer->content(value); }
void BXXMLWriteStream::writeValue(std::uint64_t value) { _writer->content(value); }
void BXXMLWriteStream::writeValue(double value) { _writer->content(value); }
void BXXMLWriteStream::writeValue(BXString const& value) { _writer->content(value); }
void BXXMLWriteStream::writeValue(BXUUID const& value) { _writer->content(value); }
void BXXMLWriteStream::writeValue(Tempus const& value) { _writer->content(value); }
void BXXMLWriteStream::writeAttribute(std::uint32_t tag, bool value) { _writer->attribute(tag, value); }
void BXXMLWriteStream::writeAttribute(std::uint32_t tag, std::uint32_t value) {
    _writer->attribute(tag, value);
}
void BXXMLWriteStream::writeAttribute(std::uint32_t tag, std::uint64_t value) {
    _writer->attribute(tag, value);
}
void BXXMLWriteStream::writeAttribute(std::uint32_t tag, double value) { _writer->attribute(tag, value); }
void BXXMLWriteStream::writeAttribute(std::uint32_t tag, BXString const& value) {
    _writer->attribute(tag, value);
}
void BXXMLWriteStream::writeAttribute(std::uint32_t tag, BXUUID const& value) {
    _writer->attribute(tag, value);
}
void BXXMLWriteStream::writeAttribute(std::uint32_t tag, Tempus const& value) {
    _writer->attribute(tag, value);
}
void BXXMLWriteStream::endLine() {}
bool BXXMLWriteStream::allowsNode() { return _writer->allowsNode(); }

void BXXMLWriteStream::writeElement(std::uint32_t tag, double value) { _writer->element(tag, value); }
void BXXMLWriteStream::writeElement(std::uint32_t tag, Tempus const& value) { _writer->element(tag, value); }
