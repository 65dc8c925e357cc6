#include "libraryBuildInfo.h"

#include <cstring>

namespace Zr {

namespace {

// The compiler's date of this file, "Mmm dd yyyy": the library's build date.
constexpr const char* buildDate = __DATE__;

int yearOf(const char* date) {
    const std::size_t length = std::strlen(date);
    int year = 0;
    for (std::size_t i = length >= 4 ? length - 4 : 0; i < length; ++i) {
        if (date[i] >= '0' && date[i] <= '9') year = year * 10 + (date[i] - '0');
    }
    return year;
}

}  // namespace

std::string LibraryBuildInfo::getProductTitle() const { return "ZR Render"; }
std::string LibraryBuildInfo::getLibraryName() const { return "libZrrender"; }
std::string LibraryBuildInfo::getLibraryVersion() const { return "0.1.0"; }
int LibraryBuildInfo::getYear() const { return yearOf(buildDate); }
int LibraryBuildInfo::getRevision() const { return 0; }
int LibraryBuildInfo::getBuildNumber() const { return 1; }
std::string LibraryBuildInfo::getBuildDate() const { return buildDate; }
std::string LibraryBuildInfo::getBuildConfiguration() const { return "opt.x86_32.intel"; }

}  // namespace Zr
