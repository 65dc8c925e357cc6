#include "zrCommandLine.h"

#include <algorithm>
#include <charconv>
#include <functional>
#include <iomanip>

namespace Zr {

namespace {

// The largest picture side accepted: large enough for any screen, small enough that a typing
// slip does not ask for gigabytes.
constexpr int maxSide = 16384;

struct OptionSpec {
    const char* name;
    const char* alias;      // a short form, or null
    const char* valueName;  // null for a flag; otherwise the option takes the next argument
    const char* help;
    std::function<bool(ZrCommandLine&, const std::string& value, std::string& error)> apply;
};

// A whole string as one number of type T; false if anything is left over.
template <class T>
bool parseNumber(const char* first, const char* last, T& value) {
    const std::from_chars_result result = std::from_chars(first, last, value);
    return result.ec == std::errc() && result.ptr == last;
}

bool parseSize(ZrCommandLine& c, const std::string& text, std::string& error) {
    const std::size_t x = text.find('x');
    int width = 0, height = 0;
    if (x == std::string::npos || !parseNumber(text.data(), text.data() + x, width) ||
        !parseNumber(text.data() + x + 1, text.data() + text.size(), height) || width < 1 || height < 1 ||
        width > maxSide || height > maxSide) {
        error = "--size takes WIDTHxHEIGHT, each from 1 to " + std::to_string(maxSide) + ", not " + text;
        return false;
    }
    c.width = width;
    c.height = height;
    return true;
}

bool parseColour(ZrCommandLine& c, const std::string& text, std::string& error) {
    // Three or four numbers between commas; alpha defaults to 1.
    float channels[4] = {0.0f, 0.0f, 0.0f, 1.0f};
    int count = 0;  // numbers read; 0 after a fault
    for (std::size_t start = 0;; start = text.find(',', start) + 1) {
        const std::size_t end = std::min(text.find(',', start), text.size());
        if (count == 4 || !parseNumber(text.data() + start, text.data() + end, channels[count])) {
            count = 0;
            break;
        }
        ++count;
        if (end == text.size()) break;
    }
    if (count < 3) {
        error = "--fill takes r,g,b or r,g,b,a, not " + text;
        return false;
    }
    c.fill = {channels[0], channels[1], channels[2], channels[3]};
    return true;
}

const std::vector<OptionSpec>& optionTable() {
    static const std::vector<OptionSpec> table = {
        {"--help", "-h", nullptr, "print this help and exit",
         [](ZrCommandLine& c, const std::string&, std::string&) { return c.help = true; }},
        {"--info", nullptr, nullptr, "print the library's package records and build record, and exit",
         [](ZrCommandLine& c, const std::string&, std::string&) { return c.info = true; }},
        {"--output", "-o", "FILE", "write the picture to FILE as PNG (default zrender.png)",
         [](ZrCommandLine& c, const std::string& v, std::string&) {
             c.output = v;
             return c.outputGiven = true;
         }},
        {"--size", nullptr, "WxH", "picture size in pixels (default 640x480)", parseSize},
        {"--no-zbuffer", nullptr, nullptr, "no depth test: what is drawn later lies in front",
         [](ZrCommandLine& c, const std::string&, std::string&) {
             c.zBuffer = false;
             return true;
         }},
        {"--fill", nullptr, "R,G,B[,A]",
         "colour where no surface is, straight, 0 to 1 (default 0.16,0.18,0.23,1)", parseColour},
        {"--compare", nullptr, "FILE",
         "compare the picture with the PNG FILE exactly; exit 1 if they differ (writes no picture "
         "unless --output is given)",
         [](ZrCommandLine& c, const std::string& v, std::string&) {
             c.compare = v;
             return true;
         }},
    };
    return table;
}

}  // namespace

bool ZrCommandLine::parse(const std::vector<std::string>& arguments, ZrCommandLine& result,
                          std::string& error) {
    for (std::size_t i = 0; i < arguments.size(); ++i) {
        const std::string& argument = arguments[i];
        const OptionSpec* option = nullptr;
        for (const OptionSpec& s : optionTable()) {
            if (argument == s.name || (s.alias && argument == s.alias)) option = &s;
        }
        if (!option) {
            error = "unknown option: " + argument;
            return false;
        }
        std::string value;
        if (option->valueName) {
            if (i + 1 >= arguments.size()) {
                error = std::string("option ") + option->name + " needs a value " + option->valueName;
                return false;
            }
            value = arguments[++i];
        }
        if (!option->apply(result, value, error)) return false;
    }
    return true;
}

void ZrCommandLine::printUsage(std::ostream& os, const std::string& programName) {
    os << "usage: " << programName << " [options]\n"
       << "Renders the sample scene (a sphere, a torus, a cube and a wire sphere on a chequered\n"
       << "ground, some of them transparent) and writes it as a PNG. With no options it writes\n"
       << "zrender.png at 640x480.\n\noptions:\n";
    for (const OptionSpec& s : optionTable()) {
        std::string left = s.alias ? std::string(s.alias) + ", " + s.name : std::string("    ") + s.name;
        if (s.valueName) left += std::string(" ") + s.valueName;
        os << "  " << std::left << std::setw(26) << left << s.help << '\n';
    }
}

}  // namespace Zr
