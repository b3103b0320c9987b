#include <cstdio>
#include <filesystem>
#include <map>
#include <memory>
#include <stdexcept>
#include <string>
#include <string_view>
#include <zip.h>

namespace {

constexpr zip_uint16_t kNoTime = 0;
constexpr zip_uint16_t kFirstDay = 1 << 5 | 1;  // 1 January 1980, with which the format's time begins
constexpr zip_uint32_t kFileMode = 0100644U << 16;
constexpr zip_uint32_t kFolderMode = 040755U << 16 | 0x10;  // the last bit is the format's own
constexpr zip_uint32_t kBestDeflate = 9;

constexpr char kHelp[] = R"(Usage: pack_archive OUTPUT NAME=FILE...
       pack_archive --help | --version

Makes the archive of resource files. What it writes depends on the names and the files' contents alone, so
that the same sources make the same bytes anywhere at any time.

The exit status is 0, 1 if a file cannot be read or written, 2 for wrong usage.
)";

struct Discard {
    void operator()(zip_t* zip) const { zip_discard(zip); }
};

/// Files by their names in the archive, and the folders they are in, with nothing for a file. Folders come
/// before what is in them.
std::map<std::string, std::string> ReadArguments(char** arguments)
{
    std::map<std::string, std::string> entries;
    for (; *arguments != nullptr; ++arguments) {
        std::string const argument = *arguments;
        std::size_t const equals = argument.find('=');
        if (equals == std::string::npos) throw std::runtime_error("not NAME=FILE: " + argument);
        std::string const name = argument.substr(0, equals);
        for (std::size_t slash = name.find('/'); slash != std::string::npos;
             slash = name.find('/', slash + 1))
            entries[name.substr(0, slash + 1)];
        if (!entries.emplace(name, argument.substr(equals + 1)).second)
            throw std::runtime_error("twice in the archive: " + name);
    }
    return entries;
}

class Packer {
public:
    explicit Packer(char const* path) : zip(zip_open(path, ZIP_CREATE | ZIP_TRUNCATE, nullptr))
    {
        if (zip == nullptr) throw std::runtime_error(std::string("cannot write ") + path);
    }

    void Add(std::string const& name, std::string const& path)
    {
        bool const isFolder = name.ends_with('/');
        zip_int64_t const added = isFolder ? zip_dir_add(zip.get(), name.c_str(), 0) : AddFile(name, path);
        if (added < 0) Fail(name);
        auto const index = static_cast<zip_uint64_t>(added);
        if (zip_file_set_dostime(zip.get(), index, kNoTime, kFirstDay, 0) != 0 ||
            zip_file_set_external_attributes(
                zip.get(), index, 0, ZIP_OPSYS_UNIX, isFolder ? kFolderMode : kFileMode) != 0)
            Fail(name);
    }

    void Finish()
    {
        if (zip_close(zip.get()) != 0) Fail("the archive");
        static_cast<void>(zip.release());  // closed with it
    }

private:
    zip_int64_t AddFile(std::string const& name, std::string const& path)
    {
        zip_source_t* const source = zip_source_file(zip.get(), path.c_str(), 0, -1);
        zip_int64_t const index = source != nullptr ? zip_file_add(zip.get(), name.c_str(), source, 0) : -1;
        if (index < 0) {
            zip_source_free(source);
            return -1;
        }
        zip_int32_t const method = std::filesystem::file_size(path) == 0 ? ZIP_CM_STORE : ZIP_CM_DEFLATE;
        return zip_set_file_compression(zip.get(), static_cast<zip_uint64_t>(index), method, kBestDeflate) ==
                0
            ? index
            : -1;
    }

    [[noreturn]] void Fail(std::string const& what)
    {
        throw std::runtime_error(what + ": " + zip_strerror(zip.get()));
    }

    std::unique_ptr<zip_t, Discard> zip;
};

}

int main(int argc, char** argv)
{
    std::string_view const word = argc > 1 ? argv[1] : "";
    if (word == "--help" || word == "--version")
        return std::fputs(word == "--help" ? kHelp : "pack_archive " TESSELLA_VERSION "\n", stdout), 0;
    if (argc < 3 || word.starts_with('-')) {
        std::fputs("pack_archive: an output and files must be given (--help tells more)\n", stderr);
        return 2;
    }
    try {
        auto const entries = ReadArguments(argv + 2);
        Packer packer(argv[1]);
        for (auto const& [name, path] : entries)
            packer.Add(name, path);
        packer.Finish();
    } catch (std::exception const& failure) {
        std::fprintf(stderr, "pack_archive: %s\n", failure.what());
        return 1;
    }
}
