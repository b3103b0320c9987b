#include <bundle/archive_file.h>

#include <common/message_table.h>

#include <climits>
#include <new>
#include <unicode/unistr.h>

using Common::LocationOf;

namespace {

constexpr char kFile[] = "bundle/archive_file";

/// As the archive has it in the language in force, in UTF-8.
std::string MessageOf(std::shared_ptr<Archive> const& archive, MessageKey key)
{
    unsigned size = 0;
    auto const bytes = LoadWhole(archive, kMessageFile, size);
    MessageCatalogue const* const catalogue = ReadCatalogue(bytes.get(), size);
    unsigned short const* const text = TextOf(catalogue != nullptr ? *catalogue : BuiltInMessages(), key);
    std::string message;
    return icu::UnicodeString(reinterpret_cast<char16_t const*>(text)).toUTF8String(message);
}

}

std::unique_ptr<ArchiveFile> ArchiveFile::Open(std::shared_ptr<Archive> archive, ArchiveEntry entry)
{
    std::unique_ptr<ArchiveFile> file(new ArchiveFile(std::move(archive), std::move(entry)));
    std::lock_guard const lock(file->archive->mutex);
    file->stream = zip_fopen_index(file->archive->zip, file->entry.index, 0);
    if (file->stream == nullptr) return nullptr;
    return file;
}

ArchiveFile::~ArchiveFile()
{
    std::lock_guard const lock(archive->mutex);
    CloseStream();
}

bool ArchiveFile::Read(void* buffer, unsigned size, unsigned& count)
{
    count = 0;
    std::lock_guard const lock(archive->mutex);
    if (stream == nullptr) {
        failure = {Common::ErrorReadFailed, MessageReadFailed,
            "The file is not open since it could not be rewound", LocationOf(kFile, "Read", __LINE__)};
        return false;
    }
    zip_int64_t got = 1;
    while (count < size && got > 0) {
        got = zip_fread(stream, static_cast<unsigned char*>(buffer) + count, size - count);
        if (got > 0) count += static_cast<unsigned>(got);
    }
    position += count;
    // The checksum is compared behind the data's end, where a reader who knows the size never comes.
    char beyond;
    if (got > 0 && position >= entry.size) got = zip_fread(stream, &beyond, 1);
    if (got > 0 ? position < entry.size : got == 0 && position == entry.size) return true;
    failure = {Common::ErrorReadFailed, MessageReadFailed,
        got < 0 ? zip_file_strerror(stream) : "The data is not of its size",
        LocationOf(kFile, "Read", __LINE__)};
    return false;
}

bool ArchiveFile::Rewind()
{
    std::lock_guard const lock(archive->mutex);
    CloseStream();
    stream = zip_fopen_index(archive->zip, entry.index, 0);
    position = 0;
    if (stream != nullptr) return true;
    failure = {Common::ErrorSeekFailed, MessageSeekFailed, zip_strerror(archive->zip),
        LocationOf(kFile, "Rewind", __LINE__)};
    return false;
}

void ArchiveFile::CloseStream()
{
    if (stream != nullptr) zip_fclose(stream);
    stream = nullptr;
}

std::string ArchiveFile::LastFailure() const
{
    if (failure.code == 0) return {};
    return SerializeFailure(failure, MessageOf(archive, failure.key), entry.name, archive->path);
}

std::unique_ptr<unsigned char[]> LoadWhole(
    std::shared_ptr<Archive> const& archive, std::string const& name, unsigned& size)
{
    auto entry = archive->Find(name);
    auto const file = entry ? ArchiveFile::Open(archive, std::move(*entry)) : nullptr;
    if (file == nullptr || file->Size() > UINT_MAX) return nullptr;
    auto const wanted = static_cast<unsigned>(file->Size());
    std::unique_ptr<unsigned char[]> data(new (std::nothrow) unsigned char[wanted]);
    unsigned count = 0;
    if (data == nullptr || !file->Read(data.get(), wanted, count) || count != wanted) return nullptr;
    size = wanted;
    return data;
}
