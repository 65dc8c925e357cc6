#pragma once
// The command line of zrender: a table of options, each with its help text, parsed into one
// ZrCommandLine. A new option is one entry in the table in zrCommandLine.cpp and one member here.
#include <ostream>
#include <string>
#include <vector>

namespace Zr {

struct ZrCommandLine {
    bool help = false;
    bool info = false;

    // Fills a ZrCommandLine from the arguments after the program name. Answers false and sets
    // error for an unknown option or a missing value.
    static bool parse(const std::vector<std::string>& arguments, ZrCommandLine& result,
                      std::string& error);
    // The usage text with one line per option.
    static void printUsage(std::ostream& os, const std::string& programName);
};

}  // namespace Zr
