#include <xml/scanner.h>

#include <file/file.h>
#include <xml/strict_utf8.h>

#include <algorithm>
#include <string_view>

namespace {

constexpr std::size_t kMagicSize = 4;
constexpr std::size_t kReadSize = 1024;
constexpr char32_t kLastCharacter = 0x10FFFF;

struct Entity {
    std::string_view spelling;
    char16_t character;
};

constexpr Entity kEntities[] = {
    {"&amp;", u'&'}, {"&apos;", u'\''}, {"&gt;", u'>'}, {"&lt;", u'<'}, {"&quot;", u'"'}};

bool IsSpace(unsigned char c) { return c == ' ' || c == '\t' || c == '\n' || c == '\r'; }

bool IsDigit(unsigned char c) { return c >= '0' && c <= '9'; }

bool IsNameStart(unsigned char c)
{
    unsigned char const lower = c | 0x20;
    return (lower >= 'a' && lower <= 'z') || c == '_' || c == ':';
}

bool IsNamePart(unsigned char c) { return IsNameStart(c) || IsDigit(c) || c == '-' || c == '.'; }

/// At least `base` if it is none.
unsigned DigitValue(unsigned char c, unsigned base)
{
    unsigned char const lower = c | 0x20;
    if (IsDigit(c)) return c - '0';
    return lower >= 'a' && lower <= 'f' ? lower - 'a' + 10 : base;
}

}

void xml_scanner::Next()
{
    if (token == Token::End) return;
    name.clear();
    text.clear();
    Found found;
    while (!found) {
        TakeScanned();
        found = Scan();
    }
    token = *found;
}

xml_scanner::Found xml_scanner::Scan()
{
    switch (state) {
    case State::StartOfFile: return ScanStartOfFile();
    case State::CData: return ScanCData();
    case State::InTag: return ScanInTag();
    case State::Comment: return SkipTo("-->");
    case State::Instruction: return SkipTo("?>");
    default: return ScanText();
    }
}

xml_scanner::Found xml_scanner::ScanStartOfFile()
{
    bool const binary = Accept("BXML");
    if (!binary) Accept("\xEF\xBB\xBF");  // the byte order mark
    state = State::Content;
    return binary ? Found(Token::Magic) : std::nullopt;
}

xml_scanner::Found xml_scanner::ScanText()
{
    unsigned char const c = Peek();
    if (IsSpace(c)) {
        ++cursor;
        if (space == Space::None) space = Space::Pending;
        return std::nullopt;
    }
    if (AtClosingQuote()) {
        ++cursor;
        state = State::InTag;
        space = Space::Dropped;
        return std::nullopt;
    }
    if (c == '&') return ScanEntity();
    if (c == '<' && state == State::Content) return ScanMarkup();
    if (c == '<' || c < ' ') return Fail();
    return Run(
        [this](unsigned char next) { return next <= ' ' || next == '<' || next == '&' || AtClosingQuote(); });
}

xml_scanner::Found xml_scanner::ScanMarkup()
{
    if (Accept("<?")) {
        state = State::Instruction;
        return std::nullopt;
    }
    if (Accept("<!--")) {
        state = State::Comment;
        return std::nullopt;
    }
    if (Accept("<![CDATA[")) {
        if (space == Space::Pending) return PendingSpace();
        state = State::CData;
        space = Space::None;
        return std::nullopt;
    }
    bool const isEnd = Accept("</");
    if (!isEnd) Accept("<");
    if (!AcceptName()) return Fail();
    if (!isEnd && space == Space::Pending) return PendingSpace();
    state = State::InTag;
    space = isEnd ? Space::None : Space::Dropped;
    return isEnd ? Token::EndTag : Token::StartTag;
}

xml_scanner::Found xml_scanner::ScanEntity()
{
    for (Entity const& entity : kEntities) {
        if (Accept(entity.spelling)) return Character(entity.character);
    }
    unsigned const base = Accept("&#x") ? 16 : 10;
    if (base == 10 && !Accept("&#")) return Fail();
    if (DigitValue(Peek(), base) >= base) return Fail();
    char32_t character = 0;
    for (unsigned digit; (digit = DigitValue(Peek(), base)) < base; ++cursor)
        character = std::min(character * base + digit, kLastCharacter + 1);
    if (!Accept(";") || character > kLastCharacter) return Fail();
    return Character(character);
}

xml_scanner::Found xml_scanner::ScanCData()
{
    if (Accept("]]>")) {
        state = State::Content;
        return std::nullopt;
    }
    unsigned char const c = Peek();
    if (c == '\t' || c == '\n' || c == ']') {
        ++cursor;
        return Character(c);
    }
    if (c == '\r') {
        ++cursor;
        return std::nullopt;
    }
    if (c < ' ') return Fail();
    return Run([](unsigned char next) { return next < ' ' || next == ']'; });
}

xml_scanner::Found xml_scanner::ScanInTag()
{
    if (IsSpace(Peek())) {
        ++cursor;
        return std::nullopt;
    }
    if (AcceptName()) return Token::Attribute;
    if (Accept("=")) {
        while (IsSpace(Peek()))
            ++cursor;
        if (Accept("\""))
            state = State::InDoubleQuotes;
        else if (Accept("'"))
            state = State::InSingleQuotes;
        else
            return Fail();
        space = Space::Dropped;
        return Token::Equals;
    }
    bool const isEmpty = Accept("/>");
    if (!isEmpty && !Accept(">")) return Fail();
    state = State::Content;
    if (isEmpty) space = Space::None;
    return isEmpty ? Token::EmptyEnd : Token::TagEnd;
}

xml_scanner::Found xml_scanner::SkipTo(std::string_view end)
{
    if (Accept(end)) {
        state = State::Content;
    } else {
        if (Peek() == 0 && atEnd && cursor + 1 == buffer.size()) return Fail();
        ++cursor;
    }
    return std::nullopt;
}

template <class Ends>
xml_scanner::Found xml_scanner::Run(Ends ends)
{
    while (!ends(Peek()))
        ++cursor;
    if (space == Space::Pending) text = u' ';
    space = Space::None;
    std::string_view const run = std::string_view(buffer).substr(start, cursor - start);
    std::size_t const good = DecodeStrictUtf8(text, run);
    if (good == run.size()) return Token::Text;
    column += static_cast<unsigned>(good);  // to the bad byte
    return Token::Error;
}

xml_scanner::Found xml_scanner::Character(char32_t character)
{
    if (space == Space::Pending) return PendingSpace();
    space = Space::None;
    AppendUtf16(text, character);
    return Token::Text;
}

xml_scanner::Token xml_scanner::PendingSpace()
{
    cursor = start;
    space = Space::None;
    text = u' ';
    return Token::Text;
}

// The end is where only the end is missing: our 0 is what stands in the way.
xml_scanner::Token xml_scanner::Fail() const
{
    return atEnd && marker + 1 == buffer.size() ? Token::End : Token::Error;
}

void xml_scanner::TakeScanned()
{
    for (char const c : std::string_view(buffer).substr(start, cursor - start)) {
        if (c == '\n') {
            ++line;
            column = 0;
        } else {
            column = (c == '\t' ? column | 7 : column) + 1;
        }
    }
    start = marker = cursor;
}

unsigned char xml_scanner::Peek(std::size_t ahead)
{
    marker = std::max(marker, cursor + ahead);
    while (marker >= buffer.size() && !atEnd)
        Refill();
    return static_cast<unsigned char>(buffer[cursor + ahead]);
}

bool xml_scanner::Accept(std::string_view bytes)
{
    for (std::size_t i = 0; i < bytes.size(); ++i) {
        if (Peek(i) != static_cast<unsigned char>(bytes[i])) return false;
    }
    cursor += bytes.size();
    return true;
}

bool xml_scanner::AcceptName()
{
    if (!IsNameStart(Peek())) return false;
    std::size_t const first = cursor - start;
    while (IsNamePart(Peek()))
        ++cursor;
    name = buffer.substr(start + first, cursor - start - first);
    return true;
}

bool xml_scanner::AtClosingQuote()
{
    return (state == State::InDoubleQuotes && Peek() == '"') ||
        (state == State::InSingleQuotes && Peek() == '\'');
}

void xml_scanner::Refill()
{
    buffer.erase(0, start);
    cursor -= start;
    marker -= start;
    start = 0;
    std::size_t const rest = buffer.size();
    std::size_t const wanted = state == State::StartOfFile ? kMagicSize - rest : kReadSize;
    std::uint64_t count = 0;
    buffer.resize(rest + wanted);
    file.Read(buffer.data() + rest, wanted, count);
    buffer.resize(rest + count);
    if (count > 0) return;
    atEnd = true;
    buffer += '\0';
}
