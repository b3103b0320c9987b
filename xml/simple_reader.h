#pragma once

#include <cstdint>
#include <map>
#include <string>

class i_file;

/// What a decoder of binary XML tells about a document, in the document's order.
class xml_reader_interface {
public:
    xml_reader_interface() = default;
    xml_reader_interface(xml_reader_interface const&) = delete;
    xml_reader_interface& operator=(xml_reader_interface const&) = delete;
    virtual ~xml_reader_interface() = default;

    virtual void StartDocument() {}
    virtual void EndDocument() {}
    virtual void StartElement(std::string const& /*name*/) {}
    virtual void EndElement() {}
    virtual void Attribute(std::string const& /*name*/, std::u16string const& /*value*/) {}
    virtual void Text(std::u16string const& /*value*/) {}
    /// Bytes that are no text.
    virtual void RawText(std::string const& /*value*/) {}
};

/// What the decoders of the binary forms have in common: numbers, bytes and names. A file that is cut short
/// has an error from then on, and every read gives 0 or nothing more.
class xml_reader_core {
public:
    xml_reader_core(i_file& input, xml_reader_interface& output) : file(input), reader(output) {}
    xml_reader_core(xml_reader_core const&) = delete;
    xml_reader_core& operator=(xml_reader_core const&) = delete;
    virtual ~xml_reader_core() = default;

    /// Reads one element with all that is inside it. Elements that are open where the file fails are ended.
    /// They may be nested deeper than the stack reaches, so nothing here is recursive.
    virtual bool ReadElement() = 0;

protected:
    unsigned char ReadByte();
    /// Seven bits a byte, the lowest first, and the highest bit in all but the last; what 32 bits cannot hold
    /// is lost.
    std::uint32_t ReadNumber();
    std::string ReadBytes(std::uint32_t length);
    /// UTF-8 of this many bytes. Mistakes in it become replacement characters.
    std::u16string ReadText(std::uint32_t length);
    /// The entry of the dictionary; the first use of an id brings the name with it.
    std::string const& ReadName(std::uint32_t id);

    i_file& file;
    xml_reader_interface& reader;

private:
    std::map<std::uint32_t, std::string> names;
};

/// An element is its name, a byte with the number of attributes, these, the number of texts, and these, with
/// a child between each two.
class xml_reader_binary_old final : public xml_reader_core {
public:
    using xml_reader_core::xml_reader_core;
    /// True.
    bool ReadElement() override;

private:
    /// All before the texts. Result: how many texts follow.
    std::uint32_t ReadStart();
};

/// An element is its name, its attributes with an end mark, and a text before each child and before an end
/// mark.
class xml_reader_binary_new final : public xml_reader_core {
public:
    using xml_reader_core::xml_reader_core;
    /// False if there is an end mark instead of an element, or the file has failed.
    bool ReadElement() override;

private:
    /// Null for an end mark, and where the file fails.
    std::string const* ReadNameOrEnd();
    void ReadAttributes();
    void ReadTextItem();
};

/// Decodes a document from behind the file's first four bytes. False if the file fails, is cut short, or has
/// neither form.
bool DecodeBinaryXml(i_file& file, xml_reader_interface& reader);
