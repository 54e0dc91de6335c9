// Internal: not installed.
#pragma once

#include "lumenkey/foundation/BXScopeStates.h"
#include "lumenkey/foundation/BXSerializerStreams.h"

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

class BXSerializer;

/// Between a parser and the handlers: takes starts, texts and ends, and hands over elements by the rules of
/// `BXSerializerReadStream`. It is itself the one element that is being handed over.
///
/// Once there is a problem nothing is taken any more. Nothing recurses on the depth of a document, and
/// buffers are reused, so that nothing is allocated for an element once they have grown.
class BXDocumentReader final : public BXStreamElement {
public:
    static constexpr std::size_t kLongestText = std::size_t{64} << 20;

    /// Handlers get the stream, which isn't owned.
    explicit BXDocumentReader(BXSerializerReadStream& stream) noexcept : _stream(stream) {}

    void pushScope(BXScope const* scope);
    void pushHandler(BXSerializer* handler);
    void skipElement() noexcept;
    bool allowsNode();

    /// Attributes are pairs of name and value, ended by null; they are copied.
    void start(char const* name, char const* const* attributes);
    void text(std::string_view more);
    void end();
    /// Calls `parseEnd` of all handlers that are left, the last one first; also behind a problem.
    void finish();

    /// Empty while all is well.
    std::string const& problem() const noexcept { return _problem; }

    std::uint32_t tag() const override { return _tag; }

protected:
    std::optional<std::string_view> text() const override;
    std::optional<std::string_view> attributeText(std::uint32_t tag) const override;

private:
    struct Handler {
        BXSerializer* handler;
        std::uint32_t depth;
        BXScopeStates::State statesBefore;
    };
    struct Attribute {
        std::size_t name;
        std::size_t value;
        std::size_t end;
        BXScopeStates::Name number;
    };

    void copyAttributes(char const* const* attributes);
    void handOver(bool isLeaf);
    void endHandlers(std::uint32_t depth);
    void numberAttributes() const;
    void fail(std::string_view what);

    BXSerializerReadStream& _stream;
    BXScopeStates _states;
    BXScopeStates::State _state = BXScopeStates::kNoScopes;
    std::vector<Handler> _handlers;
    std::string _problem;

    /// Open elements.
    std::uint32_t _depth = 0;
    /// The depth of the element that is passed over; 0 if none is.
    std::uint32_t _skippedDepth = 0;
    /// The innermost open element hasn't been handed over yet.
    bool _isPending = false;
    bool _isHandingOver = false;
    bool _isEndingHandler = false;

    // The pending element, or the one that is being handed over.
    std::uint32_t _tag = 0;
    bool _hasText = false;
    std::string _text;
    /// Names and values of attributes, one behind the other.
    std::string _attributeTexts;
    mutable std::vector<Attribute> _attributes;
    mutable std::size_t _numbered = 0;
};
