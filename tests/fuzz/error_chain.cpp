// Any bytes make a chain whose records answer all questions.
#include <common/error.h>

#include <cstring>

extern "C" int LLVMFuzzerTestOneInput(unsigned char const* data, std::size_t size)
{
    Common::Error const chain = Common::ParseErrorChain(data, static_cast<unsigned>(size));
    std::size_t records = 0, read = 0;
    for (Common::ErrorInfo const* info = chain.info; info != nullptr; info = info->reason, ++records) {
        std::u16string text;
        info->ops->GetMessage(info, text);
        std::string names = info->ops->GetNames(info);
        for (char* name = std::strtok(names.data(), ","); name != nullptr; name = std::strtok(nullptr, ",")) {
            read += info->ops->GetNumber(info, name) != 0;
            if (char const* const ascii = info->ops->GetAscii(info, name)) read += std::strlen(ascii);
            auto const* const wide = reinterpret_cast<char16_t const*>(info->ops->GetWide(info, name));
            if (wide != nullptr) read += std::u16string_view(wide).size();
        }
        Common::Release(info->ops->Clone(info));
    }
    // A code, a site and the ends of the message and of the parameters. Nobody reads what does not count.
    if (records > size / 14 || read == SIZE_MAX) __builtin_trap();
    return 0;
}
