#pragma once

#include <common/error.h>

namespace Common {

/// The head of a record with a text.
struct TextRecord : ErrorInfo {
    std::uint64_t message;  ///< its offset from the record's start, or its address in a catalogue
};

/// Memory of a record; null if there is none.
unsigned char* NewRecordArray(std::size_t size);

/// The record that tells of a lack of memory, with one reference more. It needs no memory.
ErrorInfo* OutOfMemoryRecord();

void DestroyRecord(ErrorInfo* info);
ErrorInfo* CloneRecord(ErrorInfo const* info);
void GetTextMessage(ErrorInfo const* info, std::u16string& out);

}
