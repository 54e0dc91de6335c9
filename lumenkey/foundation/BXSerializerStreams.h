#pragma once

#include "lumenkey/foundation/BXExport.h"
#include "lumenkey/foundation/BXString.h"
#include "lumenkey/foundation/BXUUID.h"
#include "lumenkey/foundation/Tempus.h"

#include <cstdint>
#include <optional>
#include <string_view>

class BXSerializer;

/// A row of a table that gives the names of a document their numbers: the low half of the word is the tag of
/// an element, the high half, if not zero, the tag of an attribute of that element. A null name ends the
/// table.
struct BXScope {
    char const* name;
    std::uint64_t word;

    static constexpr BXScope element(char const* name, std::uint32_t tag) noexcept { return {name, tag}; }
    static constexpr BXScope attribute(char const* name, std::uint32_t element, std::uint32_t tag) noexcept {
        return {name, element | std::uint64_t{tag} << 32};
    }
    static constexpr BXScope end() noexcept { return {nullptr, 0}; }
};

/// Takes a document as elements, attributes and values. Tags have the names that the scopes in force give
/// them, the one that was pushed last first. All attributes of an element are written before its content.
class LUMENKEY_API BXSerializerWriteStream {
public:
    virtual ~BXSerializerWriteStream();

    /// The table isn't owned and must outlive the stream.
    virtual void pushScope(BXScope const* scope) = 0;
    virtual void popScope() = 0;
    virtual void startElement(std::uint32_t tag) = 0;
    virtual void endElement() = 0;
    virtual void writeValue(bool value) = 0;
    virtual void writeValue(std::uint32_t value) = 0;
    virtual void writeValue(std::uint64_t value) = 0;
    virtual void writeValue(double value) = 0;
    virtual void writeValue(BXString const& value) = 0;
    virtual void writeValue(BXUUID const& value) = 0;
    virtual void writeValue(Tempus const& value) = 0;
    virtual void writeAttribute(std::uint32_t tag, bool value) = 0;
    virtual void writeAttribute(std::uint32_t tag, std::uint32_t value) = 0;
    virtual void writeAttribute(std::uint32_t tag, std::uint64_t value) = 0;
    virtual void writeAttribute(std::uint32_t tag, double value) = 0;
    virtual void writeAttribute(std::uint32_t tag, BXString const& value) = 0;
    virtual void writeAttribute(std::uint32_t tag, BXUUID const& value) = 0;
    virtual void writeAttribute(std::uint32_t tag, Tempus const& value) = 0;
    virtual void endLine() = 0;
    // An element that holds nothing but a value: start, value and end in one, which streams may do faster.
    virtual void writeElement(std::uint32_t tag, double value);
    virtual void writeElement(std::uint32_t tag, Tempus const& value);
    /// Whether what is written goes into a digest; here false.
    virtual bool isHashStream() const;
    /// Whether a node, such as a child of a folder, may be written into the element that is open; writers ask
    /// before they start it. If nobody could read it there, the writing has failed. Here true.
    virtual bool allowsNode();
};

/// An element that is being read: its tag, its attributes and, where it holds no element, its text.
///
/// Each reading is false, with the output as it was, for what isn't there and for a text that isn't wholly of
/// the kind. The output may not be null. Spaces around numbers, bools, times and UUIDs don't count. Readings
/// of 32 bits give the low half of any number that 64 bits hold. An element with children has no text; one
/// that is empty has an empty one.
///
/// Valid as long as the handler that it is given to works on it.
class LUMENKEY_API BXStreamElement {
public:
    virtual ~BXStreamElement();

    /// By the scopes in force when it started.
    virtual std::uint32_t tag() const = 0;

    bool getAsString(BXString* out) const;
    bool getAsUInt32(std::uint32_t* out) const;
    bool getAsInt32(std::int32_t* out) const;
    bool getAsUInt64(std::uint64_t* out) const;
    bool getAsBool(bool* out) const;
    bool getAsDouble(double* out) const;
    bool getAsTime(Tempus* out) const;

    bool getAttributeAsString(std::uint32_t tag, BXString* out) const;
    bool getAttributeAsUInt32(std::uint32_t tag, std::uint32_t* out) const;
    bool getAttributeAsUInt64(std::uint32_t tag, std::uint64_t* out) const;
    bool getAttributeAsBool(std::uint32_t tag, bool* out) const;
    bool getAttributeAsDouble(std::uint32_t tag, double* out) const;
    bool getAttributeAsTime(std::uint32_t tag, Tempus* out) const;
    /// A new one, which the caller frees; null where there is none.
    BXUUID* getAttributeAsUUID(std::uint32_t tag) const;

    /// The text as it stands in the document, entities resolved, if the element has one. Valid until the next
    /// call.
    virtual std::optional<std::string_view> text() const = 0;
    /// Of the attribute with that tag in the scopes in force now.
    virtual std::optional<std::string_view> attributeText(std::uint32_t tag) const = 0;
};

/// Gives a document to handlers, element by element.
///
/// The handler on top of a stack gets the elements (`parseElement`). One that is pushed while it gets an
/// element gets all that follow, until that element closes; its `parseBegin` is called by the push, its
/// `parseEnd` when the element closes. The element that caused the push isn't passed to it. Scopes pushed by
/// a handler end with it. Names are looked up from the scope that was pushed last to the first; an element
/// without a name there is passed over whole.
///
/// A container is handed over before its first child, with all attributes and no text; a leaf when it ends.
class LUMENKEY_API BXSerializerReadStream {
public:
    virtual ~BXSerializerReadStream();

    /// The table isn't owned; it must outlive the stream, which remembers names and tags by it, and not
    /// change.
    virtual void pushScope(BXScope const* scope) = 0;
    /// Not owned; must outlive the element. Null does nothing, and so does a push out of a handler's
    /// `parseEnd`.
    virtual void pushHandler(BXSerializer* handler) = 0;
    /// Passes over all that is inside the element that is handed over now.
    virtual void skipElement() = 0;
    /// Whether something may be made for the element that is handed over now, such as a child of a folder;
    /// handlers ask before they make it. If the element lies too deep for that, the reading fails. Here true.
    virtual bool allowsNode();

    // The same questions of an element, asked through the stream.
    bool getAsInt32(BXStreamElement const& element, std::int32_t* out) const {
        return element.getAsInt32(out);
    }
    bool getAsDouble(BXStreamElement const& element, double* out) const { return element.getAsDouble(out); }
    bool getAsString(BXStreamElement const& element, BXString* out) const { return element.getAsString(out); }
    bool getAsChrono(BXStreamElement const& element, Tempus* out) const { return element.getAsTime(out); }
    bool getAttributeAsBool(BXStreamElement const& element, std::uint32_t tag, bool* out) const {
        return element.getAttributeAsBool(tag, out);
    }
    bool getAttributeAsUInt32(BXStreamElement const& element, std::uint32_t tag, std::uint32_t* out) const {
        return element.getAttributeAsUInt32(tag, out);
    }
    bool getAttributeAsUInt64(BXStreamElement const& element, std::uint32_t tag, std::uint64_t* out) const {
        return element.getAttributeAsUInt64(tag, out);
    }
    bool getAttributeAsDouble(BXStreamElement const& element, std::uint32_t tag, double* out) const {
        return element.getAttributeAsDouble(tag, out);
    }
    bool getAttributeAsString(BXStreamElement const& element, std::uint32_t tag, BXString* out) const {
        return element.getAttributeAsString(tag, out);
    }
    BXUUID* getAttributeAsUUID(BXStreamElement const& element, std::uint32_t tag) const {
        return element.getAttributeAsUUID(tag);
    }

    /// The version of the document; a handler sets it as soon as it is read. Until then that of new
    /// documents.
    std::uint32_t major = 5;
    std::uint32_t minor = 13;
    // For documents below version 5, whose times are frames. Set by who opens the stream.
    Tempus frameDuration = TempusMake(1, 30);
    double frameSeconds = 1.0 / 30.0;
    /// The end of a root's extent is `frameDuration` behind what a document gives, not the root's own frame.
    bool useStreamFrameDuration = false;
};
