#pragma once

#include <atomic>
#include <map>
#include <mutex>
#include <string>

/// What the resource service does in a test program that links its twin in memory.
struct MemoryBundle {
    std::map<std::string, std::string> files;
    bool hasArchive = true;
    bool failing = false;  ///< every operation on an open file fails, after reading one byte
    std::string failure;   ///< the error chain that it tells, if any
    std::u16string path;   ///< of the last module
    std::mutex mutex;      ///< guards path
    std::atomic<int> modules = 0, openFiles = 0, calls = 0;
};
extern MemoryBundle memoryBundle;
