#include "lumenkey/foundation/BXDocumentReader.h"

#include "lumenkey/foundation/BXDocumentDepth.h"
#include "lumenkey/foundation/BXSerializer.h"

#include <algorithm>

// What handlers ask for -------------------------------------------------------------------------------------

void BXDocumentReader::pushScope(BXScope const* scope) {
    if (scope != nullptr) {
        _state = _states.push(_state, scope);
        // The numbers of names that were unknown so far may be known now.
        _numbered = 0;
    }
}

void BXDocumentReader::pushHandler(BXSerializer* handler) {
    if (handler == nullptr || _isEndingHandler) {
        return;
    }
    _handlers.push_back({handler, _depth, _state});
    if (!handler->parseBegin(_stream)) {
        fail("a handler refused to begin");
    }
}

bool BXDocumentReader::allowsNode() {
    if (_depth > kGreatestDepthOfNodes) {
        fail(BXNodeTooDeepText());
    }
    return _problem.empty();
}

void BXDocumentReader::skipElement() noexcept {
    if (_isHandingOver) {
        _skippedDepth = _depth;
    }
}

std::optional<std::string_view> BXDocumentReader::text() const {
    return _hasText ? std::optional<std::string_view>(_text) : std::nullopt;
}

std::optional<std::string_view> BXDocumentReader::attributeText(std::uint32_t tag) const {
    numberAttributes();
    for (Attribute const& attribute : _attributes) {
        std::uint32_t found = 0;
        if (_states.attributeTag(_state, _tag, attribute.number, &found) && found == tag) {
            return std::string_view(_attributeTexts).substr(attribute.value, attribute.end - attribute.value);
        }
    }
    return std::nullopt;
}

void BXDocumentReader::numberAttributes() const {
    for (; _numbered < _attributes.size(); ++_numbered) {
        Attribute& attribute = _attributes[_numbered];
        attribute.number = _states.name(
            std::string_view(_attributeTexts).substr(attribute.name, attribute.value - attribute.name));
    }
}

// What the parser brings ------------------------------------------------------------------------------------

void BXDocumentReader::start(char const* name, char const* const* attributes) {
    if (!_problem.empty()) {
        return;
    }
    if (_isPending) {
        handOver(false);
    }
    if (_depth == kGreatestDepth || BXHasTooManyAttributes(attributes)) {
        fail(_depth == kGreatestDepth ? BXTooDeepText() : BXTooManyAttributesText());
        return;
    }
    ++_depth;
    if (_skippedDepth != 0) {
        return;
    }
    if (!_states.elementTag(_state, _states.name(name), &_tag)) {
        _skippedDepth = _depth;
        return;
    }
    copyAttributes(attributes);
    _text.clear();
    _isPending = true;
}

void BXDocumentReader::copyAttributes(char const* const* attributes) {
    _attributes.clear();
    _attributeTexts.clear();
    _numbered = 0;
    for (; *attributes != nullptr; attributes += 2) {
        std::size_t const name = _attributeTexts.size();
        _attributeTexts += attributes[0];
        std::size_t const value = _attributeTexts.size();
        _attributeTexts += attributes[1];
        _attributes.push_back({name, value, _attributeTexts.size(), 0});
    }
}

void BXDocumentReader::text(std::string_view more) {
    if (!_isPending || !_problem.empty()) {
        return;
    }
    if (more.size() > kLongestText - _text.size()) {
        fail("a text is longer than " + std::to_string(kLongestText) + " bytes");
        return;
    }
    _text += more;
}

void BXDocumentReader::end() {
    if (!_problem.empty()) {
        return;
    }
    if (_isPending) {
        handOver(true);
    }
    if (_skippedDepth == _depth) {
        _skippedDepth = 0;
    }
    endHandlers(_depth);
    --_depth;
}

void BXDocumentReader::handOver(bool isLeaf) {
    _isPending = false;
    if (_handlers.empty()) {
        return;
    }
    _hasText = isLeaf;
    _isHandingOver = true;
    bool const isTaken = _handlers.back().handler->parseElement(_stream, *this);
    _isHandingOver = false;
    if (!isTaken) {
        fail("a handler refused an element");
    }
}

void BXDocumentReader::endHandlers(std::uint32_t depth) {
    while (!_handlers.empty() && _handlers.back().depth >= depth) {
        Handler const last = _handlers.back();
        _isEndingHandler = true;
        bool const isTaken = last.handler->parseEnd(_stream);
        _isEndingHandler = false;
        _handlers.pop_back();
        _state = last.statesBefore;
        if (!isTaken) {
            fail("a handler refused what it was given");
        }
    }
}

void BXDocumentReader::finish() {
    _isPending = false;
    endHandlers(0);
}

void BXDocumentReader::fail(std::string_view what) {
    if (_problem.empty()) {
        _problem = what;
    }
}
