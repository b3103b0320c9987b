#include <bundle/elf_section.h>

#include <gelf.h>
#include <memory>
#include <string_view>
#include <sys/stat.h>

namespace {

struct EndElf {
    void operator()(Elf* elf) const { elf_end(elf); }
};

}

std::optional<ElfSection> FindElfSection(std::FILE* file, char const* name)
{
    struct stat status;
    if (elf_version(EV_CURRENT) == EV_NONE || fstat(fileno(file), &status) == -1) return std::nullopt;
    auto const fileSize = static_cast<std::uint64_t>(status.st_size);

    std::unique_ptr<Elf, EndElf> const elf(elf_begin(fileno(file), ELF_C_READ, nullptr));
    std::size_t names = 0;
    if (elf == nullptr || elf_getshdrstrndx(elf.get(), &names) != 0) return std::nullopt;
    for (Elf_Scn* section = nullptr; (section = elf_nextscn(elf.get(), section)) != nullptr;) {
        GElf_Shdr header;
        if (gelf_getshdr(section, &header) == nullptr) continue;
        char const* const found = elf_strptr(elf.get(), names, header.sh_name);
        if (found == nullptr || std::string_view(found) != name) continue;
        bool const whole = header.sh_type != SHT_NOBITS && (header.sh_flags & SHF_COMPRESSED) == 0 &&
            header.sh_offset <= fileSize && header.sh_size <= fileSize - header.sh_offset;
        if (!whole) return std::nullopt;
        return ElfSection{header.sh_offset, header.sh_size};
    }
    return std::nullopt;
}
