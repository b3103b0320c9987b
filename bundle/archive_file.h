#pragma once

#include <bundle/archive.h>
#include <bundle/failure.h>

#include <memory>
#include <string>

/// A file of an archive, open for reading.
class ArchiveFile {
public:
    /// Null if the file's data cannot be unpacked.
    static std::unique_ptr<ArchiveFile> Open(std::shared_ptr<Archive> archive, ArchiveEntry entry);

    ArchiveFile(ArchiveFile const&) = delete;
    ArchiveFile& operator=(ArchiveFile const&) = delete;
    ~ArchiveFile();

    /// `count` gets how much was read, also if it is false that reading went well.
    bool Read(void* buffer, unsigned size, unsigned& count);
    bool Rewind();
    std::uint64_t Size() const { return entry.size; }

    /// The last failure as bytes of an error chain, in the language in force; empty if there was none.
    std::string LastFailure() const;

private:
    ArchiveFile(std::shared_ptr<Archive> from, ArchiveEntry what)
        : archive(std::move(from)), entry(std::move(what))
    {}
    void CloseStream();

    std::shared_ptr<Archive> const archive;
    ArchiveEntry const entry;
    zip_file_t* stream = nullptr;  // guarded by the archive's mutex; null if rewinding has failed
    std::uint64_t position = 0;
    Failure failure;
};

/// All of the file with this name in the language in force, and its size. Null, with `size` left alone, if
/// there is none that can be read.
std::unique_ptr<unsigned char[]> LoadWhole(
    std::shared_ptr<Archive> const& archive, std::string const& name, unsigned& size);
