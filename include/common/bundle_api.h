#pragma once

/// The resource service: libbundle.so reads the files of an archive that lies in a section of an ELF file,
/// and knows the language in force.
///
/// The archive is a ZIP file in the first section of the name ".zip". A folder at its top, named by a
/// language, holds the files that differ in that language, under the names they have at the root; what it
/// has not comes from the root. The root's file `locales` lists the languages, with commas between them.
///
/// The language in force is the one that SetLanguage has named, or else the first of the environment's
/// LC_ALL, LC_MESSAGES and LANG that is neither unset nor empty, as it stands when it is first needed. Of
/// "pt_BR.UTF-8" an archive takes the folder `pt_BR` if its `locales` has it, else `pt`, else the root's
/// files alone.
///
/// All functions may be called from any thread, with an open file on one thread at a time. Nothing here
/// throws as long as there is memory, and no damage to a file does worse than make a call fail.
namespace BundleApi {

#define BUNDLE_API __attribute__((visibility("default")))

/// An archive.
struct ModuleHandle;
/// A file of an archive, open for reading; outlives the closing of its module.
struct FileHandle;

/// Opens the archive in the file of this path, whose units are the path's bytes. Null if there is none that
/// can be read, or `path` is null.
BUNDLE_API ModuleHandle* OpenModule(unsigned short const* path);

/// Ends a module, which may be null.
BUNDLE_API void CloseModule(ModuleHandle* module);

/// Opens a file in the language in force. There are no variants: `variant` is null. Null if there is no
/// such file, it is damaged, or `module` is null.
BUNDLE_API FileHandle* OpenFile(ModuleHandle* module, char const* name, char const* variant);

/// All of a file, found as by OpenFile, in a new array that the caller deletes, and its size. Null, with
/// `size` left alone, if there is no such file, or it cannot be read to its end.
BUNDLE_API unsigned char* LoadFile(
    ModuleHandle* module, char const* name, char const* variant, unsigned int* size);

/// Reads up to `size` bytes from the position on; `read` gets how many, 0 at the end, also after a failure.
/// False if the file cannot be read or turns out to be damaged, which may not show before its end.
BUNDLE_API bool ReadFile(FileHandle* file, void* buffer, unsigned int size, unsigned int* read);

/// The size of the file as it is when unpacked. False for a null file.
BUNDLE_API bool GetFileSize(FileHandle* file, unsigned long long* size);

/// Back to position 0. False if that fails.
BUNDLE_API bool RewindFile(FileHandle* file);

/// What went wrong last, as bytes of an error chain (ParseErrorChain in common/error.h) in a new array that
/// the caller deletes, and their number. Null if nothing did. The first record has a text in the language in
/// force, from the archive's `tessella.msg` or else in English, and tells the entry and the archive's file by
/// its parameters "entry" and "archive"; its reason has what the unpacker says.
BUNDLE_API unsigned char* GetFileError(FileHandle* file, unsigned int* size);

/// Ends a file, which may be null.
BUNDLE_API void CloseFile(FileHandle* file);

/// Has `callback` called at each change of language, on the thread that makes it, and once at once, on this
/// one. A callback that is subscribed already is only called.
BUNDLE_API void SubscribeLanguageEvents(void (*callback)());

/// Ends the subscription. A call on another thread may still be on its way.
BUNDLE_API void UnsubscribeLanguageEvents(void (*callback)());

/// Puts a language in force, such as "de" or "pt_BR.UTF-8", for files that are opened from now on, and
/// calls the subscribers. Null goes back to what the environment says.
BUNDLE_API void SetLanguage(char const* language);

}
