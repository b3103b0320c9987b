// Chains of records that another library has written as bytes, and the records they are rebuilt as:
//
//  0   head, with the offset of the message (TextRecord)
//  72  offset of the names
//  76  for each parameter, the offset of its value
//      message, UTF-16, ended by 0
//      names, with commas between them, ended by 0
//      values: a byte with the type, and 8 bytes, UTF-16 or 8-bit text, ended by 0. UTF-16 is aligned.

#include <common/error.h>

#include <common/error_record.h>
#include <common/mutex.h>
#include <common/utf8.h>

#include <algorithm>
#include <cstddef>
#include <cstring>
#include <memory>
#include <mutex>
#include <new>
#include <optional>
#include <set>

namespace Common {

namespace {

using Offset = std::uint32_t;

constexpr Offset kNamesSlot = sizeof(TextRecord);
constexpr Offset kValueSlots = kNamesSlot + sizeof(Offset);

enum ParameterType : char { TypeNumber = 'N', TypeWide = 'W', TypeAscii = 'A' };

Offset OffsetAt(ErrorInfo const* info, Offset slot)
{
    Offset offset;
    std::memcpy(&offset, reinterpret_cast<char const*>(info) + slot, sizeof offset);
    return offset;
}

char const* GetRebuiltNames(ErrorInfo const* info)
{
    return reinterpret_cast<char const*>(info) + OffsetAt(info, kNamesSlot);
}

/// A parameter's value, behind its type; null if there is no such parameter, or one of another type.
char const* FindValue(ErrorInfo const* info, std::string_view name, ParameterType type)
{
    // A name with a comma in it makes more names than values.
    auto const slotsEnd = static_cast<Offset>(static_cast<TextRecord const*>(info)->message);
    std::string_view names = GetRebuiltNames(info);
    for (Offset slot = kValueSlots; slot < slotsEnd; slot += sizeof(Offset)) {
        std::size_t const end = std::min(names.find(','), names.size());
        if (names.substr(0, end) == name) {
            char const* const value = reinterpret_cast<char const*>(info) + OffsetAt(info, slot);
            return *value == type ? value + 1 : nullptr;
        }
        names.remove_prefix(std::min(end + 1, names.size()));
    }
    return nullptr;
}

std::uint64_t GetRebuiltNumber(ErrorInfo const* info, char const* name)
{
    std::uint64_t number = 0;
    if (char const* const value = FindValue(info, name, TypeNumber))
        std::memcpy(&number, value, sizeof number);
    return number;
}

char const* GetRebuiltAscii(ErrorInfo const* info, char const* name)
{
    return FindValue(info, name, TypeAscii);
}

unsigned short const* GetRebuiltWide(ErrorInfo const* info, char const* name)
{
    return reinterpret_cast<unsigned short const*>(FindValue(info, name, TypeWide));
}

constexpr ErrorOps kRebuiltOps = {DestroyRecord, CloneRecord, GetTextMessage, GetRebuiltNumber,
    GetRebuiltAscii, GetRebuiltWide, GetRebuiltNames};

/// Takes text up to its 0, and the 0; nothing if there is none.
std::optional<std::string_view> TakeText(std::string_view& rest)
{
    std::size_t const end = rest.find('\0');
    if (end == std::string_view::npos) return std::nullopt;
    std::string_view const text = rest.substr(0, end);
    rest.remove_prefix(end + 1);
    return text;
}

template <class Number>
std::optional<Number> TakeNumber(std::string_view& rest)
{
    if (rest.size() < sizeof(Number)) return std::nullopt;
    Number number;
    std::memcpy(&number, rest.data(), sizeof number);
    rest.remove_prefix(sizeof number);
    return number;
}

struct Parameter {
    std::string_view name;  // empty behind the last parameter
    char type = 0;
    std::string_view text;
    std::uint64_t number = 0;

    bool Is(std::string_view otherName, ParameterType otherType) const
    {
        return name == otherName && type == otherType;
    }
    bool IsLocation() const
    {
        return Is("$file", TypeAscii) || Is("$func", TypeAscii) || Is("$line", TypeNumber);
    }
};

/// Nothing if the parameter runs past the end or is of no known type.
std::optional<Parameter> TakeParameter(std::string_view& rest)
{
    Parameter parameter;
    auto const name = TakeText(rest);
    if (!name) return std::nullopt;
    parameter.name = *name;
    if (name->empty()) return parameter;
    if (rest.empty()) return std::nullopt;
    parameter.type = rest.front();
    rest.remove_prefix(1);
    if (parameter.type == TypeNumber) {
        auto const number = TakeNumber<std::uint64_t>(rest);
        if (!number) return std::nullopt;
        parameter.number = *number;
    } else if (parameter.type == TypeWide || parameter.type == TypeAscii) {
        auto const text = TakeText(rest);
        if (!text) return std::nullopt;
        parameter.text = *text;
    } else {
        return std::nullopt;
    }
    return parameter;
}

/// A record under construction. Throws std::bad_alloc, also when the size no longer fits into a record.
class RecordBuffer {
public:
    Offset Size() const { return size; }
    ErrorInfo* Info() { return reinterpret_cast<ErrorInfo*>(bytes.get()); }

    /// Where the zeros begin that are appended.
    Offset AppendZeros(std::size_t count)
    {
        Reserve(count);
        std::fill_n(bytes.get() + size, count, static_cast<unsigned char>(0));
        Offset const start = size;
        size += static_cast<Offset>(count);
        return start;
    }

    void Append(void const* data, std::size_t count)
    {
        Offset const start = AppendZeros(count);
        if (count > 0) std::memcpy(bytes.get() + start, data, count);
    }

    void SetOffset(Offset slot, Offset offset) { std::memcpy(bytes.get() + slot, &offset, sizeof offset); }

    unsigned char* Finish()
    {
        Info()->size = size;
        return bytes.release();
    }

private:
    void Reserve(std::size_t count)
    {
        std::size_t const needed = size + count;
        if (needed <= capacity) return;
        std::size_t const grown = std::max(needed, capacity + capacity / 2);
        std::unique_ptr<unsigned char[]> larger(needed <= UINT32_MAX ? NewRecordArray(grown) : nullptr);
        if (larger == nullptr) throw std::bad_alloc();
        std::copy_n(bytes.get(), size, larger.get());
        bytes = std::move(larger);
        capacity = grown;
    }

    std::unique_ptr<unsigned char[]> bytes;
    Offset size = 0;
    std::size_t capacity = 0;
};

void AppendText(RecordBuffer& record, std::u16string const& text)
{
    record.Append(text.c_str(), (text.size() + 1) * sizeof(char16_t));
}

void AppendText(RecordBuffer& record, std::string_view text)
{
    record.Append(text.data(), text.size());
    record.AppendZeros(1);
}

void SetLocation(ErrorInfo& info, Parameter const& parameter)
{
    if (parameter.type == TypeNumber)
        info.line = static_cast<std::uint32_t>(parameter.number);
    else
        (parameter.name == "$file" ? info.file : info.function) = InternString(parameter.text.data());
}

/// False if the value is text that is no UTF-8.
bool AppendValue(RecordBuffer& record, Offset slot, Parameter const& parameter)
{
    std::u16string wide;
    if (parameter.type == TypeWide) {
        if (!DecodeUtf8(wide, parameter.text.data(), parameter.text.size())) return false;
        if (record.Size() % sizeof(char16_t) == 0) record.AppendZeros(1);
    }
    record.SetOffset(slot, record.Size());
    record.Append(&parameter.type, 1);
    if (parameter.type == TypeNumber)
        record.Append(&parameter.number, sizeof parameter.number);
    else if (parameter.type == TypeWide)
        AppendText(record, wide);
    else
        AppendText(record, parameter.text);
    return true;
}

/// The names of the parameters that are stored, and their number; takes all parameters from `rest`.
struct ParameterList {
    std::string names;
    std::size_t count = 0;
};

std::optional<ParameterList> TakeParameters(std::string_view& rest)
{
    ParameterList list;
    for (;;) {
        auto const parameter = TakeParameter(rest);
        if (!parameter) return std::nullopt;
        if (parameter->name.empty()) return list;
        if (parameter->IsLocation()) continue;
        if (list.count++ > 0) list.names += ',';
        list.names += parameter->name;
    }
}

/// Takes a record with one reference from `rest`; null at the end of the chain.
ErrorInfo* TakeRecord(std::string_view& rest)
{
    auto const code = TakeNumber<std::uint32_t>(rest);
    auto const site = TakeNumber<std::uint64_t>(rest);
    if (!code || *code == 0 || !site) return nullptr;
    auto const utf8 = TakeText(rest);
    std::u16string message;
    if (!utf8 || !DecodeUtf8(message, utf8->data(), utf8->size())) return nullptr;
    std::string_view parameters = rest;
    auto const list = TakeParameters(rest);
    if (!list) return nullptr;

    RecordBuffer record;
    record.AppendZeros(kValueSlots + list->count * sizeof(Offset));
    record.Info()->refs = 1;
    record.Info()->ops = &kRebuiltOps;
    record.Info()->code = *code;
    record.Info()->site = *site;
    static_cast<TextRecord*>(record.Info())->message = record.Size();
    AppendText(record, message);
    record.SetOffset(kNamesSlot, record.Size());
    AppendText(record, list->names);

    Offset slot = kValueSlots;
    for (auto parameter = TakeParameter(parameters); !parameter->name.empty();
         parameter = TakeParameter(parameters)) {
        if (parameter->IsLocation()) {
            SetLocation(*record.Info(), *parameter);
            continue;
        }
        if (!AppendValue(record, slot, *parameter)) return nullptr;
        slot += sizeof(Offset);
    }
    return reinterpret_cast<ErrorInfo*>(record.Finish());
}

}

Error ParseErrorChain(unsigned char const* data, unsigned size)
{
    Error chain;
    std::string_view rest(reinterpret_cast<char const*>(data), size);
    if (!rest.starts_with('\x01')) return chain;
    rest.remove_prefix(1);
    ErrorInfo** next = &chain.info;
    try {
        while ((*next = TakeRecord(rest)) != nullptr)
            next = &(*next)->reason;
    } catch (std::bad_alloc const&) {
        *next = OutOfMemoryRecord();
    }
    return chain;
}

char const* InternString(char const* text)
{
    struct Less {
        bool operator()(char const* a, char const* b) const { return std::strcmp(a, b) < 0; }
    };
    static Mutex mutex;
    static auto& texts = *new std::set<char const*, Less>;  // guarded by mutex
    std::lock_guard const lock(mutex);
    auto const found = texts.find(text);
    if (found != texts.end()) return *found;
    std::size_t const size = std::strlen(text) + 1;
    std::unique_ptr<char[]> copy(new char[size]);
    std::memcpy(copy.get(), text, size);
    texts.insert(copy.get());
    return copy.release();
}

}
