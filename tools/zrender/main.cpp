// zrender: the command-line host of libZRrender. It builds the sample scene, renders it with
// RsRenderer into an 8-bit RGBA tile, and writes the picture as a PNG or compares it with a
// reference picture.
#include <exception>
#include <iostream>
#include <string>
#include <vector>

#include "exBase.h"
#include "ixTile.h"
#include "ixWriteGuard.h"
#include "rsRenderer.h"
#include "zrCommandLine.h"
#include "zrImage.h"
#include "zrInfoReport.h"
#include "zrPngFile.h"
#include "zrSampleScene.h"

namespace {

using namespace Zr;

// The sample scene as the command line asks for it.
ZrImage renderSample(const ZrCommandLine& commandLine) {
    RCShdPtr<RsRenderer> renderer = makeShared<RsRenderer>();
    renderer->setZBuffer(commandLine.zBuffer);
    renderer->setFillColor(commandLine.fill);

    const GeRectangle<int> rectangle{0, commandLine.width, 0, commandLine.height};
    IxTile tile(IxPixelFormat(IxPixelFormat::RGBA, IxPixelFormat::UINT8), rectangle, {0.0f, 0.0f, 0.0f, 0.0f});
    renderer->render(ZrSampleScene::makeCamera(commandLine.width, commandLine.height), ZrSampleScene::makeScene(),
                     rectangle, IxWriteGuard(tile));
    return ZrImage::fromTile(tile);
}

// Writes and compares as asked; the exit status.
int run(const ZrCommandLine& commandLine) {
    const ZrImage picture = renderSample(commandLine);
    if (commandLine.compare.empty() || commandLine.outputGiven) ZrPngFile::write(commandLine.output, picture);
    if (commandLine.compare.empty()) return 0;

    const ZrImage::Difference difference = ZrImage::compare(picture, ZrPngFile::read(commandLine.compare));
    std::cout << commandLine.compare << ": " << difference << '\n';
    return difference.any() ? 1 : 0;
}

}  // namespace

int main(int argc, char** argv) {
    const std::string programName = argc > 0 ? argv[0] : "zrender";
    const std::vector<std::string> arguments(argv + (argc > 0 ? 1 : 0), argv + argc);

    ZrCommandLine commandLine;
    std::string error;
    if (!ZrCommandLine::parse(arguments, commandLine, error)) {
        std::cerr << programName << ": " << error << '\n';
        ZrCommandLine::printUsage(std::cerr, programName);
        return 2;
    }
    if (commandLine.help) {
        ZrCommandLine::printUsage(std::cout, programName);
        return 0;
    }

    try {
        if (commandLine.info) {
            ZrInfoReport::print(std::cout);
            return 0;
        }
        return run(commandLine);
    } catch (const ExBase& e) {
        std::cerr << programName << ": " << e.what() << '\n';
        return 1;
    } catch (const std::exception& e) {
        std::cerr << programName << ": " << e.what() << '\n';
        return 1;
    }
}
