#include "lumenkey/Channels/KFFactory.h"

#include "lumenkey/Channels/KFChannelBase.h"
#include "lumenkey/Channels/KFFactories.h"
#include "lumenkey/Channels/KFThreadState.h"

#include <map>
#include <string>
#include <unordered_map>

namespace {
/// What a factory is in the document that a thread saves.
struct SaveRecord {
    bool needsSaving = false;
    std::uint32_t fileRefID = 0;
};

SaveRecord& saveRecord(KFFactory const* factory) {
    return KFThreadState<std::unordered_map<KFFactory const*, SaveRecord>>()[factory];
}

/// Never destroyed: destructors of the host's static objects may still ask.
std::map<std::string, BXString>& bundlePaths() {
    static auto* const paths = new std::map<std::string, BXString>();
    return *paths;
}
} // namespace

KFFactory::KFFactory(BXUUID const& uuid, BXUUID const& superUUID, std::uint32_t kind) noexcept
    : _uuid(uuid), _superUUID(superUUID), _kind(kind) {}

KFFactory::~KFFactory() = default;

BXString KFFactory::getIconName() const {
    for (KFFactory const* at = this; at != nullptr; at = at->getSuperFactory()) {
        if (BXString name = at->getIconNameInternal(); !name.empty()) {
            return name;
        }
    }
    return {};
}

BXString KFFactory::getIconNameBW() const {
    for (KFFactory const* at = this; at != nullptr; at = at->getSuperFactory()) {
        if (BXString name = at->getIconNameBWInternal(); !name.empty()) {
            return name;
        }
    }
    return {};
}

std::uint32_t KFFactory::getIconID() const {
    for (KFFactory const* at = this; at != nullptr; at = at->getSuperFactory()) {
        if (std::uint32_t const id = at->getIconIDInternal(); id < kNoIconID) {
            return id;
        }
    }
    return kNoIconID;
}

BXString KFFactory::getLibraryIconName() const {
    for (KFFactory const* at = this; at != nullptr; at = at->getSuperFactory()) {
        BXString const name = at->getLibraryIconNameInternal();
        if (name.empty()) {
            continue;
        }
        char const* const bundleID = at->getBundleID();
        auto const found = bundlePaths().find(bundleID != nullptr ? bundleID : "");
        if (found == bundlePaths().end()) {
            return {};
        }
        BXString path = found->second;
        path.append("/");
        path.append(name.view());
        path.append(".icns");
        return path;
    }
    return {};
}

void KFFactory::setBundlePath(char const* bundleID, BXString const& path) {
    if (bundleID != nullptr) {
        bundlePaths()[bundleID] = path;
    }
}

KFFactory* KFFactory::getSuperFactory() const {
    if (KFFactory* const known = _superFactory.load(std::memory_order_acquire)) {
        return known;
    }
    BXLockSentry const guard(_superFactoryMutex);
    KFFactory* found = _superFactory.load(std::memory_order_relaxed);
    if (found == nullptr) {
        found = KFFactories::getInstance().findFactory(_superUUID);
        _superFactory.store(found, std::memory_order_release);
    }
    return found;
}

bool KFFactory::isKindOfClass(BXUUID const& uuid) const {
    for (KFFactory const* at = this; at != nullptr; at = at->getSuperFactory()) {
        if (at->_uuid.isZero()) {
            return false;
        }
        if (at->_uuid == uuid) {
            return true;
        }
    }
    return false;
}

bool KFFactory::needsSaving() const { return saveRecord(this).needsSaving; }

void KFFactory::setNeedsSaving(bool needsSaving) const { saveRecord(this).needsSaving = needsSaving; }

std::uint32_t KFFactory::fileRefID() const { return saveRecord(this).fileRefID; }

void KFFactory::setFileRefID(std::uint32_t id) const { saveRecord(this).fileRefID = id; }

// KFChannelFactory -------------------------------------------------------------------------------------------

KFChannelFactory::~KFChannelFactory() = default;

KFFactoryBase* KFChannelFactory::create(BXString const&, unsigned int) { return nullptr; }

KFFactoryBase* KFChannelFactory::createCopy(KFFactoryBase*, unsigned int) { return nullptr; }

KFFactoryBase* KFChannelFactory::createInstance(KFFactoryBase*) { return nullptr; }

BXString KFChannelFactory::description() { return "Channel"; }

BXString KFChannelFactory::unlocalizedDescription() { return description(); }

BXString KFChannelFactory::manufacturer() { return "Arbor"; }

unsigned int KFChannelFactory::version() { return 1; }

unsigned int KFChannelFactory::revision() { return 0; }

BXString KFChannelFactory::getCategoryName() const { return {}; }

BXString KFChannelFactory::getEnglishCategoryName() const { return {}; }

char const* KFChannelFactory::getBundleID() const { return ""; }

BXString KFChannelFactory::getIconNameInternal() const { return {}; }

BXString KFChannelFactory::getIconNameBWInternal() const { return {}; }

std::uint32_t KFChannelFactory::getIconIDInternal() const { return kNoIconID; }

BXString KFChannelFactory::getLibraryIconNameInternal() const { return {}; }

KFChannelBase* KFChannelFactory::createChannel(BXString const&, unsigned int) { return nullptr; }

KFChannelBase* KFChannelFactory::createChannelCopy(KFChannelBase*, unsigned int) { return nullptr; }

KFChannelBase* KFChannelFactory::createChannelInstance(KFChannelBase*) { return nullptr; }
