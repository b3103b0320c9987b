#pragma once

#include <atomic>
#include <map>
#include <string>

/// The resource service of test programs that link its twin in memory.
struct MemoryBundle {
    std::map<std::string, std::string> files = {{"file", "data"}};
    bool hasArchive = true;
    bool failing = false;          ///< every operation on an open file fails, after reading one byte
    std::string failure;           ///< the error chain that it tells, if any
    std::u16string path;           ///< of the first module
    std::string loaded = "data";   ///< what loading a file gives
    void (*callback)() = nullptr;  ///< the last that has subscribed to changes of language
    bool callsBack = false;        ///< it is called at once
    /// Counts an operation; false if it fails.
    bool Call() { return ++calls > 0 && !failing; }
    std::atomic<int> modules = 0, openFiles = 0, calls = 0, subscriptions = 0;
};
extern MemoryBundle memoryBundle;
