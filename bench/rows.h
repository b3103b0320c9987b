#pragma once

#include <functional>
#include <string>

namespace benchmark {
class State;
}

// A row of the table is the same work, done by us and by others in the same run. Each group of rows is a
// program of its own; they share main().

/// Names of the contenders. Everyone but `kOurs` is a peer.
inline constexpr char kOurs[] = "tessella";
inline constexpr char kPixman[] = "pixman";
inline constexpr char kSdl[] = "SDL2";
inline constexpr char kMemset[] = "memset";
inline constexpr char kPlain[] = "plain loop";
inline constexpr char kLibzip[] = "libzip";

/// Has `contender` take part in `row`; `body` measures its loop over the state. table.py knows by the row's
/// name what ratio is to be reached.
void AddContender(
    std::string const& row, char const* contender, std::function<void(benchmark::State&)> const& body);

/// Ends the program unless the contenders of the row come to the same result.
void ExpectSame(bool same, std::string const& row);

/// Adds the contenders of all rows of a group; defined by the group.
void AddRows();
