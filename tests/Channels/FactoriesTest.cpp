#include "lumenkey/Channels/KFChannelFactories.h"
#include "lumenkey/Channels/KFChannelFactoryTable.h"
#include "lumenkey/Channels/KFChannelFolder.h"
#include "lumenkey/Channels/KFFactories.h"
#include "lumenkey/Channels/KFScalarChannels.h"
#include "lumenkey/foundation/BXStream.h"
#include "lumenkey/foundation/BXXMLWriteStream.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <memory>
#include <set>
#include <thread>

namespace {

KFFactories& registry() { return KFFactories::getInstance(); }

} // namespace

TEST(KFFactories, EveryClassIsMadeByItsFactoryAndComesFromTheBase) {
    BXUUID const base = KFChannelFactoryUUID("KFChannelBase");
    std::set<BXUUID> seen;
    for (KFChannelFactoryRow const& row : KFChannelFactoryTable()) {
        SCOPED_TRACE(row.className);
        EXPECT_TRUE(seen.insert(row.identity()).second);
        KFFactory* const instance = row.getInstance == nullptr ? nullptr : row.getInstance();
        EXPECT_EQ(registry().findFactory(row.identity()), row.registered ? instance : nullptr);
        if (instance == nullptr)
            continue;
        KFFactory& factory = *instance;
        EXPECT_EQ(factory.uuid(), row.identity());
        EXPECT_TRUE(factory.isKindOfClass(row.identity()));
        EXPECT_TRUE(factory.isKindOfClass(base));
        EXPECT_FALSE(factory.isKindOfClass(BXUUID()));

        std::unique_ptr<KFFactoryBase> const made(factory.create("Name", 7));
        if (row.className == "KFChannel") {
            EXPECT_EQ(made, nullptr);
            continue;
        }
        ASSERT_NE(made, nullptr);
        EXPECT_EQ(made->getFactory(), &factory);
        EXPECT_EQ(made->getInstanceID(), 7U);
        auto* const channel = dynamic_cast<KFChannelBase*>(made.get());
        ASSERT_NE(channel, nullptr);
        EXPECT_EQ(channel->getParent(), nullptr);
        EXPECT_EQ(channel->getName(), "Name");
        std::unique_ptr<KFFactoryBase> const copy(factory.createCopy(made.get(), 0));
        ASSERT_NE(copy, nullptr);
        EXPECT_EQ(copy->getFactory(), &factory);
        EXPECT_EQ(typeid(*copy.get()), typeid(*made.get()));
        std::unique_ptr<KFChannelBase> const clone(channel->clone());
        ASSERT_NE(clone, nullptr);
        EXPECT_EQ(typeid(*clone.get()), typeid(*channel));
    }
}

TEST(KFFactories, TheNearestCommonClass) {
    KFChannelDouble a("a", nullptr, 1, 0);
    KFChannelChrono b("b", nullptr, 2, 0);
    KFChannelBool c("c", nullptr, 3, 0);
    KFChannelFolder d("d", nullptr, 4, 0, 0);
    KFFactories& factories = registry();
    EXPECT_EQ(factories.findCommonFactory({}), nullptr);
    EXPECT_EQ(factories.findCommonFactory({&a, &b}), getKFChannelDouble_FactoryBase());
    EXPECT_EQ(factories.findCommonFactory({&b, &a}), getKFChannelDouble_FactoryBase());
    EXPECT_EQ(factories.findCommonFactory({&a, &c}), getKFChannel_FactoryBase());
    EXPECT_EQ(factories.findCommonFactory({&a, &d, &a}), getKFChannelBase_FactoryBase());
    KFChannelBase stray(nullptr, "no factory", 5);
    EXPECT_EQ(factories.findCommonFactory({&a, &stray, &a}), nullptr);
}

TEST(KFFactories, MarksBecomeNumbersInTheOrderOfUUIDs) {
    KFFactory* const later = getKFChannelDouble_FactoryBase(); // FDC1...
    KFFactory* const earlier = getKFChannelBool_FactoryBase(); // 0B00...
    later->setNeedsSaving(true);
    earlier->setNeedsSaving(true);
    BXBufferWriteStream buffer(1024, 1024);
    BXXMLWriteStream stream(buffer, 5, 13);
    registry().saveFactories(stream);
    EXPECT_EQ(earlier->fileRefID(), 1U);
    EXPECT_EQ(later->fileRefID(), 2U);
    std::thread([&] { EXPECT_EQ(later->fileRefID(), 0U); }).join();
    registry().saveFactories(stream); // nothing is marked any more
    EXPECT_EQ(later->fileRefID(), 0U);
    stream.startElement(92);
    EXPECT_FALSE(stream.close()) << "their scope goes with them";
}

TEST(KFFactories, NumbersOfADocumentBelongToTheThreadThatReadsIt) {
    KFFactories& factories = registry();
    factories.setFactoryLoadID(3, getKFChannelBool_FactoryBase());
    factories.setFactoryLoadID(3, getKFChannelDouble_FactoryBase());
    EXPECT_EQ(factories.lookupFactory(3), getKFChannelDouble_FactoryBase());
    EXPECT_EQ(factories.lookupFactory(4), nullptr);
    std::thread([&] { EXPECT_EQ(factories.lookupFactory(3), nullptr); }).join();
    factories.clearFactoryLoadIDs();
    EXPECT_EQ(factories.lookupFactory(3), nullptr);
}

namespace {
class HostFactory : public KFChannelFactory {
public:
    HostFactory() : KFChannelFactory({{1, 2, 3, 4}}, KFChannelFactoryUUID("KFChannelDouble"), 1) {}
    BXString getIconNameInternal() const override { return "HostIcon"; }
    BXString getLibraryIconNameInternal() const override { return "LibraryIcon"; }
    char const* getBundleID() const override { return nullptr; }
};
class UntitledHostFactory : public KFChannelFactory {
public:
    UntitledHostFactory() : KFChannelFactory({{1, 2, 3, 5}}, {{1, 2, 3, 4}}, 1) {}
};
} // namespace

TEST(KFFactories, AHostsClassFindsItsSuperclassOnceThatIsRegistered) {
    static HostFactory host;
    static UntitledHostFactory derived;
    EXPECT_EQ(derived.getSuperFactory(), nullptr);
    registry().addFactory(&host);
    EXPECT_EQ(derived.getSuperFactory(), &host);
    EXPECT_TRUE(derived.isKindOfClass(KFChannelFactoryUUID("KFChannel")));
    EXPECT_EQ(derived.getIconName(), "HostIcon");
    EXPECT_EQ(derived.getIconID(), KFFactory::kNoIconID);
    EXPECT_EQ(derived.getLibraryIconName(), ""); // the bundle has no name
}

namespace {
/// Its destructor runs when those of the main thread's own objects are through.
struct ReadsAndWritesAtTheEnd {
    HostFactory factory;
    ~ReadsAndWritesAtTheEnd() {
        bool const startsAnew = !factory.needsSaving() && registry().lookupFactory(3) == nullptr;
        factory.setNeedsSaving(true);
        registry().setFactoryLoadID(3, &factory);
        if (!startsAnew || !factory.needsSaving() || registry().lookupFactory(3) != &factory) {
            std::_Exit(1);
        }
    }
};

[[noreturn]] void readAndWriteAtTheEnd() {
    registry(); // torn down behind the object
    static ReadsAndWritesAtTheEnd object;
    object.factory.setNeedsSaving(true);
    registry().setFactoryLoadID(3, &object.factory);
    std::exit(0);
}
} // namespace

TEST(KFFactories, MarksAndNumbersServeDestructorsOfStaticObjects) {
    testing::GTEST_FLAG(death_test_style) = "threadsafe";
    EXPECT_EXIT(readAndWriteAtTheEnd(), testing::ExitedWithCode(0), "");
}
