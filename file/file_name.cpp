#include <file/file_name.h>

#include <clocale>
#include <langinfo.h>
#include <memory>
#include <unicode/ucnv.h>

namespace {

constexpr std::size_t kLongestName = 4096;  // the system's limit, which counts bytes

struct CloseConverter {
    void operator()(UConverter* converter) const { ucnv_close(converter); }
};
using Converter = std::unique_ptr<UConverter, CloseConverter>;

/// The program may never have called setlocale, so its own locale says nothing.
std::string SystemEncoding()
{
    locale_t const locale = newlocale(LC_CTYPE_MASK, "", nullptr);
    if (locale == nullptr) return "UTF-8";
    std::string const encoding = nl_langinfo_l(CODESET, locale);
    freelocale(locale);
    return encoding == "ANSI_X3.4-1968" ? "UTF-8" : encoding;
}

Converter OpenConverter()
{
    UErrorCode status = U_ZERO_ERROR;
    Converter converter(ucnv_open(SystemEncoding().c_str(), &status));
    if (U_FAILURE(status)) {
        status = U_ZERO_ERROR;
        converter.reset(ucnv_open("UTF-8", &status));
    }
    // A name with a character replaced would be another file's name.
    ucnv_setFromUCallBack(converter.get(), UCNV_FROM_U_CALLBACK_STOP, nullptr, nullptr, nullptr, &status);
    return U_FAILURE(status) ? nullptr : std::move(converter);
}

}

std::optional<std::string> SystemFileName(std::u16string_view name)
{
    if (name.empty() || name.size() > kLongestName || name.find(u'\0') != std::u16string_view::npos)
        return std::nullopt;
    Converter const converter = OpenConverter();
    if (converter == nullptr) return std::nullopt;
    auto const length = static_cast<int32_t>(name.size());
    std::string bytes(
        static_cast<std::size_t>(UCNV_GET_MAX_BYTES_FOR_STRING(length, ucnv_getMaxCharSize(converter.get()))),
        0);
    UErrorCode status = U_ZERO_ERROR;
    int32_t const size = ucnv_fromUChars(
        converter.get(), bytes.data(), static_cast<int32_t>(bytes.size()), name.data(), length, &status);
    if (U_FAILURE(status)) return std::nullopt;
    bytes.resize(static_cast<std::size_t>(size));
    return bytes;
}
