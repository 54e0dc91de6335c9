#include "lumenkey/foundation/BXXMLWriteStream.h"

#include "lumenkey/foundation/BXBlockWriter.h"
#include "lumenkey/foundation/BXTextForms.h"

#include <algorithm>
#include <cstring>
#include <string>
#include <type_traits>
#include <vector>

class BXXMLWriteStream::Writer {
public:
    Writer(BXStream& sink, unsigned int major, unsigned int minor);

    void start(std::uint32_t tag);
    void end();
    template <typename Value> void attribute(std::uint32_t tag, Value const& value);
    template <typename Value> void content(Value const& value);
    bool close();

    std::vector<BXScope const*> scopes;

private:
    enum class Holds { Nothing, Value, Elements };

    struct Open {
        std::uint32_t tag;
        /// Where its name begins in `_names`.
        std::size_t name;
        Holds holds;
    };

    char const* nameOf(std::uint64_t word) const noexcept;
    void open(std::uint32_t tag, std::string_view name);
    void closeInnermost();
    void endStartTag();
    void newLine();
    bool isNewAttribute(std::string_view name);

    template <typename Value> void put(Value const& value, BXText::Place) {
        char* const room = _out.room(BXText::kLongest);
        _out.taken(BXText::write(room, value));
    }
    void put(BXString const& value, BXText::Place place);

    BXBlockWriter _out;
    /// The root first. Names are kept here, since the scopes that gave them may be gone when their elements end.
    std::vector<Open> _open;
    std::string _names;
    /// The names of the innermost element's attributes, each behind a zero and followed by one.
    std::string _attributeNames;
    bool _isStartTagOpen = false;
    /// Open elements that are left out, the innermost ones.
    std::size_t _leftOutDepth = 0;
    bool _isWhole = true;
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

char const* BXXMLWriteStream::Writer::nameOf(std::uint64_t word) const noexcept {
    for (auto scope = scopes.rbegin(); scope != scopes.rend(); ++scope) {
        for (BXScope const* row = *scope; row->name != nullptr; ++row) {
            if (row->word == word) {
                return row->name;
            }
        }
    }
    return nullptr;
}

void BXXMLWriteStream::Writer::start(std::uint32_t tag) {
    char const* const name = _leftOutDepth == 0 && !_isClosed ? nameOf(tag) : nullptr;
    if (name == nullptr) {
        _isWhole = false;
        _leftOutDepth += _isClosed ? 0 : 1;
        return;
    }
    endStartTag();
    _open.back().holds = Holds::Elements;
    open(tag, name);
}

void BXXMLWriteStream::Writer::open(std::uint32_t tag, std::string_view name) {
    newLine();
    _out.append("<");
    _out.append(name);
    _open.push_back({tag, _names.size(), Holds::Nothing});
    _names += name;
    _attributeNames.assign(1, '\0');
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
        _out.append("</");
        _out.append(std::string_view(_names).substr(last.name));
        _out.append(">");
    }
    _names.resize(last.name);
}

void BXXMLWriteStream::Writer::endStartTag() {
    if (_isStartTagOpen) {
        _out.append(">");
        _isStartTagOpen = false;
    }
}

void BXXMLWriteStream::Writer::newLine() {
    static constexpr std::string_view kSpaces = "                                ";
    _out.append("\n");
    std::size_t left = 2 * _open.size();
    do {
        // All of them in one go, which is quicker than few, and only as many count as are wanted.
        std::size_t const some = std::min(left, kSpaces.size());
        char* const room = _out.room(kSpaces.size());
        std::memcpy(room, kSpaces.data(), kSpaces.size());
        _out.taken(room + some);
        left -= some;
    } while (left != 0);
}

bool BXXMLWriteStream::Writer::isNewAttribute(std::string_view name) {
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

template <typename Value> void BXXMLWriteStream::Writer::attribute(std::uint32_t tag, Value const& value) {
    if (_leftOutDepth != 0) {
        return;
    }
    bool const hasPlace = _isStartTagOpen && _open.size() > 1;
    char const* const name = hasPlace ? nameOf(_open.back().tag | std::uint64_t{tag} << 32) : nullptr;
    if (name == nullptr || !isNewAttribute(name)) {
        _isWhole = false;
        return;
    }
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
        _isWhole = false;
        return;
    }
    if constexpr (std::is_same_v<Value, BXString>) {
        if (value.empty()) {
            return;
        }
    }
    endStartTag();
    _open.back().holds = Holds::Value;
    put(value, BXText::Place::Content);
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
    return _isWhole && _out.isGood();
}

BXXMLWriteStream::BXXMLWriteStream(BXStream& sink, unsigned int major, unsigned int minor)
    : _writer(std::make_unique<Writer>(sink, major, minor)) {}
BXXMLWriteStream::~BXXMLWriteStream() = default;

bool BXXMLWriteStream::close() { return _writer->close(); }

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
