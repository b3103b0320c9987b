// Any bytes of an ELF file with an archive in it: a file gives as much as its size says, or tells why not.
#include <common/bundle_api.h>

#include <common/error.h>

#include <memory>
#include <string>
#include <sys/mman.h>
#include <unistd.h>

static void ReadFile(BundleApi::FileHandle* file)
{
    unsigned char buffer[4096];
    unsigned long long size = 0, total = 0;
    bool good = BundleApi::GetFileSize(file, &size);
    for (unsigned read = 1; good && read > 0; total += read)
        good = BundleApi::ReadFile(file, buffer, sizeof buffer, &read);
    if (good && total != size) __builtin_trap();
    good = good && BundleApi::RewindFile(file);
    unsigned errorSize = 0;
    std::unique_ptr<unsigned char[]> const error(BundleApi::GetFileError(file, &errorSize));
    if (good != (Common::ParseErrorChain(error.get(), errorSize).info == nullptr)) __builtin_trap();
}

extern "C" int LLVMFuzzerTestOneInput(unsigned char const* data, std::size_t size)
{
    static int const file = memfd_create("archive", 0);
    static std::string const path = "/proc/self/fd/" + std::to_string(file);
    if (ftruncate(file, 0) != 0 || pwrite(file, data, size, 0) != static_cast<ssize_t>(size)) return 0;
    BundleApi::SetLanguage("de");
    auto* const module =
        BundleApi::OpenModule(std::basic_string<unsigned short>(path.begin(), path.end()).c_str());
    for (char const* const name : {"a", "b"}) {
        auto* const opened = BundleApi::OpenFile(module, name, nullptr);
        if (opened != nullptr) ReadFile(opened);
        BundleApi::CloseFile(opened);
        unsigned loaded = 0;
        delete[] BundleApi::LoadFile(module, name, nullptr, &loaded);
    }
    BundleApi::CloseModule(module);
    return 0;
}
