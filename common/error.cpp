#include <common/error.h>

#include <common/error_record.h>
#include <common/message.h>

#include <array>
#include <atomic>
#include <bit>
#include <cstddef>
#include <cstring>
#include <new>
#include <string_view>
#include <utility>

namespace Common {

namespace {

constexpr char kModuleId[] = "tessella_glxa64_3500";
constexpr char kModuleName[] = "$module";

ErrorInfo* CloneBytes(ErrorInfo const* info, std::size_t size)
{
    unsigned char* const memory = NewRecordArray(size);
    if (memory == nullptr) return nullptr;
    // All but the count, which may be changing.
    constexpr std::size_t kCopied = offsetof(ErrorInfo, code);
    std::memcpy(memory + kCopied, reinterpret_cast<unsigned char const*>(info) + kCopied, size - kCopied);
    auto* const clone = reinterpret_cast<ErrorInfo*>(memory);
    clone->refs = 1;
    clone->reason = nullptr;
    return clone;
}

ErrorInfo* ClonePosix(ErrorInfo const* info) { return CloneBytes(info, sizeof(ErrorInfo)); }

void GetNoMessage(ErrorInfo const* /*info*/, std::u16string& out) { out.clear(); }

void GetPosixMessage(ErrorInfo const* info, std::u16string& out)
{
    std::array<char, 256> buffer;
    std::string_view const text = strerror_r(static_cast<int>(info->number), buffer.data(), buffer.size());
    out.clear();
    for (char const letter : text)
        out += static_cast<unsigned char>(letter);
}

std::uint64_t GetNoNumber(ErrorInfo const* /*info*/, char const* /*name*/) { return 0; }

std::uint64_t GetPosixNumber(ErrorInfo const* info, char const* name)
{
    return std::string_view(name) == "code" ? info->number : 0;
}

char const* GetModule(ErrorInfo const* /*info*/, char const* name)
{
    return std::string_view(name) == kModuleName ? kModuleId : nullptr;
}

unsigned short const* GetNoWide(ErrorInfo const* /*info*/, char const* /*name*/) { return nullptr; }
char const* GetModuleName(ErrorInfo const* /*info*/) { return kModuleName; }
char const* GetPosixNames(ErrorInfo const* /*info*/) { return "code,$module"; }

constexpr ErrorOps kPlainOps = {
    DestroyRecord, CloneRecord, GetNoMessage, GetNoNumber, GetModule, GetNoWide, GetModuleName};
constexpr ErrorOps kTextOps = {
    DestroyRecord, CloneRecord, GetTextMessage, GetNoNumber, GetModule, GetNoWide, GetModuleName};
constexpr ErrorOps kPosixOps = {
    DestroyRecord, ClonePosix, GetPosixMessage, GetPosixNumber, GetModule, GetNoWide, GetPosixNames};

/// Its own reference keeps it from being freed.
constinit ErrorInfo outOfMemory = {
    1, ErrorOutOfMemory, nullptr, &kPlainOps, 0, nullptr, nullptr, 0, {sizeof(ErrorInfo)}};

void AddReference(ErrorInfo* info)
{
    if (info != nullptr) std::atomic_ref(info->refs).fetch_add(1, std::memory_order_relaxed);
}

/// A record with one reference, or one more to the static record.
ErrorInfo* NewRecord(ErrorOps const& ops, unsigned code, Location const& where, std::uint32_t size)
{
    unsigned char* const memory = NewRecordArray(size);
    if (memory == nullptr) return OutOfMemoryRecord();
    return new (memory)
        ErrorInfo{1, code, nullptr, &ops, where.site, where.file, where.function, where.line, {size}};
}

ErrorInfo* NewTextRecord(unsigned code, unsigned short const* message, Location const& where)
{
    if (message == nullptr) return NewRecord(kPlainOps, code, where, sizeof(ErrorInfo));
    std::size_t copied = 0;
    if (!IsInCatalogue(message)) {
        while (message[copied] != 0)
            ++copied;
        copied = (copied + 1) * sizeof *message;
    }
    ErrorInfo* const info =
        NewRecord(kTextOps, code, where, static_cast<std::uint32_t>(sizeof(TextRecord) + copied));
    if (info == &outOfMemory) return info;
    auto* const record = static_cast<TextRecord*>(info);
    if (copied == 0) {
        record->message = std::bit_cast<std::uint64_t>(message);
    } else {
        record->message = sizeof(TextRecord);
        std::memcpy(record + 1, message, copied);
    }
    return record;
}

}

unsigned char* NewRecordArray(std::size_t size) { return new (std::nothrow) unsigned char[size]; }

ErrorInfo* OutOfMemoryRecord()
{
    AddReference(&outOfMemory);
    return &outOfMemory;
}

void DestroyRecord(ErrorInfo* info) { delete[] reinterpret_cast<unsigned char*>(info); }

ErrorInfo* CloneRecord(ErrorInfo const* info) { return CloneBytes(info, info->size); }

void GetTextMessage(ErrorInfo const* info, std::u16string& out)
{
    std::uint64_t const message = static_cast<TextRecord const*>(info)->message;
    auto const* text = message < info->size
        ? reinterpret_cast<unsigned short const*>(reinterpret_cast<unsigned char const*>(info) + message)
        : std::bit_cast<unsigned short const*>(message);
    for (out.clear(); *text != 0; ++text)
        out += static_cast<char16_t>(*text);
}

void Release(ErrorInfo* info)
{
    while (info != nullptr) {
        if (std::atomic_ref(info->refs).fetch_sub(1, std::memory_order_acq_rel) != 1) return;
        ErrorInfo* const reason = info->reason;
        info->ops->Destroy(info);
        info = reason;
    }
}

Error::Error(unsigned code, Location const& where)
    : info(code == 0 ? nullptr : NewRecord(kPlainOps, code, where, sizeof(ErrorInfo)))
{}

Error::Error(unsigned code, unsigned short const* message, Location const& where)
    : info(NewTextRecord(code, message, where))
{}

Error::Error(Error const& other) : info(other.info) { AddReference(info); }

Error& Error::operator=(Error other) noexcept
{
    std::swap(info, other.info);
    return *this;
}

Error& AddReason(Error& error, unsigned number, Location const& where)
{
    ErrorInfo* const reason = NewRecord(kPosixOps, ErrorPosix, where, sizeof(ErrorInfo));
    if (reason != &outOfMemory) reason->number = number;
    if (error.info == nullptr) {
        error.info = reason;
    } else if (std::atomic_ref(error.info->refs).load(std::memory_order_acquire) == 1) {
        Release(std::exchange(error.info->reason, reason));
    } else if (ErrorInfo* const clone = error.info->ops->Clone(error.info)) {
        clone->reason = reason;
        Release(std::exchange(error.info, clone));
    } else {
        Release(reason);
    }
    return error;
}

Error& AddPosixError(Error& error, int number)
{
    return AddReason(error, static_cast<unsigned>(number), LocationOf("common/error", "AddPosixError", 339));
}

}
