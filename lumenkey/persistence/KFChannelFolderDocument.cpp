// A folder in a document: its fold flags and the children that are worth writing.

#include "lumenkey/Channels/KFChannel.h"
#include "lumenkey/Channels/KFChannelFolder.h"
#include "lumenkey/Channels/KFFactories.h"
#include "lumenkey/Channels/KFFactory.h"
#include "lumenkey/persistence/KFDocumentElements.h"
#include "lumenkey/persistence/KFDocumentFlags.h"

#include <memory>

namespace {

constexpr std::uint32_t kFoldFlagsOfDigest = 0x7FF8DFF0;

constexpr BXUUID kBlindData = KFClassUUID("6F69A722-E95C-4B7A-870B-FB0345C9F167");

/// A child that documents leave out is in the digest where it would be written at its default too.
bool isWritten(KFChannelBase& child, bool all, bool isHash) {
    if (child.testFlag(kChannelFlagNotSaved) &&
        !(isHash && child.saveWhenAtDefaultState() && !child.testFlag(kChannelFlagExcludedFromHash)))
        return false;
    return all || child.isModified(false) || child.isStateModified() || child.saveWhenAtDefaultState();
}

} // namespace

void KFChannelFolder::writeBody(BXSerializerWriteStream& stream, bool full, bool children, bool all) {
    KFChannelBase::writeBody(stream, full, children, all);
    stream.pushScope(KFChannelFolderScope);
    std::uint32_t const flags = stream.isHashStream() ? _foldFlags & kFoldFlagsOfDigest : _foldFlags;
    if (flags != 0)
        KFWriteElement(stream, kFoldFlagsElement, flags);
    if (children && !testFoldFlag(kFoldFlagChildrenNotSaved)) {
        forEachChild([&](KFChannelBase& child) {
            if (!isWritten(child, all, stream.isHashStream()) || !stream.allowsNode())
                return;
            child.writeHeader(stream, full);
            child.writeBody(stream, full, true, all);
            stream.endElement();
        });
    }
    stream.popScope();
}

void KFChannelFolder::markFactoriesForSerialization(BXSerializerWriteStream& stream, bool all) {
    KFChannelBase::markFactoriesForSerialization(stream, all);
    forEachChild([&stream](KFChannelBase& child) { child.markFactoriesForSerialization(stream, false); });
}

// --- Reading ---

bool KFChannelFolder::parseBegin(BXSerializerReadStream& stream) {
    KFChannelBase::parseBegin(stream);
    stream.pushScope(KFChannelFolderScope);
    return true;
}

bool KFChannelFolder::parseEnd(BXSerializerReadStream&) { return true; }

bool KFChannelFolder::parseElement(BXSerializerReadStream& stream, BXStreamElement& element) {
    KFChannelBase::parseElement(stream, element);
    if (element.tag() == kFoldFlagsElement) {
        std::uint32_t flags = 0;
        if (element.getAsUInt32(&flags))
            _foldFlags = KFFoldFlagsOfElement(_foldFlags, flags);
    } else if (element.tag() == kParameterElement) {
        parseChild(stream, element);
    }
    return true;
}

/// The child of that ID, else a new one by its factory; null where it has none that makes channels.
KFChannelBase* KFChannelFolder::childForElement(BXStreamElement const& element) {
    std::uint32_t id = 0;
    element.getAttributeAsUInt32(kIDAttribute, &id);
    if (KFChannelBase* const present = getDescendant(id))
        return present;
    std::uint32_t fileID = 0;
    element.getAttributeAsUInt32(kFactoryIDAttributeOfNode, &fileID);
    // 0 stands for no factory, whatever a document gives that number to.
    auto* const factory = dynamic_cast<KFChannelFactory*>(
        fileID == 0 ? nullptr : KFFactories::getInstance().lookupFactory(fileID));
    if (factory == nullptr)
        return nullptr;
    BXString name;
    element.getAttributeAsString(kNameAttribute, &name);
    std::unique_ptr<KFFactoryBase> made(factory->create(name, id));
    auto* const child = dynamic_cast<KFChannelBase*>(made.get());
    if (child == nullptr)
        return nullptr;
    (void)made.release(); // whoever owns the tree owns it
    push_back(child);
    return child;
}

void KFChannelFolder::parseChild(BXSerializerReadStream& stream, BXStreamElement& element) {
    KFChannelBase* const child = stream.allowsNode() ? childForElement(element) : nullptr;
    if (child == nullptr) {
        stream.skipElement();
        return;
    }
    std::uint64_t flags = 0;
    if (element.getAttributeAsUInt64(kFlagsAttribute, &flags))
        child->setFlags(KFFlagsOfAttribute(child->getFlags(), flags));
    auto* const channel = dynamic_cast<KFChannel*>(child);
    double number = 0.0;
    if (channel != nullptr && element.getAttributeAsDouble(kDefaultAttribute, &number))
        channel->setDefaultValue(number);
    KFFactory const* const factory = child->getFactory();
    if (factory != nullptr && factory->isKindOfClass(kBlindData)) {
        stream.skipElement(); // its value is no number, and what stands inside isn't for the folder
        return;
    }
    if (channel != nullptr && element.getAttributeAsDouble(kValueAttribute, &number))
        channel->setInitialValue(number, false);
    stream.pushHandler(child);
}
