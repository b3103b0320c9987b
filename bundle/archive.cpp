#include <bundle/archive.h>

#include <bundle/elf_section.h>
#include <bundle/language.h>

#include <cstdio>

namespace {

constexpr char kSection[] = ".zip";
constexpr std::uint64_t kMaxLocalesSize = 4096;

// Deflate makes at most 1032 bytes of one, so that a damaged size does not take memory that is never filled.
constexpr std::uint64_t kMaxExpansion = 1032;

struct CloseStdio {
    void operator()(std::FILE* file) const { std::fclose(file); }
};

/// Null if there is no archive in the file. The result owns the file. `size` gets the size of the archive.
zip_t* OpenZip(std::string const& path, std::uint64_t& size)
{
    std::unique_ptr<std::FILE, CloseStdio> file(std::fopen(path.c_str(), "rbe"));
    if (file == nullptr) return nullptr;
    auto const section = FindElfSection(file.get(), kSection);
    // A size of 0 would mean all the rest of the file to libzip.
    if (!section || section->size == 0 || section->size > INT64_MAX) return nullptr;
    zip_source_t* const source = zip_source_filep_create(
        file.get(), section->offset, static_cast<zip_int64_t>(section->size), nullptr);
    if (source == nullptr) return nullptr;
    static_cast<void>(file.release());  // the source has it
    size = section->size;
    zip_t* const zip = zip_open_from_source(source, ZIP_RDONLY, nullptr);
    if (zip == nullptr) zip_source_free(source);
    return zip;
}

std::string LoadText(zip_t* zip, ArchiveEntry const& entry)
{
    std::string text(std::min(entry.size, kMaxLocalesSize), 0);
    zip_file_t* const file = zip_fopen_index(zip, entry.index, 0);
    if (file == nullptr) return {};
    bool const whole = zip_fread(file, text.data(), text.size()) == static_cast<zip_int64_t>(text.size());
    zip_fclose(file);
    return whole ? text : std::string();
}

}

std::shared_ptr<Archive> Archive::Open(std::string path)
{
    std::uint64_t size = 0;
    zip_t* const zip = OpenZip(path, size);
    if (zip == nullptr) return nullptr;
    return std::shared_ptr<Archive>(new Archive(std::move(path), zip, size));
}

Archive::Archive(std::string filePath, zip_t* openZip, std::uint64_t archiveSize)
    : path(std::move(filePath)), zip(openZip), size(archiveSize)
{
    if (auto const entry = FindExactly("locales"); entry && entry->isPlausible)
        locales = LoadText(zip, *entry);
}

std::optional<ArchiveEntry> Archive::Find(std::string const& name)
{
    std::string const language(MatchLanguage(LanguageInForce(), locales));
    std::lock_guard const lock(mutex);
    auto entry = language.empty() ? std::nullopt : FindExactly(language + '/' + name);
    if (!entry) entry = FindExactly(name);
    return entry && entry->isPlausible ? entry : std::nullopt;
}

std::optional<ArchiveEntry> Archive::FindExactly(std::string name)
{
    zip_stat_t status;
    bool const isFile = !name.empty() && !name.ends_with('/') && zip_stat(zip, name.c_str(), 0, &status) == 0;
    if (!isFile) return std::nullopt;
    bool const isPlausible = status.comp_size <= size && status.size / kMaxExpansion <= status.comp_size;
    return ArchiveEntry{status.index, status.size, std::move(name), isPlausible};
}
