#pragma once

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>

class i_file;

/// Cuts an XML text into tokens, one at a time, and reads the file no further than that takes.
class xml_scanner {
public:
    enum class Token {
        End,
        Error,
        StartTag,   ///< `<` and `name`
        TagEnd,     ///< `>`
        EmptyEnd,   ///< `/>`
        EndTag,     ///< `</` and `name`
        Attribute,  ///< `name`
        Equals,     ///< `=` and the quote that opens the value, whose pieces follow as Text
        Text,       ///< a piece of `text`
        Magic,      ///< the file is a binary one, and stands right behind its first four bytes
    };

    /// Reads the first token. The file must outlive the scanner.
    explicit xml_scanner(i_file& input) : file(input) { Next(); }

    /// Reads the next token. The end stays; behind an error there is nothing to be read.
    void Next();

    Token token = Token::Error;
    std::string name;
    std::u16string text;
    // Where the token starts, or what cannot be one.
    unsigned line = 1;
    unsigned column = 0;  ///< the bytes before it in its line; a tab reaches to the next multiple of 8

private:
    enum class State {
        StartOfFile,
        Content,
        CData,
        InTag,
        InDoubleQuotes,
        InSingleQuotes,
        Comment,
        Instruction
    };
    enum class Space { None, Pending, Dropped };
    /// Nothing: what was there makes no token.
    using Found = std::optional<Token>;

    Found Scan();
    Found ScanStartOfFile();
    Found ScanText();
    Found ScanMarkup();
    Found ScanEntity();
    Found ScanCData();
    Found ScanInTag();
    Found SkipTo(std::string_view end);

    /// From here to the first byte which `ends` says is no more part of it.
    template <class Ends>
    Found Run(Ends ends);
    Found Character(char32_t character);
    /// Ends the token before the bytes that it looked at, which are to be read again, and makes it a space.
    Token PendingSpace();
    Token Fail() const;

    void TakeScanned();
    unsigned char Peek(std::size_t ahead = 0);
    bool Accept(std::string_view bytes);
    bool AcceptName();
    bool AtClosingQuote();
    void Refill();

    State state = State::StartOfFile;
    Space space = Space::Dropped;
    i_file& file;
    bool atEnd = false;      // and the buffer ends with a 0 of ours
    std::string buffer;      // what is not read yet
    std::size_t start = 0;   // of what is being scanned
    std::size_t cursor = 0;  // behind what has been scanned
    std::size_t marker = 0;  // the last byte that was looked at
};
