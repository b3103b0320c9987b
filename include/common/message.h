#pragma once

/// Keys of the messages that the library looks up. A key is the same in every catalogue.
enum MessageKey : unsigned {
    MessageAccessDenied = 53,
    MessageFileExists = 54,
    MessageBackupFailed = 56,
    MessageCanceled = 59,
    MessageFileCorrupted = 61,
    MessageCreateFailed = 62,
    MessageDiskFull = 65,
    MessageEndOfFile = 68,
    MessageLockFailed = 75,
    MessageNoSuchFile = 79,
    MessageDriveNotReady = 81,
    MessageOpenFailed = 83,
    MessageOutOfMemory = 84,
    MessageFileReadOnly = 85,
    MessageReadFailed = 86,
    MessageDeleteFailed = 87,
    MessageRenameFailed = 88,
    MessageWriteDenied = 90,
    MessageSeekFailed = 91,
    MessageNotSupported = 94,
    MessageWriteFailed = 99,
};

/// The text of a key, ended by 0, in the catalogue in force; it stays for the life of the process. The key is
/// below the number of entries. Leaves errno alone. From any thread.
unsigned short const* GetMessage(unsigned key);

/// True if `text` lies in the catalogue in force.
bool IsInCatalogue(unsigned short const* text);
