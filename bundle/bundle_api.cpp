#include <common/bundle_api.h>

#include <bundle/archive.h>
#include <bundle/archive_file.h>

#include <algorithm>
#include <climits>
#include <new>

namespace BundleApi {

namespace {

/// What `work` gives, or `otherwise` where memory doesn't suffice: callers know of no exceptions.
template <class Result, class Work>
Result InMemory(Result otherwise, Work work)
{
    try {
        return work();
    } catch (std::bad_alloc const&) {
        return otherwise;
    }
}

}

struct ModuleHandle {
    std::shared_ptr<Archive> archive;
};

struct FileHandle {
    std::unique_ptr<ArchiveFile> file;
};

ModuleHandle* OpenModule(unsigned short const* path)
{
    return InMemory<ModuleHandle*>(nullptr, [&]() -> ModuleHandle* {
        std::string bytes;
        for (; path != nullptr && *path != 0; ++path) {
            if (*path > UCHAR_MAX) return nullptr;
            bytes += static_cast<char>(*path);
        }
        auto archive = Archive::Open(std::move(bytes));
        return archive != nullptr ? new ModuleHandle{std::move(archive)} : nullptr;
    });
}

void CloseModule(ModuleHandle* module) { delete module; }

FileHandle* OpenFile(ModuleHandle* module, char const* name, char const* variant)
{
    if (module == nullptr || name == nullptr || variant != nullptr) return nullptr;
    return InMemory<FileHandle*>(nullptr, [&] {
        auto entry = module->archive->Find(name);
        auto file = entry ? ArchiveFile::Open(module->archive, std::move(*entry)) : nullptr;
        return file != nullptr ? new FileHandle{std::move(file)} : nullptr;
    });
}

unsigned char* LoadFile(ModuleHandle* module, char const* name, char const* variant, unsigned int* size)
{
    if (module == nullptr || name == nullptr || variant != nullptr) return nullptr;
    return InMemory<unsigned char*>(
        nullptr, [&] { return LoadWhole(module->archive, name, *size).release(); });
}

bool ReadFile(FileHandle* file, void* buffer, unsigned int size, unsigned int* read)
{
    *read = 0;
    return file != nullptr && InMemory(false, [&] { return file->file->Read(buffer, size, *read); });
}

bool GetFileSize(FileHandle* file, unsigned long long* size)
{
    if (file == nullptr) return false;
    *size = file->file->Size();
    return true;
}

bool RewindFile(FileHandle* file)
{
    return file != nullptr && InMemory(false, [&] { return file->file->Rewind(); });
}

unsigned char* GetFileError(FileHandle* file, unsigned int* size)
{
    if (file == nullptr) return nullptr;
    return InMemory<unsigned char*>(nullptr, [&]() -> unsigned char* {
        std::string const failure = file->file->LastFailure();
        if (failure.empty()) return nullptr;
        auto* const bytes = new unsigned char[failure.size()];
        std::copy(failure.begin(), failure.end(), bytes);
        *size = static_cast<unsigned>(failure.size());
        return bytes;
    });
}

void CloseFile(FileHandle* file) { delete file; }

}
