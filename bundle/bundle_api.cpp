#include <common/bundle_api.h>

#include <bundle/archive.h>
#include <bundle/archive_file.h>

#include <algorithm>
#include <climits>
#include <new>

namespace BundleApi {

struct ModuleHandle {
    std::shared_ptr<Archive> archive;
};

struct FileHandle {
    std::unique_ptr<ArchiveFile> file;
};

namespace {

std::unique_ptr<ArchiveFile> Open(ModuleHandle* module, char const* name, char const* variant)
{
    if (module == nullptr || name == nullptr || variant != nullptr) return nullptr;
    auto entry = module->archive->Find(name);
    return entry ? ArchiveFile::Open(module->archive, std::move(*entry)) : nullptr;
}

}

ModuleHandle* OpenModule(unsigned short const* path)
{
    std::string bytes;
    for (; path != nullptr && *path != 0; ++path) {
        if (*path > UCHAR_MAX) return nullptr;
        bytes += static_cast<char>(*path);
    }
    auto archive = Archive::Open(std::move(bytes));
    return archive != nullptr ? new ModuleHandle{std::move(archive)} : nullptr;
}

void CloseModule(ModuleHandle* module) { delete module; }

FileHandle* OpenFile(ModuleHandle* module, char const* name, char const* variant)
{
    auto file = Open(module, name, variant);
    return file != nullptr ? new FileHandle{std::move(file)} : nullptr;
}

unsigned char* LoadFile(ModuleHandle* module, char const* name, char const* variant, unsigned int* size)
{
    auto const file = Open(module, name, variant);
    if (file == nullptr || file->Size() > UINT_MAX) return nullptr;
    auto const wanted = static_cast<unsigned>(file->Size());
    std::unique_ptr<unsigned char[]> data(new (std::nothrow) unsigned char[wanted]);
    unsigned count = 0;
    if (data == nullptr || !file->Read(data.get(), wanted, count) || count != wanted) return nullptr;
    *size = wanted;
    return data.release();
}

bool ReadFile(FileHandle* file, void* buffer, unsigned int size, unsigned int* read)
{
    *read = 0;
    return file != nullptr && file->file->Read(buffer, size, *read);
}

bool GetFileSize(FileHandle* file, unsigned long long* size)
{
    if (file == nullptr) return false;
    *size = file->file->Size();
    return true;
}

bool RewindFile(FileHandle* file) { return file != nullptr && file->file->Rewind(); }

unsigned char* GetFileError(FileHandle* file, unsigned int* size)
{
    if (file == nullptr || file->file->Failure().empty()) return nullptr;
    std::string const& failure = file->file->Failure();
    auto* const bytes = new unsigned char[failure.size()];
    std::copy(failure.begin(), failure.end(), bytes);
    *size = static_cast<unsigned>(failure.size());
    return bytes;
}

void CloseFile(FileHandle* file) { delete file; }

}
