#pragma once
// The command line of zrender: a table of options, each with its help text, parsed into one
// ZrCommandLine. A new option is one entry in the table in zrCommandLine.cpp and one member here.
#include <ostream>
#include <string>
#include <vector>

#include "coRgbaColorTyped.h"

namespace Zr {

struct ZrCommandLine {
    bool help = false;
    bool info = false;
    // Where the picture goes; empty with --compare unless -o is given too.
    std::string output = "zrender.png";
    bool outputGiven = false;
    // A reference picture to compare the rendering with, exactly.
    std::string compare;
    int width = 640;
    int height = 480;
    bool zBuffer = true;
    // Straight colour of the pixels that no surface covers: a dark blue-grey, opaque.
    CoRgbaColorTyped<float> fill{0.16f, 0.18f, 0.23f, 1.0f};

    // Fills a ZrCommandLine from the arguments after the program name. Answers false and sets
    // error for an unknown option, a missing value or a value that does not parse.
    static bool parse(const std::vector<std::string>& arguments, ZrCommandLine& result,
                      std::string& error);
    // The usage text with one line per option.
    static void printUsage(std::ostream& os, const std::string& programName);
};

}  // namespace Zr
