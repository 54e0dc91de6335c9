#pragma once

#include "lumenkey/foundation/BXExport.h"
#include "lumenkey/foundation/BXString.h"

#include <cstdint>

class BXSerializer;
class BXSerializerWriteStream;
class KFFactory;

/// Base of everything that a factory makes. The factory is never owned and may be null; then all that is asked of
/// it is empty, and the icon ID 0xFFFFFFFF.
class LUMENKEY_API KFFactoryBase {
public:
    virtual ~KFFactoryBase();

    virtual BXString getIconName() const;
    virtual BXString getIconNameBW() const;
    virtual std::uint32_t getIconID() const;
    virtual BXString getLibraryIconName() const;
    virtual BXString description();
    virtual unsigned int getInstanceID() const = 0;
    virtual BXSerializer* getSerializer() = 0;
    /// The factory under which the object is written: its own.
    virtual KFFactory* getFactoryForSerialization(BXSerializerWriteStream& stream, bool all) const;

    KFFactory* getFactory() const noexcept { return _factory; }
    void setFactory(KFFactory* factory) noexcept { _factory = factory; }

protected:
    explicit KFFactoryBase(KFFactory* factory) noexcept : _factory(factory) {}
    KFFactoryBase(KFFactoryBase const&) noexcept = default;
    KFFactoryBase& operator=(KFFactoryBase const&) noexcept = default;

private:
    KFFactory* _factory;
};
