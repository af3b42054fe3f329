// Host description files: a simulated host written as JSON, read into a HostSim::Host.
//
// The format (docs/host-format.md) describes the host as a user thinks of it: VMs with their
// managed object id, world id, world group id, vCPUs, vNIC ports, virtual disks (vSCSI handle and
// device name) and the LUNs they use; the host's LUNs, storage adapters, storage paths and
// physical NICs; and under "values" in each object the value of any of that object's stats, by
// stat name (the object type follows from where the object stands).
//
// Guarantees: a file is read completely and checked completely before anything is returned: the
// result is either a whole Host that BuildTree accepts, or an exception. Nothing is cached.
// Throws: HostFileError, whose what() is one line "SOURCE:LINE:COLUMN: POINTER: MESSAGE" (LINE
// and COLUMN 1-based, COLUMN in bytes; POINTER the JSON pointer of the offending value, left out
// for syntax errors and for the whole document) or "SOURCE: MESSAGE" when the file cannot be
// read. MESSAGE says what was expected and what was found.
#pragma once

#include <cstddef>
#include <stdexcept>
#include <string>

#include "hostsim/Host.h"

namespace HostSim {

class HostFileError : public std::runtime_error {
public:
    // `line` 0: the error has no position (the file could not be read).
    HostFileError(std::string source, std::size_t line, std::size_t column, std::string pointer,
                  std::string message);

    const std::string& Source() const noexcept { return source_; }
    std::size_t Line() const noexcept { return line_; }
    std::size_t Column() const noexcept { return column_; }
    const std::string& Pointer() const noexcept { return pointer_; }
    const std::string& Message() const noexcept { return message_; }

private:
    std::string source_;
    std::size_t line_;
    std::size_t column_;
    std::string pointer_;
    std::string message_;
};

// The only version of the format: the value of the top-level member "version".
constexpr int kHostFileVersion = 1;

// Reads the file at `path`; `path` names the source in messages.
// THROWS HostFileError (see above).
Host LoadHostFile(const std::string& path);

// Reads a host description held in memory; `source` names it in messages.
// THROWS HostFileError (see above).
Host ParseHostText(const std::string& text, const std::string& source);

}  // namespace HostSim
