#include "tools/cli/Verbs.h"

#include "tools/cli/PlotOptions.h"
#include "tools/plot/Gallery.h"

#include <CLI/CLI.hpp>
#include <memory>

namespace lumenkey::tools {

Verb declareGallery(CLI::App& program) {
    auto const output = std::make_shared<std::string>();
    CLI::App* const verb =
        program.add_subcommand("gallery", "Draw every interpolation type and extrapolation mode");
    verb->add_option("-o,--output", *output, "The picture: OUT.svg, OUT.png or OUT.pdf")
        ->option_text("OUT")
        ->required();
    verb->footer("Example: lumenkey gallery -o gallery.svg");
    return {verb, "-o OUT.svg|png|pdf", [output](OutputSink&) {
                PlotCanvas canvas(requirePlotFormat(*output), kGalleryWidth, kGalleryHeight);
                drawGallery(canvas);
                canvas.save(*output);
            }};
}

} // namespace lumenkey::tools
