#pragma once

#include <cstdint>
#include <memory>
#include <mutex>
#include <optional>
#include <string>
#include <string_view>
#include <zip.h>

/// A file of an archive.
struct ArchiveEntry {
    std::uint64_t index;
    std::uint64_t size;  ///< unpacked
    std::string name;
    bool isPlausible;  ///< its sizes can be true
};

/// The archive in an ELF file. Its entries are unpacked as they are read, from the file, which is never
/// read whole.
class Archive {
public:
    /// Null if there is no archive that can be read.
    static std::shared_ptr<Archive> Open(std::string path);

    Archive(Archive const&) = delete;
    Archive& operator=(Archive const&) = delete;
    ~Archive() { zip_discard(zip); }

    /// The entry for a name in the language in force.
    std::optional<ArchiveEntry> Find(std::string const& name);

    std::string const path;
    std::mutex mutex;
    zip_t* const zip;  ///< guarded by mutex, with all files that are open in it

private:
    Archive(std::string filePath, zip_t* openZip, std::uint64_t archiveSize);
    std::optional<ArchiveEntry> FindExactly(std::string name);

    std::uint64_t const size;  ///< of the archive, which no entry exceeds
    std::string locales;       ///< does not change once the archive is open
};
