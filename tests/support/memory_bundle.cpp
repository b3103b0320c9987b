#include <support/memory_bundle.h>

#include <common/bundle_api.h>

#include <cstdio>
#include <cstring>

MemoryBundle memoryBundle;

namespace BundleApi {

struct ModuleHandle {};
struct FileHandle {
    explicit FileHandle(std::string_view data) : whole(data), rest(data) {}
    std::string_view whole, rest;
};

static unsigned char* NewCopy(std::string_view data, unsigned* size)
{
    *size = static_cast<unsigned>(data.size());
    return static_cast<unsigned char*>(std::memcpy(new unsigned char[data.size()], data.data(), data.size()));
}

ModuleHandle* OpenModule(unsigned short const* path)
{
    if (path == nullptr || !memoryBundle.hasArchive) return nullptr;
    if (memoryBundle.modules++ == 0)
        while (*path != 0)
            memoryBundle.path += static_cast<char16_t>(*path++);
    return new ModuleHandle;
}

void CloseModule(ModuleHandle* module)
{
    delete module;
    if (--memoryBundle.modules == 0) std::puts("closed");
}

FileHandle* OpenFile(ModuleHandle* module, char const* name, char const* /*variant*/)
{
    auto const file = memoryBundle.files.find(name);
    if (module == nullptr || file == memoryBundle.files.end()) return nullptr;
    ++memoryBundle.openFiles;
    return new FileHandle(file->second);
}

unsigned char* LoadFile(ModuleHandle* module, char const* /*name*/, char const* /*variant*/, unsigned* size)
{
    return module != nullptr ? NewCopy(memoryBundle.loaded, size) : nullptr;
}

bool ReadFile(FileHandle* file, void* buffer, unsigned size, unsigned* read)
{
    *read =
        static_cast<unsigned>(file->rest.copy(static_cast<char*>(buffer), memoryBundle.failing ? 1 : size));
    file->rest.remove_prefix(*read);
    return memoryBundle.Call();
}

bool GetFileSize(FileHandle* file, unsigned long long* size)
{
    *size = file->whole.size();
    return memoryBundle.Call();
}

bool RewindFile(FileHandle* file)
{
    file->rest = file->whole;
    return memoryBundle.Call();
}

unsigned char* GetFileError(FileHandle* /*file*/, unsigned* size)
{
    return memoryBundle.failure.empty() ? nullptr : NewCopy(memoryBundle.failure, size);
}

void CloseFile(FileHandle* file)
{
    delete file;
    --memoryBundle.openFiles;
}

void SubscribeLanguageEvents(void (*callback)())
{
    memoryBundle.callback = callback;
    ++memoryBundle.subscriptions;
    if (memoryBundle.callsBack) callback();
}

void UnsubscribeLanguageEvents(void (*callback)())
{
    if (callback == memoryBundle.callback) std::puts("unsubscribed");
}

}
