#include "tools/import/CsvTree.h"

#include <cmath>
#include <filesystem>

namespace lumenkey::tools {

std::unique_ptr<ChannelTree> treeOfCsv(CsvFile const& table) {
    auto tree =
        std::make_unique<ChannelTree>(std::filesystem::path(table.file).stem().string(), rowDuration(table));
    std::vector<Tempus> times;
    std::vector<double> values;
    std::size_t const width = table.names.size();
    for (std::size_t column = 0; column < width; ++column) {
        times.clear();
        values.clear();
        for (std::size_t row = 0; row < table.times.size(); ++row) {
            double const value = table.values[row * width + column];
            if (!std::isnan(value)) { // an empty cell
                times.push_back(table.times[row]);
                values.push_back(value);
            }
        }
        ChannelTree::Node const channel =
            tree->addChannel(ChannelTree::kTop, table.names[column], ValueType::Double);
        tree->setKeypoints(channel, times, values);
    }
    bool const isEmpty = table.times.empty();
    tree->finish(isEmpty ? BXTimeRange{kTempusZero, kTempusZero}
                         : BXTimeRange{table.times.front(), table.times.back() - table.times.front()});
    return tree;
}

Tempus rowDuration(CsvFile const& table) {
    std::vector<Tempus> const& times = table.times;
    if (times.size() < 2) {
        return kTempusInvalid;
    }
    Tempus const first = times[1] - times[0];
    for (std::size_t row = 1; row < times.size(); ++row) {
        Tempus const duration = times[row] - times[row - 1];
        if (TempusHasBeenRounded(duration) || duration != first) {
            return kTempusInvalid;
        }
    }
    return TempusReduced(first);
}

} // namespace lumenkey::tools
