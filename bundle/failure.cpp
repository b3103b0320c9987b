#include <bundle/failure.h>

namespace {

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

/// A record up to and with its location.
void BeginRecord(std::string& bytes, Failure const& failure, std::string_view message)
{
    bytes += BytesOf(failure.code) + BytesOf(failure.where.site);
    AddText(bytes, message);
    AddParameter(bytes, "$file", failure.where.file);
    AddParameter(bytes, "$func", failure.where.function);
    AddText(bytes, "$line");
    bytes += 'N' + BytesOf(std::uint64_t{failure.where.line});
}

void EndRecord(std::string& bytes) { AddText(bytes, ""); }

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

std::string SerializeFailure(
    Failure const& failure, std::string_view message, std::string_view entry, std::string_view archive)
{
    std::string bytes = "\x01";
    BeginRecord(bytes, failure, message);
    AddParameter(bytes, "entry", entry);
    AddParameter(bytes, "archive", archive);
    EndRecord(bytes);
    BeginRecord(bytes, failure, AsciiOf(failure.detail));
    EndRecord(bytes);
    return bytes + BytesOf(std::uint32_t{0});
}
