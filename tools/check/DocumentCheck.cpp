#include "tools/check/DocumentCheck.h"

#include "lumenkey/Channels/KFChannel.h"
#include "lumenkey/Channels/KFChannelFactories.h"
#include "lumenkey/Channels/KFChannelFolder.h"
#include "lumenkey/Channels/KFFactories.h"
#include "lumenkey/curves/KFCurve.h"
#include "tools/check/DocumentVocabulary.h"
#include "tools/curve/Keypoint.h"
#include "tools/import/InputError.h"
#include "tools/output/TextForms.h"
#include "tools/time/TimeFraction.h"
#include "tools/tree/ChannelClass.h"

#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <exception>
#include <expat.h>
#include <limits>
#include <map>
#include <memory>
#include <optional>
#include <set>
#include <utility>

namespace lumenkey::tools {

namespace {

using Attributes = std::map<std::string_view, std::string_view>;

struct Limits {
    double low = std::numeric_limits<double>::lowest();
    double high = std::numeric_limits<double>::max();
};

/// An element that is open.
struct OpenElement {
    std::string name;
    DocumentWord const* word = nullptr;
    std::uint64_t line = 0;
    std::uint64_t column = 0;
    std::string text;
    /// Of a channel: its class, or null; and the IDs of its children so far.
    KFFactory* factory = nullptr;
    std::set<std::uint64_t> ids;
    /// Of a curve.
    Limits limits;
    Tempus lastTime = kTempusInvalid;
};

/// The check of one document, as its parser calls it.
class Checker {
public:
    explicit Checker(std::string const& file) : _file(file) {
        OpenElement outside;
        _open.push_back(std::move(outside));
    }

    std::vector<DocumentFinding> run() {
        std::unique_ptr<std::FILE, int (*)(std::FILE*)> const stream(std::fopen(_file.c_str(), "rbe"),
                                                                     &std::fclose);
        if (!stream) {
            throw InputError{_file, 1, 1, systemErrorText(errno)};
        }
        _parser = XML_ParserCreate(nullptr);
        std::unique_ptr<XML_ParserStruct, void (*)(XML_Parser)> const owner(_parser, &XML_ParserFree);
        if (!owner) {
            throw std::bad_alloc();
        }
        XML_SetUserData(_parser, this);
        XML_SetElementHandler(
            _parser,
            [](void* self, char const* name, char const** pairs) {
                guard(self, [&](Checker& checker) { checker.start(name, pairs); });
            },
            [](void* self, char const*) { guard(self, [](Checker& checker) { checker.end(); }); });
        XML_SetCharacterDataHandler(_parser, [](void* self, char const* text, int size) {
            guard(self, [&](Checker& checker) { checker.text({text, static_cast<std::size_t>(size)}); });
        });
        XML_SetStartDoctypeDeclHandler(_parser, [](void* self, char const*, char const*, char const*, int) {
            guard(self, [](Checker& checker) { checker.refuseType(); });
        });
        feed(*stream);
        if (_thrown) {
            std::rethrow_exception(_thrown);
        }
        return std::move(_findings);
    }

private:
    /// Nothing may be thrown through the parser, which is written in C.
    template <class Work> static void guard(void* self, Work const& work) {
        auto& checker = *static_cast<Checker*>(self);
        if (checker._isStopped) {
            return;
        }
        try {
            work(checker);
        } catch (...) {
            checker._thrown = std::current_exception();
            checker.stop();
        }
    }

    void stop() {
        _isStopped = true;
        XML_StopParser(_parser, XML_FALSE);
    }

    void feed(std::FILE& stream) {
        constexpr int block = 65'536;
        for (bool isLast = false; !isLast && !_isStopped;) {
            void* const room = XML_GetBuffer(_parser, block);
            if (room == nullptr) {
                throw std::bad_alloc();
            }
            std::size_t const got = std::fread(room, 1, block, &stream);
            if (std::ferror(&stream) != 0) {
                throw InputError{_file, 1, 1, systemErrorText(errno)};
            }
            isLast = got < block;
            if (XML_ParseBuffer(_parser, static_cast<int>(got), isLast) != XML_STATUS_OK) {
                if (!_isStopped) {
                    find(XML_ErrorString(XML_GetErrorCode(_parser)));
                }
                return;
            }
        }
    }

    // --- Findings ---

    void findAt(std::uint64_t line, std::uint64_t column, std::string what) {
        _findings.push_back({line, column, std::move(what)});
    }
    void find(std::string what) {
        findAt(XML_GetCurrentLineNumber(_parser), XML_GetCurrentColumnNumber(_parser) + 1, std::move(what));
    }
    void findAt(OpenElement const& element, std::string what) {
        findAt(element.line, element.column, std::move(what));
    }

    void refuseType() {
        find("a document type declaration, which is refused");
        stop();
    }

    // --- Elements ---

    void start(char const* name, char const** pairs) {
        if (_skipped > 0) {
            ++_skipped;
            return;
        }
        Attributes attributes;
        for (char const** pair = pairs; *pair != nullptr; pair += 2) {
            attributes.emplace(pair[0], pair[1]);
        }
        OpenElement element;
        element.name = name;
        element.line = XML_GetCurrentLineNumber(_parser);
        element.column = XML_GetCurrentColumnNumber(_parser) + 1;
        element.word = documentWord(_open.back().name, name);
        if (!isTaken(element) || !isSound(element, attributes)) {
            _skipped = 1;
            return;
        }
        _open.push_back(std::move(element));
    }

    bool isTaken(OpenElement const& element) {
        if (element.word == nullptr) {
            findAt(element, "the element '" + element.name + "' is unknown here: it is passed over");
            return false;
        }
        KFFactory* const factory = _open.back().factory;
        if (element.word->parent == "parameter" && factory != nullptr &&
            (element.word->classes & classesOf(factory)) == 0) {
            findAt(element, "the element '" + element.name + "' is none of a channel of the class " +
                                shortClassName(classNameOf(*factory)) + ": it is passed over");
            return false;
        }
        return true;
    }

    static unsigned classesOf(KFFactory* factory) {
        if (factory->isKindOfClass(KFChannelObjectRootBase_Factory::getInstance().uuid())) {
            return kOfRoots;
        }
        return factory->isKindOfClass(KFChannelFolder_Factory::getInstance().uuid()) ? kOfFolders : kOfValues;
    }

    bool isSound(OpenElement& element, Attributes const& attributes) {
        if (element.name == "kfml" || element.name == "kfdoc") {
            std::string_view const version = attributeOf(attributes, "version");
            std::optional<std::uint64_t> const major = readWhole(version.substr(0, version.find('.')));
            constexpr std::uint64_t firstWithTimes = 5;
            _countsFrames = major && *major < firstWithTimes;
        } else if (element.name == "factory") {
            checkFactory(element, attributes);
        } else if (element.name == "parameter") {
            return isSoundChannel(element, attributes);
        } else if (element.name == "curve") {
            checkCurve(element, attributes);
        } else if (element.name == "keypoint") {
            checkKeypoint(element, attributes);
        }
        return true;
    }

    static std::string_view attributeOf(Attributes const& attributes, std::string_view name) {
        auto const found = attributes.find(name);
        return found == attributes.end() ? std::string_view() : found->second;
    }

    void checkFactory(OpenElement const& element, Attributes const& attributes) {
        std::optional<std::uint64_t> const number = readWhole(attributeOf(attributes, "id"));
        std::string const uuidText(attributeOf(attributes, "uuid"));
        BXUUID uuid;
        if (!number || !BXUUID::fromText(uuidText, &uuid)) {
            findAt(element, "a factory needs an 'id', which is a whole number, and a 'uuid'");
            return;
        }
        KFFactory* const factory = KFFactories::getInstance().findFactory(uuid);
        _factories[*number] = factory;
        if (factory == nullptr) {
            findAt(element, "the class " + uuidText + " is unknown: its channels are passed over");
        }
    }

    bool isSoundChannel(OpenElement& element, Attributes const& attributes) {
        OpenElement& above = _open.back();
        std::string const name = "the channel '" + std::string(attributeOf(attributes, "name")) + "'";
        std::uint64_t const id = readWhole(attributeOf(attributes, "id")).value_or(0);
        if (!above.ids.insert(id).second) {
            findAt(element, name + " has the ID " + std::to_string(id) +
                                " of one before it: it is read into that one");
        }
        std::optional<std::uint64_t> const number = readWhole(attributeOf(attributes, "factoryID"));
        if (KFFactory* const component = componentOf(above.factory, id)) {
            element.factory = component;
        } else if (number) {
            auto const found = _factories.find(*number);
            element.factory = found == _factories.end() ? nullptr : found->second;
            if (element.factory == nullptr) {
                findAt(element,
                       name + " is of factory " + std::to_string(*number) +
                           (found == _factories.end() ? ", which isn't listed" : ", which is unknown") +
                           ": it is passed over");
                return false;
            }
        } else if (above.word != nullptr && above.word->name == "parameter") {
            findAt(element, name + " names no class: it is passed over");
            return false;
        } else {
            element.factory = &KFChannelObjectRootBase_Factory::getInstance();
        }
        return true;
    }

    /// The class of the child with that ID which a class makes for itself.
    static KFFactory* componentOf(KFFactory* factory, std::uint64_t id) {
        std::unique_ptr<KFChannelBase> const example = exampleOf(factory);
        auto const* const folder = dynamic_cast<KFChannelFolder const*>(example.get());
        KFChannelBase const* const component =
            folder == nullptr ? nullptr : folder->getDescendant(static_cast<unsigned>(id));
        return component == nullptr ? nullptr : component->getFactory();
    }

    // --- Curves ---

    void checkCurve(OpenElement& element, Attributes const& attributes) {
        std::unique_ptr<KFChannelBase> const example = exampleOf(_open.back().factory);
        if (example != nullptr && example->isValueChannel()) {
            KFCurve& curve = *static_cast<KFChannel&>(*example).getCurveInterface();
            curve.getAbsoluteMinValueV(&element.limits.low);
            curve.getAbsoluteMaxValueV(&element.limits.high);
        }
        for (std::string_view const name : {"value", "default"}) {
            if (attributes.contains(name)) {
                checkNumber(element, attributeOf(attributes, name), element.limits);
            }
        }
    }

    void checkNumber(OpenElement const& element, std::string_view text, Limits const& limits) {
        std::optional<double> const value = readNumber(text);
        if (!value) {
            findAt(element, "'" + std::string(text) + "' is no number");
        } else if (*value < limits.low || *value > limits.high) {
            findAt(element, "the value " + shortestText(*value) + " is out of the limits of its curve, " +
                                shortestText(limits.low) + " to " + shortestText(limits.high));
        }
    }

    void checkKeypoint(OpenElement const& element, Attributes const& attributes) {
        if (!attributes.contains("interpolation")) {
            return;
        }
        std::string const text(attributeOf(attributes, "interpolation"));
        std::optional<std::uint64_t> const type = readWhole(text);
        if (!type || interpolationName(static_cast<std::uint32_t>(*type)).starts_with("bezier (")) {
            findAt(element, "the interpolation '" + text + "' is unknown: it counts as Bezier");
        }
    }

    void checkTime(OpenElement const& element, OpenElement& curve) {
        std::optional<double> const frames = readNumber(element.text);
        Tempus time =
            timeFromFraction(std::string_view(element.text).substr(0, element.text.find_first_of("@~")));
        if (_countsFrames) {
            time = frames ? TempusMake(1, 1) * *frames : kTempusInvalid;
        }
        if (TempusIsNumeric(time) && TempusIsNumeric(curve.lastTime) && time < curve.lastTime) {
            findAt(element, "the keypoint lies before the one in front of it");
        }
        curve.lastTime = time;
    }

    // --- Texts ---

    void text(std::string_view more) {
        if (_skipped == 0 && _open.back().word != nullptr && _open.back().word->text != TextKind::None) {
            _open.back().text += more;
        }
    }

    void end() {
        if (_skipped > 0) {
            --_skipped;
            return;
        }
        OpenElement const element = std::move(_open.back());
        _open.pop_back();
        if (!canBeRead(element.text, element.word->text, _countsFrames)) {
            findAt(element, "'" + element.text + "' is " + std::string(nameOfTextKind(element.word->text)));
            return;
        }
        bool const isWhole =
            element.word->text == TextKind::Whole32 || element.word->text == TextKind::Whole64;
        if (isWhole && readWhole(element.text).value_or(0) > element.word->greatest) {
            findAt(element, "the number " + element.text + " is out of the limits of '" + element.name +
                                "', 0 to " + std::to_string(element.word->greatest));
        } else if (element.word->parent == "curve") {
            Limits& limits = _open.back().limits;
            if (element.name == "min") {
                limits.low = *readNumber(element.text);
            } else if (element.name == "max") {
                limits.high = *readNumber(element.text);
            }
        } else if (element.word->parent == "keypoint") {
            OpenElement& curve = _open[_open.size() - 2];
            if (element.name == "value") {
                checkNumber(element, element.text, curve.limits);
            } else if (element.name == "time") {
                checkTime(element, curve);
            }
        }
    }

    std::string const& _file;
    XML_Parser _parser = nullptr;
    bool _isStopped = false;
    std::exception_ptr _thrown;
    bool _countsFrames = false;
    /// How many elements are open in one that is passed over, itself counted.
    std::size_t _skipped = 0;
    std::vector<OpenElement> _open;
    std::map<std::uint64_t, KFFactory*> _factories;
    std::vector<DocumentFinding> _findings;
};

} // namespace

std::vector<DocumentFinding> checkDocument(std::string const& file) {
    std::vector<DocumentFinding> findings = Checker(file).run();
    std::stable_sort(findings.begin(), findings.end(),
                     [](DocumentFinding const& a, DocumentFinding const& b) {
                         return std::pair(a.line, a.column) < std::pair(b.line, b.column);
                     });
    return findings;
}

} // namespace lumenkey::tools
