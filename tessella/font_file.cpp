#include <tessella/font_file.h>

#include <common/zipopen.h>
#include <file/file.h>
#include <file/posix_dir.h>

std::unique_ptr<si_file> OpenFontFile(char const* name)
{
    std::u16string wide;
    for (char const* byte = name; *byte != 0; ++byte)
        wide += static_cast<unsigned char>(*byte);
    auto file = OpenWorkingDir()->Open(wide, 0);
    if (!file) file.reset(ZipOpen(name));
    return file;
}
