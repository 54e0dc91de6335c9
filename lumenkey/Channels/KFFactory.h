#pragma once

#include "lumenkey/foundation/BXExport.h"
#include "lumenkey/foundation/BXLocks.h"
#include "lumenkey/foundation/BXString.h"
#include "lumenkey/foundation/BXUUID.h"

#include <atomic>
#include <cstdint>

class KFChannelBase;
class KFFactoryBase;

/// Stands for a class at run time: its identity, its superclass, and how to make an object of it.
///
/// Factories live for the process. Marks and file IDs belong to the thread that saves.
class LUMENKEY_API KFFactory {
public:
    static constexpr std::uint32_t kNoIconID = 0xFFFFFFFF;

    /// An all-zero `superUUID` marks the top of a hierarchy. `kind` is for the host.
    KFFactory(BXUUID const& uuid, BXUUID const& superUUID, std::uint32_t kind) noexcept;
    KFFactory(KFFactory const&) = delete;
    KFFactory& operator=(KFFactory const&) = delete;
    virtual ~KFFactory();

    // What is made belongs to the caller.
    virtual KFFactoryBase* create(BXString const& name, unsigned int id) = 0;
    virtual KFFactoryBase* createCopy(KFFactoryBase* source, unsigned int id) = 0;
    virtual KFFactoryBase* createInstance(KFFactoryBase* source) = 0;
    virtual BXString description() = 0;
    virtual BXString unlocalizedDescription() = 0;
    virtual BXString manufacturer() = 0;
    virtual unsigned int version() = 0;
    virtual unsigned int revision() = 0;
    // Icons are those of the nearest class upwards that names one.
    virtual BXString getIconName() const;
    virtual BXString getIconNameBW() const;
    virtual std::uint32_t getIconID() const;
    /// The path of the library icon of the nearest class upwards that names one; empty where none does, and where
    /// that class's bundle has no path (`setBundlePath`).
    virtual BXString getLibraryIconName() const;
    virtual BXString getCategoryName() const = 0;
    virtual BXString getEnglishCategoryName() const = 0;
    virtual char const* getBundleID() const = 0;
    virtual BXString getIconNameInternal() const = 0;
    virtual BXString getIconNameBWInternal() const = 0;
    virtual std::uint32_t getIconIDInternal() const = 0;
    virtual BXString getLibraryIconNameInternal() const = 0;

    BXUUID const& uuid() const noexcept { return _uuid; }
    BXUUID const& superUUID() const noexcept { return _superUUID; }
    std::uint32_t kind() const noexcept { return _kind; }

    /// The registered factory of the superclass, looked up once; null at the top and while it isn't registered.
    /// Any thread.
    KFFactory* getSuperFactory() const;
    /// Whether this class or one upwards has that UUID. False for an all-zero one.
    bool isKindOfClass(BXUUID const& uuid) const;

    /// Where the resources of a bundle lie, by its identifier: its icons are then `path/name.icns`. Null does nothing.
    /// Not beside look-ups of icons.
    static void setBundlePath(char const* bundleID, BXString const& path);

    // This thread's save state; false and 0 until set.
    bool needsSaving() const;
    void setNeedsSaving(bool needsSaving) const;
    std::uint32_t fileRefID() const;
    void setFileRefID(std::uint32_t id) const;

private:
    BXUUID const _uuid;
    BXUUID const _superUUID;
    std::uint32_t const _kind;
    mutable std::atomic<KFFactory*> _superFactory{nullptr};
    mutable BXMutex _superFactoryMutex;
};

/// A factory of channels.
class LUMENKEY_API KFChannelFactory : public KFFactory {
public:
    using KFFactory::KFFactory;
    ~KFChannelFactory() override;

    // Null here; the factory of each class that can be made overrides them.
    KFFactoryBase* create(BXString const& name, unsigned int id) override;
    KFFactoryBase* createCopy(KFFactoryBase* source, unsigned int id) override;
    KFFactoryBase* createInstance(KFFactoryBase* source) override;
    BXString description() override;
    BXString unlocalizedDescription() override;
    BXString manufacturer() override;
    unsigned int version() override;
    unsigned int revision() override;
    BXString getCategoryName() const override;
    BXString getEnglishCategoryName() const override;
    char const* getBundleID() const override;
    BXString getIconNameInternal() const override;
    BXString getIconNameBWInternal() const override;
    std::uint32_t getIconIDInternal() const override;
    BXString getLibraryIconNameInternal() const override;

    virtual KFChannelBase* createChannel(BXString const& name, unsigned int id);
    virtual KFChannelBase* createChannelCopy(KFChannelBase* source, unsigned int id);
    virtual KFChannelBase* createChannelInstance(KFChannelBase* source);
};
