#include <xml/simple_reader.h>

#include <common/assert.h>
#include <common/utf8.h>
#include <file/file.h>

#include <algorithm>
#include <memory>
#include <vector>

static constexpr char kSource[] = GR_SOURCE("xml/simple_reader");

namespace {

constexpr std::size_t kReadSize =
    4096;  // at once, so that a damaged length takes no memory that is never filled
constexpr std::uint32_t kEndMark = 0;

enum Form : unsigned char { FormOld = 1, FormNew = 2 };

std::unique_ptr<xml_reader_core> MakeDecoder(unsigned char form, i_file& file, xml_reader_interface& reader)
{
    if (form == FormOld) return std::make_unique<xml_reader_binary_old>(file, reader);
    if (form == FormNew) return std::make_unique<xml_reader_binary_new>(file, reader);
    return nullptr;
}

}

unsigned char xml_reader_core::ReadByte()
{
    unsigned char byte = 0;
    ReadAll(file, &byte, sizeof byte);
    return byte;
}

std::uint32_t xml_reader_core::ReadNumber()
{
    std::uint64_t number = 0;
    unsigned shift = 0;
    unsigned char byte;
    do {
        byte = ReadByte();
        number |= static_cast<std::uint64_t>(byte & 0x7F) << shift;
        shift = std::min(shift + 7, 35u);  // beyond it everything is lost
    } while ((byte & 0x80) != 0 && !file.error);
    return static_cast<std::uint32_t>(number);
}

std::string xml_reader_core::ReadBytes(std::uint32_t length)
{
    std::string bytes;
    while (bytes.size() < length && !file.error) {
        std::size_t const had = bytes.size();
        bytes.resize(std::min<std::size_t>(length, had + kReadSize));
        ReadAll(file, bytes.data() + had, bytes.size() - had);
    }
    return bytes;
}

std::u16string xml_reader_core::ReadText(std::uint32_t length)
{
    std::u16string text;
    std::string const bytes = ReadBytes(length);
    Common::DecodeUtf8(text, bytes.data(), bytes.size());
    return text;
}

std::string const& xml_reader_core::ReadName(std::uint32_t id)
{
    auto const [entry, isNew] = names.try_emplace(id);
    if (isNew) entry->second = ReadBytes(ReadNumber());
    return entry->second;
}

bool xml_reader_binary_old::ReadElement()
{
    std::vector<std::uint32_t> textsLeft{ReadStart()};  // in each open element
    while (!textsLeft.empty()) {
        if (textsLeft.back() == 0 || file.error) {
            reader.EndElement();
            textsLeft.pop_back();
            continue;
        }
        reader.Text(ReadText(ReadNumber()));
        if (--textsLeft.back() > 0 && !file.error) textsLeft.push_back(ReadStart());
    }
    return true;
}

std::uint32_t xml_reader_binary_old::ReadStart()
{
    reader.StartElement(ReadName(ReadNumber()));
    for (unsigned left = ReadByte(); left > 0 && !file.error; --left) {
        std::string const& name = ReadName(ReadNumber());
        reader.Attribute(name, ReadText(ReadNumber()));
    }
    std::uint32_t const textCount = ReadNumber();
    static_cast<void>(GR_ASSERT_LINE(textCount, "textCount", 142));
    return textCount;
}

bool xml_reader_binary_new::ReadElement()
{
    unsigned depth = 0;
    do {
        if (auto const* const name = ReadNameOrEnd()) {
            ++depth;
            reader.StartElement(*name);
            ReadAttributes();
        } else if (depth == 0) {
            return false;
        } else {
            --depth;
            reader.EndElement();
        }
        if (depth > 0) ReadTextItem();
    } while (depth > 0);
    return !file.error;
}

std::string const* xml_reader_binary_new::ReadNameOrEnd()
{
    std::uint32_t const id = ReadNumber();
    return file.error || id == kEndMark ? nullptr : &ReadName(id);
}

void xml_reader_binary_new::ReadAttributes()
{
    while (auto const* const name = ReadNameOrEnd()) {
        std::uint32_t const textLength = ReadNumber();
        static_cast<void>(file.error || GR_ASSERT_LINE((textLength & 1) == 0, "(textLength & 1) == 0", 201));
        reader.Attribute(*name, ReadText(textLength >> 1));
    }
}

void xml_reader_binary_new::ReadTextItem()
{
    std::uint32_t const number = ReadNumber();
    if ((number & 1) == 0)
        reader.Text(ReadText(number >> 1));
    else
        reader.RawText(ReadBytes(number >> 1));
}

bool DecodeBinaryXml(i_file& file, xml_reader_interface& reader)
{
    unsigned char head[2] = {};  // the form, and a byte that means nothing
    ReadAll(file, head, sizeof head);
    auto const decoder = MakeDecoder(head[0], file, reader);
    if (decoder == nullptr) return false;
    reader.StartDocument();
    decoder->ReadElement();
    reader.EndDocument();
    return !file.error;
}
