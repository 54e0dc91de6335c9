#include "lumenkey/foundation/BXScopeStates.h"

#include <algorithm>
#include <cstring>
#include <utility>

namespace {

/// Of both ends and the length: names that differ in their middle alone are rare, and only cost a comparison.
std::size_t hashOf(std::string_view text) {
    std::uint64_t front = 0;
    std::uint64_t back = 0;
    if (text.size() >= 8) {
        std::memcpy(&front, text.data(), 8);
        std::memcpy(&back, text.data() + text.size() - 8, 8);
    } else if (text.size() >= 4) {
        std::memcpy(&front, text.data(), 4);
        std::memcpy(&back, text.data() + text.size() - 4, 4);
    } else {
        for (char const c : text) {
            front = front << 8 | static_cast<std::uint8_t>(c);
        }
    }
    std::uint64_t const mixed = (front ^ text.size()) * 0x9E3779B97F4A7C15u + back * 0xC2B2AE3D27D4EB4Fu;
    return static_cast<std::size_t>(mixed ^ mixed >> 32);
}

} // namespace

BXScopeStates::BXScopeStates() : _names(1), _slots(64) { make({}); }

BXScopeStates::State BXScopeStates::push(State state, BXScope const* scope) {
    for (Push const& known : _states[state].pushes) {
        if (known.scope == scope) {
            return known.to;
        }
    }
    std::vector<BXScope const*> scopes = _states[state].scopes;
    std::erase(scopes, scope);
    scopes.insert(scopes.begin(), scope);
    auto const same = std::find_if(_states.begin(), _states.end(),
                                   [&](Content const& content) { return content.scopes == scopes; });
    State const to =
        same != _states.end() ? static_cast<State>(same - _states.begin()) : make(std::move(scopes));
    _states[state].pushes.push_back({scope, to});
    return to;
}

BXScopeStates::State BXScopeStates::make(std::vector<BXScope const*> scopes) {
    Content content;
    for (BXScope const* scope : scopes) {
        for (BXScope const* row = scope; row->name != nullptr; ++row) {
            Name const name = intern(row->name);
            content.meanings.resize(_names.size());
            addMeaning(content, name, row->word);
        }
    }
    content.scopes = std::move(scopes);
    _states.push_back(std::move(content));
    return static_cast<State>(_states.size() - 1);
}

void BXScopeStates::addMeaning(Content& content, Name name, std::uint64_t word) {
    auto const element = static_cast<std::uint32_t>(word);
    auto const attribute = static_cast<std::uint32_t>(word >> 32);
    Meaning& meaning = content.meanings[name];
    if (attribute == 0) {
        if (!meaning.isElement) {
            meaning.isElement = true;
            meaning.elementTag = element;
        }
        return;
    }
    std::uint32_t* last = &meaning.firstAttribute;
    while (*last != 0) {
        last = &content.attributes[*last - 1].next;
    }
    *last = static_cast<std::uint32_t>(content.attributes.size() + 1);
    content.attributes.push_back({element, attribute, 0});
}

BXScopeStates::Name BXScopeStates::name(std::string_view text) const noexcept {
    std::size_t const mask = _slots.size() - 1;
    for (std::size_t slot = hashOf(text) & mask;; slot = (slot + 1) & mask) {
        Name const name = _slots[slot];
        if (name == 0 || _names[name] == text) {
            return name;
        }
    }
}

BXScopeStates::Name BXScopeStates::intern(std::string_view text) {
    if (Name const known = name(text); known != 0) {
        return known;
    }
    _names.push_back(text);
    Name const added = static_cast<Name>(_names.size() - 1);
    if (_names.size() * 2 > _slots.size()) {
        _slots.assign(_slots.size() * 2, 0);
        for (Name name = 1; name < added; ++name) {
            takeSlot(name);
        }
    }
    takeSlot(added);
    return added;
}

void BXScopeStates::takeSlot(Name name) {
    std::size_t const mask = _slots.size() - 1;
    std::size_t slot = hashOf(_names[name]) & mask;
    while (_slots[slot] != 0) {
        slot = (slot + 1) & mask;
    }
    _slots[slot] = name;
}

bool BXScopeStates::elementTag(State state, Name name, std::uint32_t* tag) const noexcept {
    std::vector<Meaning> const& meanings = _states[state].meanings;
    if (name >= meanings.size() || !meanings[name].isElement) {
        return false;
    }
    *tag = meanings[name].elementTag;
    return true;
}

bool BXScopeStates::attributeTag(State state, std::uint32_t element, Name name,
                                 std::uint32_t* tag) const noexcept {
    Content const& content = _states[state];
    std::uint32_t next = name < content.meanings.size() ? content.meanings[name].firstAttribute : 0;
    while (next != 0) {
        Attribute const& attribute = content.attributes[next - 1];
        if (attribute.element == element) {
            *tag = attribute.tag;
            return true;
        }
        next = attribute.next;
    }
    return false;
}
