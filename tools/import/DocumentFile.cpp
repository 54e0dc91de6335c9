#include "tools/import/DocumentFile.h"

#include "lumenkey/Channels/KFChannelFactories.h"
#include "lumenkey/Channels/KFChannelFlags.h"
#include "lumenkey/Channels/KFFactories.h"
#include "lumenkey/Channels/KFFactoryScope.h"
#include "lumenkey/foundation/BXURL.h"
#include "lumenkey/foundation/BXXMLReadStream.h"
#include "lumenkey/persistence/KFDocumentFlags.h"
#include "lumenkey/persistence/KFDocumentScopes.h"
#include "lumenkey/persistence/KFDocumentVersion.h"
#include "tools/curve/Keypoint.h"
#include "tools/tree/FileRoot.h"

#include <algorithm>
#include <filesystem>
#include <limits>
#include <numeric>
#include <span>

namespace lumenkey::tools {

namespace {

/// Deletes what reading made where no tree came of it.
struct DeleteTree {
    void operator()(KFChannelBase* top) const {
        ChannelTree const owner{std::unique_ptr<KFChannelBase>(top)};
    }
};

/// The outermost handler of a document: notes its version and factories, and makes its channel.
class TopReader : public BXSerializer {
public:
    explicit TopReader(DocumentFile& document) : _document(document) {}

    void writeHeader(BXSerializerWriteStream&, bool) override {}
    void writeBody(BXSerializerWriteStream&, bool, bool, bool) override {}
    void markFactoriesForSerialization(BXSerializerWriteStream&, bool) override {}
    bool parseBegin(BXSerializerReadStream& stream) override {
        stream.pushScope(KFMLScope);
        return true;
    }
    bool parseEnd(BXSerializerReadStream&) override { return true; }

    bool parseElement(BXSerializerReadStream& stream, BXStreamElement& element) override {
        BXString text;
        switch (element.tag()) {
        case kOldDocumentElement:
        case kDocumentElement:
            element.getAttributeAsString(kVersionAttribute, &_document.writtenVersion);
            if (element.getAttributeAsString(kVersionAttribute, &text)) {
                KFReadVersion(text.view(), stream.major, stream.minor);
                _document.major = stream.major;
                _document.minor = stream.minor;
            }
            break;
        case kFactoryElement:
            readFactory(element);
            break;
        case kFactoryDescriptionElement:
            if (!_document.factories.empty() && element.getAsString(&text)) {
                _document.factories.back().description = text.str();
            }
            break;
        case kParameterElement:
            return readTop(stream, element);
        default:
            break;
        }
        return true;
    }

    /// Why `parseElement` stopped the reading; empty where it didn't.
    std::string const& problem() const { return _problem; }
    std::unique_ptr<KFChannelBase, DeleteTree> takeTop() { return std::move(_top); }

private:
    void readFactory(BXStreamElement const& element) {
        DocumentFactory entry;
        element.getAttributeAsUInt32(kFactoryIDAttribute, &entry.number);
        std::unique_ptr<BXUUID const> const uuid(element.getAttributeAsUUID(kFactoryUUIDAttribute));
        if (uuid != nullptr) {
            entry.uuid = *uuid;
            KFFactories& registry = KFFactories::getInstance();
            if (KFFactory* const factory = registry.findFactory(*uuid)) {
                registry.setFactoryLoadID(entry.number, factory);
                entry.className = classNameOf(*factory);
            }
        }
        _document.factories.push_back(std::move(entry));
    }

    bool readTop(BXSerializerReadStream& stream, BXStreamElement const& element) {
        if (_top != nullptr) {
            _problem = "a second channel: a document holds one, with all others inside it";
            return false;
        }
        BXString name;
        std::uint32_t id = 0;
        std::uint32_t number = 0;
        element.getAttributeAsString(kNameAttribute, &name);
        element.getAttributeAsUInt32(kIDAttribute, &id);
        bool const saysClass = element.getAttributeAsUInt32(kFactoryIDAttributeOfNode, &number);
        KFFactory* const factory = saysClass ? KFFactories::getInstance().lookupFactory(number)
                                             : &KFChannelObjectRootBase_Factory::getInstance();
        _top.reset(make(factory, name, id, stream));
        if (_top == nullptr) {
            _problem = "the class of the channel '" + name.str() + "' is unknown: " + nameOfClass(number);
            return false;
        }
        applyAttributes(element);
        stream.pushHandler(_top.get());
        return true;
    }

    /// As a folder does for its children: in a host's own document a channel has them in the place of
    /// elements.
    void applyAttributes(BXStreamElement const& element) {
        std::uint64_t flags = 0;
        if (element.getAttributeAsUInt64(kFlagsAttribute, &flags)) {
            _top->setFlags(KFFlagsOfAttribute(_top->getFlags(), flags));
        }
        auto* const channel = dynamic_cast<KFChannel*>(_top.get());
        double number = 0;
        if (channel != nullptr && element.getAttributeAsDouble(kDefaultAttribute, &number)) {
            storeDefault(*channel, number);
        }
        if (channel != nullptr && element.getAttributeAsDouble(kValueAttribute, &number)) {
            storeConstant(*channel, number);
        }
    }

    static KFChannelBase* make(KFFactory* factory, BXString const& name, unsigned id,
                               BXSerializerReadStream const& stream) {
        if (factory == &KFChannelObjectRootBase_Factory::getInstance()) {
            constexpr std::uint32_t firstWithTimes = 5;
            return new FileRoot(name, id,
                                stream.major < firstWithTimes ? stream.frameDuration : kTempusInvalid);
        }
        auto* const maker = dynamic_cast<KFChannelFactory*>(factory);
        return maker == nullptr ? nullptr : maker->createChannel(name, id);
    }

    std::string nameOfClass(std::uint32_t number) const {
        std::string text = "factory " + std::to_string(number);
        for (DocumentFactory const& entry : _document.factories) {
            if (entry.number == number) {
                return text + ", " + entry.uuid.text() +
                       (entry.description.empty() ? "" : " ('" + entry.description + "')");
            }
        }
        return text + ", which the document doesn't list";
    }

    DocumentFile& _document;
    std::unique_ptr<KFChannelBase, DeleteTree> _top;
    std::string _problem;
};

DocumentFile readDocument(BXXMLReadStream& stream, std::string const& file, Tempus const& frameDuration) {
    stream.frameDuration = frameDuration;
    stream.frameSeconds = TempusGetSeconds(frameDuration);
    KFFactories::getInstance().clearFactoryLoadIDs();
    DocumentFile document;
    TopReader reader(document);
    stream.pushHandler(&reader);
    bool const isSound = stream.parse();
    std::unique_ptr<KFChannelBase, DeleteTree> top = reader.takeTop();
    if (!isSound) {
        BXReadFailure const& failure = *stream.failure();
        throw InputError{file, static_cast<unsigned>(std::max<std::uint64_t>(failure.line, 1)),
                         static_cast<unsigned>(std::max<std::uint64_t>(failure.column, 1)),
                         reader.problem().empty() ? failure.reason : reader.problem()};
    }
    if (top == nullptr) {
        throw InputError{file, 1, 1, "the document holds no channel"};
    }
    document.tree = std::make_unique<ChannelTree>(std::unique_ptr<KFChannelBase>(top.release()));
    return document;
}

void tellProgress(BXXMLReadStream& stream, std::uintmax_t size, ReadingProgress const& progress) {
    if (progress && size > 0) {
        stream.setProgress([size, progress](std::uint64_t bytes) {
            progress(std::min(1.0, static_cast<double>(bytes) / static_cast<double>(size)));
        });
    }
}

/// A positive fraction of a second, in lowest terms.
struct Fraction {
    std::int64_t numerator = 0;
    std::int64_t denominator = 1;
};

/// The longest step of which both are multiples; nothing where that has no exact form.
std::optional<Fraction> commonStep(Fraction const& a, Tempus const& time) {
    if (time.value == std::numeric_limits<std::int64_t>::min()) {
        return std::nullopt;
    }
    std::int64_t const divisor = std::gcd(time.value, std::int64_t{time.timescale});
    std::int64_t const value = time.value / std::max<std::int64_t>(divisor, 1);
    std::int64_t const scale = time.timescale / std::max<std::int64_t>(divisor, 1);
    std::int64_t const shared = std::gcd(a.denominator, scale);
    Fraction step;
    std::int64_t left = 0;
    std::int64_t right = 0;
    if (__builtin_mul_overflow(a.denominator / shared, scale, &step.denominator) ||
        __builtin_mul_overflow(a.numerator, scale / shared, &left) ||
        __builtin_mul_overflow(value, a.denominator / shared, &right)) {
        return std::nullopt;
    }
    step.numerator = std::gcd(left, right);
    std::int64_t const lowest = std::max<std::int64_t>(std::gcd(step.numerator, step.denominator), 1);
    return Fraction{step.numerator / lowest, step.denominator / lowest};
}

} // namespace

DocumentFile readDocumentFile(std::string const& file, Tempus const& frameDuration,
                              ReadingProgress const& progress) {
    BXXMLReadStream stream{BXURL(file)};
    std::error_code unknown;
    tellProgress(stream, std::filesystem::file_size(file, unknown), unknown ? ReadingProgress() : progress);
    return readDocument(stream, file, frameDuration);
}

DocumentFile readDocumentText(std::string_view text, std::string const& file, Tempus const& frameDuration,
                              ReadingProgress const& progress) {
    BXXMLReadStream stream(
        std::span<std::uint8_t const>(reinterpret_cast<std::uint8_t const*>(text.data()), text.size()));
    tellProgress(stream, text.size(), progress);
    return readDocument(stream, file, frameDuration);
}

bool looksLikeDocument(std::string_view text) {
    for (std::string_view const mark : {"\xEF\xBB\xBF", "\xFF\xFE", "\xFE\xFF"}) {
        if (text.starts_with(mark)) {
            text.remove_prefix(mark.size());
            break;
        }
    }
    std::size_t const first = text.find_first_not_of(std::string_view(" \t\r\n\0", 5));
    return first != std::string_view::npos && text[first] == '<';
}

Tempus frameDurationOfKeypoints(ChannelTree const& tree) {
    constexpr double longest = 1.0 / 12;
    constexpr double shortest = 1.0 / 1000;
    Fraction step;
    for (ChannelTree::Node const node : tree.channelsBelow(ChannelTree::kTop)) {
        KFSpline* const spline = tree.spline(node);
        if (spline == nullptr) {
            continue;
        }
        for (void* const handle : keypointHandles(*spline)) {
            Tempus time{};
            double value = 0;
            spline->getVertex(handle, &time, &value, kTempusZero);
            std::optional<Fraction> const common =
                TempusIsNumeric(time) ? commonStep(step, time) : std::nullopt;
            if (!common) {
                return defaultFrameDuration();
            }
            step = *common;
            double const seconds =
                static_cast<double>(step.numerator) / static_cast<double>(step.denominator);
            if (step.numerator != 0 && seconds < shortest) {
                return defaultFrameDuration();
            }
        }
    }
    double const seconds = static_cast<double>(step.numerator) / static_cast<double>(step.denominator);
    bool const isFrame = step.numerator > 0 && seconds <= longest &&
                         step.denominator <= std::numeric_limits<std::int32_t>::max();
    return isFrame ? TempusMake(step.numerator, static_cast<std::int32_t>(step.denominator))
                   : defaultFrameDuration();
}

} // namespace lumenkey::tools
