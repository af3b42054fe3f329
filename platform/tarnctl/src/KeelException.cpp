#include "Keel/KeelException.h"

#include <utility>

namespace Keel {
namespace Lib {

KeelException::KeelException(std::string message) : message_(std::move(message)) {}

KeelException::~KeelException() = default;

std::string KeelException::GetMessage(int verbosity) const {
    if (verbosity <= 0) {
        return message_;
    }
    return "KeelException: " + message_;
}

const char* KeelException::what() const noexcept { return message_.c_str(); }

}  // namespace Lib
}  // namespace Keel
