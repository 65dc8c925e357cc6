// zrender: the command-line host of libZRrender.
#include <exception>
#include <iostream>
#include <string>
#include <vector>

#include "exBase.h"
#include "zrCommandLine.h"
#include "zrInfoReport.h"

int main(int argc, char** argv) {
    using namespace Zr;
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
        // With nothing else asked for, the records are what there is to show.
        if (commandLine.info || arguments.empty()) ZrInfoReport::print(std::cout);
    } catch (const ExBase& e) {
        std::cerr << programName << ": " << e.what() << '\n';
        return 1;
    } catch (const std::exception& e) {
        std::cerr << programName << ": " << e.what() << '\n';
        return 1;
    }
    return 0;
}
