// Any bytes of an ELF file with an archive in it: opening and reading go well, or say what went wrong.
#include <common/bundle_api.h>

#include <common/error.h>

#include <memory>
#include <string>
#include <sys/mman.h>
#include <unistd.h>

namespace {

/// What a file gives until it fails: no more than its size, and a record if it does.
void ReadFile(BundleApi::FileHandle* file)
{
    constexpr unsigned kStep = 4096;
    unsigned char buffer[kStep];
    unsigned long long size = 0, total = 0;
    bool good = BundleApi::GetFileSize(file, &size);
    for (unsigned read = 1; good && read > 0; total += read)
        good = BundleApi::ReadFile(file, buffer, kStep, &read);
    if (good && total != size) __builtin_trap();
    if (good) good = BundleApi::RewindFile(file);
    unsigned errorSize = 0;
    std::unique_ptr<unsigned char[]> const error(BundleApi::GetFileError(file, &errorSize));
    if (good != (Common::ParseErrorChain(error.get(), errorSize).info == nullptr)) __builtin_trap();
}

}

extern "C" int LLVMFuzzerTestOneInput(unsigned char const* data, std::size_t size)
{
    static int const file = memfd_create("archive", 0);
    static std::string const path = "/proc/self/fd/" + std::to_string(file);
    if (ftruncate(file, 0) != 0 || pwrite(file, data, size, 0) != static_cast<ssize_t>(size)) return 0;
    BundleApi::SetLanguage("de");
    std::basic_string<unsigned short> const units(path.begin(), path.end());
    BundleApi::ModuleHandle* const module = BundleApi::OpenModule(units.c_str());
    for (char const* const name : {"a", "b"}) {
        BundleApi::FileHandle* const opened = BundleApi::OpenFile(module, name, nullptr);
        if (opened != nullptr) ReadFile(opened);
        BundleApi::CloseFile(opened);
        unsigned loaded = 0;
        delete[] BundleApi::LoadFile(module, name, nullptr, &loaded);
    }
    BundleApi::CloseModule(module);
    return 0;
}
