#include "tools/cli/Verbs.h"

#include "lumenkey/Channels/KFChannel.h"
#include "lumenkey/Channels/KFFactories.h"
#include "lumenkey/Channels/KFFactory.h"
#include "tools/output/JsonWriter.h"
#include "tools/output/Table.h"
#include "tools/output/TextForms.h"
#include "tools/tree/ChannelClass.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <memory>
#include <optional>
#include <utility>

namespace lumenkey::tools {

namespace {

/// A class of the library, as the verb tells it.
struct TypeRow {
    std::string className;
    std::string uuid;
    std::string superClass;
    /// Of a class of value channels.
    std::optional<std::pair<double, double>> limits;
    bool canBeMade = false;
};

TypeRow rowOf(KFFactory& factory) {
    TypeRow row{classNameOf(factory), factory.uuid().text(), {}, {}, false};
    if (KFFactory const* const super = factory.getSuperFactory()) {
        row.superClass = classNameOf(*super);
    }
    std::unique_ptr<KFChannelBase> const example = exampleOf(&factory);
    row.canBeMade = example != nullptr;
    if (example != nullptr && example->isValueChannel()) {
        auto const& channel = static_cast<KFChannel const&>(*example);
        row.limits = {channel.getMin(), channel.getMax()};
    }
    return row;
}

std::vector<TypeRow> allTypes() {
    std::vector<TypeRow> rows;
    for (auto const& [uuid, factory] : KFFactories::getInstance().factories()) {
        rows.push_back(rowOf(*factory));
    }
    std::sort(rows.begin(), rows.end(),
              [](TypeRow const& a, TypeRow const& b) { return a.className < b.className; });
    return rows;
}

void writeJson(std::vector<TypeRow> const& rows, OutputSink& out) {
    JsonWriter json(out);
    json.beginObject();
    json.key("types");
    json.beginArray();
    for (TypeRow const& row : rows) {
        json.beginObject(JsonLayout::Inline);
        json.key("name");
        json.string(shortClassName(row.className));
        json.key("class");
        json.string(row.className);
        json.key("uuid");
        json.string(row.uuid);
        json.key("superclass");
        json.string(row.superClass);
        if (row.limits) {
            json.key("least");
            json.number(row.limits->first);
            json.key("greatest");
            json.number(row.limits->second);
        }
        json.endObject();
    }
    json.endArray();
    json.endObject();
    json.finish();
}

std::string limitText(TypeRow const& row, bool isLeast) {
    if (!row.limits) {
        return row.canBeMade ? "" : "none is made";
    }
    double const limit = isLeast ? row.limits->first : row.limits->second;
    constexpr double endless = 1e300;
    return limit > endless || limit < -endless ? "-" : shortestText(limit);
}

void writeTable(std::vector<TypeRow> const& rows, OutputSink& out) {
    Table table;
    table.columns = {{"name"}, {"UUID"}, {"superclass"}, {"least", Align::Right}, {"greatest", Align::Right}};
    table.rowCount = rows.size();
    table.cell = [&rows](std::size_t i, std::size_t column) -> std::string {
        TypeRow const& row = rows[i];
        switch (column) {
        case 0:
            return shortClassName(row.className);
        case 1:
            return row.uuid;
        case 2:
            return row.superClass.empty() ? "" : shortClassName(row.superClass);
        case 3:
            return limitText(row, true);
        default:
            return row.canBeMade ? limitText(row, false) : "";
        }
    };
    table.write(out);
}

} // namespace

Verb declareTypes(CLI::App& program) {
    auto const json = std::make_shared<bool>(false);
    CLI::App* const verb = program.add_subcommand("types", "List the classes of channels");
    verb->add_flag("--json", *json, "For programs, with the names of the library's classes");
    verb->footer("A dash is a value without a limit. Folders and compounds have no values of their own.\n\n"
                 "Example: lumenkey types");
    return {verb, "[--json]",
            [json](OutputSink& out) { *json ? writeJson(allTypes(), out) : writeTable(allTypes(), out); }};
}

} // namespace lumenkey::tools
