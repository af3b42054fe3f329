// The tool's exit statuses and the error that ends a command with bad usage or input.
//
// A command throws UsageError for anything the user asked wrongly (unknown stat or node, wrong
// instance or key count, a bad host file); main prints "tarnstats: " and the message on one line
// of stderr and exits with kExitBadInput. kExitNoValue is returned when a request or read yields
// no value; the command prints its own reason. Any other exception ends the tool with
// kExitInternal.
#pragma once

#include <stdexcept>
#include <string>

namespace Tool {

enum ExitStatus : int {
    kExitOk = 0,
    kExitNoValue = 1,
    kExitBadInput = 2,
    kExitInternal = 3,  // the library or the tool failed in a way no input explains
};

class UsageError : public std::runtime_error {
public:
    explicit UsageError(const std::string& message) : std::runtime_error(message) {}
};

}  // namespace Tool
