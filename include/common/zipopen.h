#pragma once

class si_file;

namespace BundleApi {
struct ModuleHandle;
}

/// Opens a file of the library's own archive in the language in force; the caller deletes it. Null if there
/// is no such file.
si_file* ZipOpen(char const* name);

/// All of a file of the archive, in an array that the caller deletes, and its size. Null if it cannot be had.
unsigned char* ZipLoad(char const* name, unsigned int* size);

/// The archive in the library's own file: opened by the first call, and closed when the process exits. Null
/// if there is none; the next call tries again. From any thread.
BundleApi::ModuleHandle* GetZipModule();
