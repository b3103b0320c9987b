#include <support/memory_bundle.h>

#include <common/bundle_api.h>

#include <algorithm>
#include <cstring>

MemoryBundle memoryBundle;

namespace BundleApi {

struct ModuleHandle {};
struct FileHandle {
    std::string data;
    std::size_t position;
};

ModuleHandle* OpenModule(unsigned short const* path)
{
    if (path == nullptr || !memoryBundle.hasArchive) return nullptr;
    std::lock_guard const lock(memoryBundle.mutex);
    memoryBundle.path.clear();
    while (*path != 0)
        memoryBundle.path += static_cast<char16_t>(*path++);
    ++memoryBundle.modules;
    return new ModuleHandle;
}

void CloseModule(ModuleHandle* module)
{
    delete module;
    if (--memoryBundle.modules == 0) std::puts("closed");
}

FileHandle* OpenFile(ModuleHandle* module, char const* name, char const* /*variant*/)
{
    if (module == nullptr || !memoryBundle.files.contains(name)) return nullptr;
    ++memoryBundle.openFiles;
    return new FileHandle{memoryBundle.files[name], 0};
}

unsigned char* LoadFile(ModuleHandle* module, char const* name, char const* /*variant*/, unsigned* size)
{
    if (module == nullptr || !memoryBundle.files.contains(name)) return nullptr;
    std::string const& data = memoryBundle.files[name];
    *size = static_cast<unsigned>(data.size());
    return static_cast<unsigned char*>(std::memcpy(new unsigned char[*size], data.data(), *size));
}

bool ReadFile(FileHandle* file, void* buffer, unsigned size, unsigned* read)
{
    ++memoryBundle.calls;
    *read = static_cast<unsigned>(
        file->data.copy(static_cast<char*>(buffer), memoryBundle.failing ? 1 : size, file->position));
    file->position += *read;
    return !memoryBundle.failing;
}

bool GetFileSize(FileHandle* file, unsigned long long* size)
{
    ++memoryBundle.calls;
    *size = file->data.size();
    return !memoryBundle.failing;
}

bool RewindFile(FileHandle* file)
{
    ++memoryBundle.calls;
    file->position = 0;
    return !memoryBundle.failing;
}

unsigned char* GetFileError(FileHandle* /*file*/, unsigned* size)
{
    *size = static_cast<unsigned>(memoryBundle.failure.size());
    if (*size == 0) return nullptr;
    return static_cast<unsigned char*>(
        std::memcpy(new unsigned char[*size], memoryBundle.failure.data(), *size));
}

void CloseFile(FileHandle* file)
{
    delete file;
    --memoryBundle.openFiles;
}

}
