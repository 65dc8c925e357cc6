#include "zrCommandLine.h"

#include <functional>
#include <iomanip>

namespace Zr {

namespace {

struct OptionSpec {
    const char* name;
    const char* valueName;  // null for a flag; otherwise the option takes the next argument
    const char* help;
    std::function<bool(ZrCommandLine&, const std::string& value, std::string& error)> apply;
};

const std::vector<OptionSpec>& optionTable() {
    static const std::vector<OptionSpec> table = {
        {"--help", nullptr, "print this help and exit",
         [](ZrCommandLine& c, const std::string&, std::string&) { return c.help = true; }},
        {"--info", nullptr, "print the library's package records and build record",
         [](ZrCommandLine& c, const std::string&, std::string&) { return c.info = true; }},
    };
    return table;
}

}  // namespace

bool ZrCommandLine::parse(const std::vector<std::string>& arguments, ZrCommandLine& result,
                          std::string& error) {
    for (std::size_t i = 0; i < arguments.size(); ++i) {
        const std::string& argument = arguments[i];
        const OptionSpec* spec = nullptr;
        for (const OptionSpec& s : optionTable()) {
            if (argument == s.name) spec = &s;
        }
        if (!spec) {
            error = "unknown option: " + argument;
            return false;
        }
        std::string value;
        if (spec->valueName) {
            if (i + 1 >= arguments.size()) {
                error = std::string("option ") + spec->name + " needs a value " + spec->valueName;
                return false;
            }
            value = arguments[++i];
        }
        if (!spec->apply(result, value, error)) return false;
    }
    return true;
}

void ZrCommandLine::printUsage(std::ostream& os, const std::string& programName) {
    os << "usage: " << programName << " [options]\n"
       << "With no options, prints the library's records as --info does.\n\noptions:\n";
    for (const OptionSpec& s : optionTable()) {
        std::string left = s.name;
        if (s.valueName) left += std::string(" ") + s.valueName;
        os << "  " << std::left << std::setw(24) << left << s.help << '\n';
    }
}

}  // namespace Zr
