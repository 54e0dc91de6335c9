// Internal: not installed.
#pragma once

#include "lumenkey/foundation/BXSerializerStreams.h"

#include <cstdint>
#include <string_view>
#include <vector>

/// What names mean under the scopes in force while a document is read.
///
/// The scopes in force are a state, a small number. Of a table that is pushed twice only the last push
/// matters, since it is asked first and knows the same, so a state is a row of different tables: however deep
/// folders lie in each other, a reading goes through a handful of states. Each is made once, with all its
/// names resolved; from then on an element costs one look-up in a table of hashes and one in an array.
class BXScopeStates {
public:
    using State = std::uint32_t;
    /// Numbers the names of all scopes seen; 0 is any other name.
    using Name = std::uint32_t;

    static constexpr State kNoScopes = 0;

    BXScopeStates();

    /// The state behind pushing a scope, which isn't null.
    State push(State state, BXScope const* scope);

    Name name(std::string_view text) const noexcept;

    /// False if the scopes give no element that name.
    bool elementTag(State state, Name name, std::uint32_t* tag) const noexcept;
    /// The same for an attribute of the element with a tag.
    bool attributeTag(State state, std::uint32_t element, Name name, std::uint32_t* tag) const noexcept;

private:
    struct Attribute {
        std::uint32_t element;
        std::uint32_t tag;
        std::uint32_t next;
    };
    struct Meaning {
        std::uint32_t elementTag = 0;
        bool isElement = false;
        /// One above the place of the first of its meanings as an attribute, which are linked, innermost
        /// first.
        std::uint32_t firstAttribute = 0;
    };
    struct Push {
        BXScope const* scope;
        State to;
    };
    struct Content {
        /// Innermost first, each once.
        std::vector<BXScope const*> scopes;
        std::vector<Meaning> meanings;
        std::vector<Attribute> attributes;
        std::vector<Push> pushes;
    };

    State make(std::vector<BXScope const*> scopes);
    static void addMeaning(Content& content, Name name, std::uint64_t word);
    Name intern(std::string_view text);
    void takeSlot(Name name);

    std::vector<Content> _states;
    /// By number; the texts are those of the scopes.
    std::vector<std::string_view> _names;
    /// Open addressing, at most half full; 0 is free.
    std::vector<Name> _slots;
};
