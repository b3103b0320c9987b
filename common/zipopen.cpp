#include <common/zipopen.h>

#include <common/bundle_api.h>
#include <common/library_path.h>
#include <file/file.h>

#include <algorithm>
#include <array>
#include <atomic>
#include <climits>
#include <cstdlib>
#include <memory>
#include <new>

namespace {

constexpr std::size_t kMaxPathLength = 4095;

std::atomic<BundleApi::ModuleHandle*> zipModule = nullptr;

void CloseZipModule()
{
    if (BundleApi::ModuleHandle* const module = zipModule.exchange(nullptr)) BundleApi::CloseModule(module);
}

class SIFileWrapper final : public si_file {
public:
    explicit SIFileWrapper(BundleApi::FileHandle* file) : handle(file) {}
    ~SIFileWrapper() override { BundleApi::CloseFile(handle); }

    void Read(void* buffer, std::uint64_t size, std::uint64_t& count) override
    {
        count = 0;
        if (error) return;
        unsigned read = 0;
        bool const good = BundleApi::ReadFile(
            handle, buffer, static_cast<unsigned>(std::min<std::uint64_t>(size, UINT_MAX)), &read);
        count = read;
        if (!good) SetError(Common::ErrorReadFailed, MessageReadFailed, "Read", 74);
    }

    void Rewind() override
    {
        if (error || BundleApi::RewindFile(handle)) return;
        SetError(Common::ErrorSeekFailed, MessageSeekFailed, "Rewind", 59);
    }

    std::uint64_t Size() override
    {
        unsigned long long size = 0;
        if (error || BundleApi::GetFileSize(handle, &size)) return size;
        SetError(Common::ErrorReadFailed, MessageReadFailed, "Size", 66);
        return 0;
    }

private:
    /// What the archive's own library has to say about the failure comes before what is known here.
    void SetError(unsigned code, MessageKey key, char const* function, unsigned line)
    {
        Common::Error const known(
            code, GetMessage(key), Common::LocationOf("common/zipopen", function, line));
        unsigned size = 0;
        std::unique_ptr<unsigned char[]> const chain(BundleApi::GetFileError(handle, &size));
        error = chain != nullptr ? Common::ParseErrorChain(chain.get(), size) : known;
    }

    BundleApi::FileHandle* const handle;
};

}

si_file* ZipOpen(char const* name)
{
    BundleApi::FileHandle* const handle = BundleApi::OpenFile(GetZipModule(), name, nullptr);
    if (handle == nullptr) return nullptr;
    auto* const file = new (std::nothrow) SIFileWrapper(handle);
    if (file == nullptr) BundleApi::CloseFile(handle);
    return file;
}

unsigned char* ZipLoad(char const* name, unsigned int* size)
{
    return BundleApi::LoadFile(GetZipModule(), name, nullptr, size);
}

BundleApi::ModuleHandle* GetZipModule()
{
    if (BundleApi::ModuleHandle* const module = zipModule) return module;
    // Whatever this gives is dropped: only what stands in zipModule counts.
    BundleApi::OpenModule(nullptr);
    if (BundleApi::ModuleHandle* const module = zipModule) return module;

    std::array<unsigned short, kMaxPathLength + 1> path{};
    char const* const bytes = GetLibraryPath();
    for (std::size_t i = 0; i < kMaxPathLength && bytes[i] != 0; ++i)
        path[i] = static_cast<unsigned char>(bytes[i]);
    BundleApi::ModuleHandle* const module = BundleApi::OpenModule(path.data());
    if (module == nullptr) return nullptr;

    BundleApi::ModuleHandle* first = nullptr;
    if (!zipModule.compare_exchange_strong(first, module)) {
        BundleApi::CloseModule(module);
        return first;
    }
    [[maybe_unused]] static int const registered = std::atexit(CloseZipModule);
    return module;
}
