#pragma once

#include <cstdint>
#include <string>
#include <vector>

/// A record of an error chain that another library writes as bytes.
struct ChainRecord {
    struct Parameter {
        std::string name;
        char type;
        std::string text;
        std::uint64_t number;
    };
    std::uint32_t code;
    std::uint64_t site;
    std::string message;
    std::vector<Parameter> parameters;
};

template <class T>
std::string BytesOf(T const& value)
{
    return {reinterpret_cast<char const*>(&value), sizeof value};
}

/// The chain's bytes, but for the code 0 that may end it.
inline std::string ChainBytes(std::vector<ChainRecord> const& chain)
{
    std::string bytes = "\1";
    for (auto const& record : chain) {
        bytes += BytesOf(record.code) + BytesOf(record.site) + record.message + '\0';
        for (auto const& p : record.parameters)
            bytes += p.name + '\0' + p.type + (p.type == 'N' ? BytesOf(p.number) : p.text + '\0');
        bytes += '\0';
    }
    return bytes;
}
