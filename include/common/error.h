#pragma once

#include <cstdint>
#include <string>
#include <string_view>

namespace Common {

/// What an error is about, in the numbers that records carry.
enum ErrorCode : std::uint32_t {
    ErrorPosix = 0xFFF1,  ///< the reason that the system gives: the record's number is errno
    ErrorOutOfMemory = 0xFFF2,
    ErrorReadFailed = 0x40001,
    ErrorEndOfFile = 0x40002,
    ErrorSeekFailed = 0x40005,
    ErrorNotSupported = 0x4000E,
};

/// Where in the source an error was raised. The texts are never freed; null if they are not known.
struct Location {
    std::uint64_t site = 0;  ///< names the place by one number
    char const* file = nullptr;
    char const* function = nullptr;
    std::uint32_t line = 0;
};

/// The location of a line that raises errors. Its site is a constant of the file, plus the line.
constexpr Location LocationOf(char const* file, char const* function, std::uint32_t line)
{
    std::uint64_t site = 0xCBF29CE484222325;  // FNV-1a of the file's name
    for (char const letter : std::string_view(file))
        site = (site ^ static_cast<unsigned char>(letter)) * 0x100000001B3;
    return {site + line, file, function, line};
}

struct ErrorOps;

/// The head of every record. A record is one array, which its kind's operations know how to read. It is not
/// changed once it has more than one owner, apart from the count.
struct ErrorInfo {
    std::uint64_t refs;  ///< handles and records that own this one; changes through std::atomic_ref only
    std::uint32_t code;
    ErrorInfo* reason;  ///< the next record of the chain, owned with one reference
    ErrorOps const* ops;
    std::uint64_t site;  ///< this and the next three: the location
    char const* file;
    char const* function;
    std::uint32_t line;
    union {
        std::uint32_t size;    ///< of the array
        std::uint32_t number;  ///< of a POSIX record, whose size is fixed: errno
    };
};
static_assert(sizeof(ErrorInfo) == 64);

/// The operations of a kind of record. Texts stay with their record; unknown parameters are 0 and null.
struct ErrorOps {
    void (*Destroy)(ErrorInfo* info);
    /// A copy with one reference and no reason; null if there is no memory for it.
    ErrorInfo* (*Clone)(ErrorInfo const* info);
    /// The text of this record alone.
    void (*GetMessage)(ErrorInfo const* info, std::u16string& out);
    std::uint64_t (*GetNumber)(ErrorInfo const* info, char const* name);
    char const* (*GetAscii)(ErrorInfo const* info, char const* name);
    unsigned short const* (*GetWide)(ErrorInfo const* info, char const* name);
    /// The names of the parameters, with commas between them.
    char const* (*GetNames)(ErrorInfo const* info);
};

/// Ends one reference to a record, which may be null, and the chain behind it as far as nobody else owns it.
void Release(ErrorInfo* info);

/// A handle to a chain of records, from the failure as the caller saw it down to its reason. Handles to one
/// chain may be copied and dropped on several threads; one handle belongs to one thread at a time. Nothing
/// here throws, and with no memory left the handle holds a static record that says so.
class Error {
public:
    /// Success.
    Error() = default;
    /// A record without a text; none for code 0.
    Error(unsigned code, Location const& where);
    /// A record with a text, which is copied unless it lies in the catalogue in force.
    Error(unsigned code, unsigned short const* message, Location const& where);
    /// Takes over one reference to a record.
    explicit Error(ErrorInfo* owned) : info(owned) {}
    Error(Error const& other);
    Error(Error&& other) noexcept : info(other.info) { other.info = nullptr; }
    Error& operator=(Error other) noexcept;
    virtual ~Error() { Release(info); }

    /// True if there is a record with a code other than 0.
    explicit operator bool() const { return info != nullptr && info->code != 0; }

    ErrorInfo* info = nullptr;  ///< the head, null for success
};

/// Gives `error` a reason: the system's error number. A reason that it had is replaced; an error without a
/// record becomes this one. Chains that others hold, too, stay as they are. Result: `error`.
Error& AddReason(Error& error, unsigned number, Location const& where);

/// AddReason, from here.
Error& AddPosixError(Error& error, int number);

/// Rebuilds a chain that has been written as bytes. Where the bytes make no sense the chain ends; nothing is
/// reported.
Error ParseErrorChain(unsigned char const* data, unsigned size);

/// A copy of `text` that lives as long as the process, always the same for the same text. From any thread.
char const* InternString(char const* text);

}
