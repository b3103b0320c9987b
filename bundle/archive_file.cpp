#include <bundle/archive_file.h>

using Common::LocationOf;

namespace {

constexpr char kFile[] = "bundle/archive_file";

template <class T>
std::string BytesOf(T const& value)
{
    return {reinterpret_cast<char const*>(&value), sizeof value};
}

void AddText(std::string& bytes, std::string_view text)
{
    bytes += text;
    bytes += '\0';
}

void AddParameter(std::string& bytes, std::string_view name, std::string_view text)
{
    AddText(bytes, name);
    bytes += 'A';
    AddText(bytes, text);
}

/// The system's part of a message may be in any encoding.
std::string AsciiOf(std::string_view text)
{
    std::string ascii(text);
    for (char& letter : ascii) {
        if ((letter & 0x80) != 0) letter = '?';
    }
    return ascii;
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
        SetFailure(Common::ErrorReadFailed, "The file is not open since it could not be rewound",
            LocationOf(kFile, "Read", __LINE__));
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
    SetFailure(Common::ErrorReadFailed, got < 0 ? zip_file_strerror(stream) : "The data is not of its size",
        LocationOf(kFile, "Read", __LINE__));
    return false;
}

bool ArchiveFile::Rewind()
{
    std::lock_guard const lock(archive->mutex);
    CloseStream();
    stream = zip_fopen_index(archive->zip, entry.index, 0);
    position = 0;
    if (stream != nullptr) return true;
    SetFailure(Common::ErrorSeekFailed, zip_strerror(archive->zip), LocationOf(kFile, "Rewind", __LINE__));
    return false;
}

void ArchiveFile::CloseStream()
{
    if (stream != nullptr) zip_fclose(stream);
    stream = nullptr;
}

/// Keeps a chain of one record.
void ArchiveFile::SetFailure(std::uint32_t code, std::string_view message, Common::Location const& where)
{
    failure = '\x01';
    failure += BytesOf(code) + BytesOf(where.site);
    AddText(failure, AsciiOf(message));
    AddParameter(failure, "$file", where.file);
    AddParameter(failure, "$func", where.function);
    AddText(failure, "$line");
    failure += 'N' + BytesOf(std::uint64_t{where.line});
    AddParameter(failure, "entry", entry.name);
    AddParameter(failure, "archive", archive->path);
    AddText(failure, "");
    failure += BytesOf(std::uint32_t{0});
}
