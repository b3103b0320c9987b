#pragma once

#include <common/message_table.h>

#include <array>
#include <stdexcept>
#include <string>

namespace tools {

/// A language's texts by their keys. Those that nothing looks up are empty.
using Messages = std::array<std::u16string, kMessageCount>;

/// Translations that cannot be used. Says where: the file, and the line if it is one line.
class MessageError : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

/// Reads the translations of a PO file. The context of each is its key, the original is the English text. All
/// keys that have one must be there, and nothing else. Throws `MessageError`. What the parser complains about
/// is printed before; if it gives up, the program ends.
Messages ReadTranslations(std::string const& path);

/// The bytes of a file `tessella.msg`; the same bytes every time.
std::string MakeCatalogue(Messages const& messages);

}
