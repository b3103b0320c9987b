#include <tools/message_catalogue.h>

#include <common/message.h>
#include <common/utf8.h>

#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <gettext-po.h>
#include <memory>
#include <string_view>

namespace tools {

namespace {

struct FreeFile {
    using pointer = po_file_t;
    void operator()(po_file_t file) const { po_file_free(file); }
};
struct FreeIterator {
    using pointer = po_message_iterator_t;
    void operator()(po_message_iterator_t iterator) const { po_message_iterator_free(iterator); }
};

int problems = 0;  // that the parser has found; its handlers get no object

void TellProblem(int severity, po_message_t /*message*/, char const* file, std::size_t line,
    std::size_t /*column*/, int endsItsLines, char const* text)
{
    ++problems;
    std::string place = file != nullptr ? file : "compile_messages";
    if (file != nullptr && line != static_cast<std::size_t>(-1))
        place.append(":").append(std::to_string(line));
    std::fprintf(stderr, "%s: %s%s", place.c_str(), text, endsItsLines != 0 ? "" : "\n");
    if (severity == PO_SEVERITY_FATAL_ERROR) std::exit(EXIT_FAILURE);  // the parser forbids a return
}

/// Of an entry that is there twice, the second.
void TellFirstOfTwo(int severity, po_message_t message, char const* file, std::size_t line,
    std::size_t column, int endsItsLines, char const* text, po_message_t /*otherMessage*/,
    char const* /*otherFile*/, std::size_t /*otherLine*/, std::size_t /*otherColumn*/,
    int /*otherEndsItsLines*/, char const* /*otherText*/)
{
    TellProblem(severity, message, file, line, column, endsItsLines, text);
}

constexpr po_xerror_handler kHandler = {TellProblem, TellFirstOfTwo};

/// A file and the line of an entry in it. The parser knows lines, but does not tell them.
std::string PlaceOf(std::string const& path, po_message_t message)
{
    char const* const context = po_message_msgctxt(message);
    std::string const begin = context != nullptr ? std::string("msgctxt \"") + context + '"'
                                                 : std::string("msgid \"") + po_message_msgid(message) + '"';
    std::ifstream file(path);
    std::string line;
    for (int number = 1; std::getline(file, line); ++number)
        if (line.starts_with(begin)) return path + ":" + std::to_string(number);
    return path;
}

/// The key that an entry names by its context; kMessageCount if it names none.
unsigned KeyOf(po_message_t message)
{
    char const* const context = po_message_msgctxt(message);
    unsigned key = 0;
    while (key < kMessageCount && (context == nullptr || std::to_string(key) != context))
        ++key;
    return key;
}

std::u16string Decode(std::string const& place, char const* text)
{
    std::u16string units;
    if (!Common::DecodeUtf8(units, text, std::string_view(text).size()))
        throw MessageError(place + ": the text is no UTF-8");
    return units;
}

std::u16string English(unsigned key)
{
    std::u16string text;
    for (unsigned short const* unit = TextOf(BuiltInMessages(), key); *unit != 0; ++unit)
        text += static_cast<char16_t>(*unit);
    return text;
}

void Read(std::string const& place, po_message_t message, Messages& messages)
{
    unsigned const key = KeyOf(message);
    if (key >= kMessageCount || English(key).empty())
        throw MessageError(place + ": the context is no key of a message");
    if (Decode(place, po_message_msgid(message)) != English(key))
        throw MessageError(place + ": key " + std::to_string(key) + " has another English text");
    if (po_message_is_fuzzy(message) != 0) throw MessageError(place + ": the translation is marked as fuzzy");
    messages[key] = Decode(place, po_message_msgstr(message));
    if (messages[key].empty()) throw MessageError(place + ": the translation is empty");
}

}

Messages ReadTranslations(std::string const& path)
{
    problems = 0;
    std::unique_ptr<void, FreeFile> const file(po_file_read(path.c_str(), &kHandler));
    if (file == nullptr) throw MessageError(path + ": cannot be read");
    if (problems != 0) throw MessageError(path + ": is no PO file");

    Messages messages;
    std::unique_ptr<void, FreeIterator> const entries(po_message_iterator(file.get(), nullptr));
    while (po_message* const message = po_next_message(entries.get())) {
        bool const isHeader = po_message_msgctxt(message) == nullptr && *po_message_msgid(message) == 0;
        if (!isHeader && po_message_is_obsolete(message) == 0)
            Read(PlaceOf(path, message), message, messages);
    }
    for (unsigned key = 0; key < kMessageCount; ++key)
        if (messages[key].empty() && !English(key).empty())
            throw MessageError(path + ": key " + std::to_string(key) + " is missing");
    return messages;
}

}
