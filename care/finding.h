#pragma once

#include <string>
#include <vector>

namespace care {

enum class Severity { Fine, Limits, Unusable };

/// What the doctor has seen of one part of the machine.
struct Finding {
    char const* part;
    Severity severity;
    std::string seen;
    std::string mend;  ///< what to do about it; empty where nothing is to be done
};

using Findings = std::vector<Finding>;

/// Each looks at one part, changes nothing there, and adds at least one finding.
void CheckScreen(Findings& findings);
void CheckConsole(Findings& findings);
void CheckMouse(Findings& findings);
void CheckResources(Findings& findings);

/// "PATH: the system's words for the error", and what helps against errors of opening a device.
std::string CannotOpen(char const* path, int error);
std::string MendOpening(char const* path, int error, char const* whenMissing);

}
