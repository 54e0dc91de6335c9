#pragma once

#include "lumenkey/foundation/BXExport.h"
#include "lumenkey/foundation/BXSingleton.h"
#include "lumenkey/foundation/BXUUID.h"

#include <cstdint>
#include <map>
#include <vector>

class BXSerializerWriteStream;
class KFFactory;
class KFFactoryBase;

/// The registry: which factory stands for a UUID, and which for a number in the document that this thread reads.
///
/// Threads: look-ups may run side by side; `addFactory` must not run beside them. The numbers of documents are kept
/// for each thread, so that threads read and write different documents at the same time, and go with the thread.
class LUMENKEY_API KFFactories : public BXSingleton {
public:
    /// Made on first use, safely against a concurrent first use, with the library's own classes registered.
    static KFFactories& getInstance();

    /// Registers the library's classes; the constructor calls it.
    void addChannelFactories();
    /// An earlier entry for the UUID is replaced. The factory isn't owned; null does nothing.
    void addFactory(KFFactory* factory);
    /// Null for an unknown UUID.
    KFFactory* findFactory(BXUUID const& uuid) const;
    /// The nearest class that all objects are kinds of; null for none, and for an empty list.
    KFFactory* findCommonFactory(std::vector<KFFactoryBase*> const& objects) const;

    /// The factories in the order in which documents list them: by UUID.
    std::map<BXUUID, KFFactory*> const& factories() const noexcept { return _factories; }

    /// Writes a `factory` element for each registered factory that this thread has marked (`setNeedsSaving`), in the
    /// order of their UUIDs, and numbers them from 1 (`fileRefID`). The marks are cleared; factories without one get
    /// the number 0.
    void saveFactories(BXSerializerWriteStream& stream);

    // The numbers of the document that this thread reads.
    std::map<std::uint32_t, KFFactory*>& getFactoryLoadMap();
    void setFactoryLoadID(std::uint32_t fileID, KFFactory* factory);
    KFFactory* lookupFactory(std::uint32_t fileID);
    void clearFactoryLoadIDs();

private:
    KFFactories();
    ~KFFactories() override;
    template <class T> friend T& BXSingletonInstance();

    std::map<BXUUID, KFFactory*> _factories;
};
