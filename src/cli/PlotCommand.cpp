// rcvrchar plot FILE -o OUT.svg|OUT.png: draws a stored characterization without a display.

#include <iostream>
#include <memory>

#include "cli/CommandRegistry.h"

#if RCVRCHAR_WITH_QT
#include "frontends/qt/PlotRenderer.h"
#endif

namespace {

struct PlotOptions {
    std::string input;
    std::string output;
    std::string view = "power";
    int width = 1000;
    int height = 600;
};

cli::CommandRegistration registration("plot", [](CLI::App& app) -> std::function<int()> {
    app.description(
        "Draw a characterization (image data file or export text file) as an SVG or PNG chart");
    auto options = std::make_shared<PlotOptions>();
    app.add_option("file", options->input, "Image data file or export text file")->required();
    app.add_option("-o,--output", options->output, "Output file, .svg or .png")->required();
    app.add_option("--view", options->view, "power (default) or phase");
    app.add_option("--width", options->width, "Width in pixels")->check(CLI::PositiveNumber);
    app.add_option("--height", options->height, "Height in pixels")->check(CLI::PositiveNumber);
    return [options]() -> int {
#if RCVRCHAR_WITH_QT
        qtui::OffscreenApplicationScope scope;
        qtui::plotCharacterizationFile(options->input, options->output,
                                       qtui::chartViewFromName(options->view),
                                       QSize(options->width, options->height));
        std::cout << "Wrote " << options->output << "\n";
        return 0;
#else
        std::cerr << "rcvrchar was built without the Qt front end; plot is not available\n";
        return 1;
#endif
    };
});

}  // namespace
