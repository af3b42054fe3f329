// The exception by which every operation of the kernel control library reports failure.
//
// Guarantees: the message given at construction is kept unchanged; GetMessage(0) and what()
// both return it (what() as a pointer that lives as long as the exception object).
// Copying is allowed and keeps the text. Nothing here throws except the constructor and
// GetMessage, which may throw std::bad_alloc.
#pragma once

#include <exception>
#include <string>

namespace Keel {
namespace Lib {

class KeelException : public std::exception {
public:
    explicit KeelException(std::string message);
    ~KeelException() override;
    KeelException(const KeelException&) = default;
    KeelException& operator=(const KeelException&) = default;

    // The message text. `verbosity` selects how much detail to add: 0 (or less) gives the plain
    // text; a positive value prefixes the exception's kind ("KeelException: <text>").
    virtual std::string GetMessage(int verbosity) const;
    const char* what() const noexcept override;

private:
    std::string message_;
};

}  // namespace Lib
}  // namespace Keel
