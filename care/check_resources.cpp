#include <care/finding.h>

#include <common/bundle_api.h>
#include <tessella/session.h>

#include <memory>
#include <string_view>
#include <vector>

#include <dlfcn.h>

namespace care {

namespace {

constexpr char kPart[] = "resources";
constexpr char kMend[] =
    "Install the library again; if it was stripped or packed by hand, keep its section .zip.";

/// The file of the library that programs get.
std::string LibraryPath()
{
    Dl_info info{};
    return dladdr(reinterpret_cast<void*>(&GrInit), &info) != 0 ? info.dli_fname : "";
}

struct Needed {
    char const* file;
    Severity severity;
    char const* without;
};

constexpr Needed kNeeded[] = {
    {"glyphset.cgf", Severity::Unusable, "the built-in font"},
    {"fonts.xml", Severity::Limits, "the table of fonts"},
    {"Nimbus_Sans.afm", Severity::Limits, "a scalable font"},
    {"Nimbus_Sans_Bold.afm", Severity::Limits, "a scalable font"},
    {"keyboard.kbd", Severity::Limits, "the key layouts"},
};

}

void CheckResources(Findings& findings)
{
    std::string const path = LibraryPath();
    std::vector<unsigned short> wide(path.begin(), path.end());
    for (unsigned short& unit : wide)
        unit &= 0xFF;
    wide.push_back(0);
    std::unique_ptr<BundleApi::ModuleHandle, void (*)(BundleApi::ModuleHandle*)> const module(
        BundleApi::OpenModule(wide.data()), BundleApi::CloseModule);
    if (module == nullptr) {
        findings.push_back(
            {kPart, Severity::Unusable, path + " has no archive of resources, or a damaged one", kMend});
        return;
    }
    std::size_t const before = findings.size();
    for (auto const& [file, severity, without] : kNeeded) {
        unsigned size = 0;
        // A whole load compares the checksum.
        std::unique_ptr<unsigned char[]> const data(BundleApi::LoadFile(module.get(), file, nullptr, &size));
        if (data == nullptr || size == 0)
            findings.push_back({kPart, severity,
                std::string(file) + " is missing in " + path + " or damaged: programs run without " + without,
                kMend});
    }
    if (findings.size() == before)
        findings.push_back({kPart, Severity::Fine, "the archive in " + path + " is whole", {}});
}

}
