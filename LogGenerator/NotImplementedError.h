// NotImplementedError: raised by an abstract operation that the receiving class does not implement.
// It marks a programming fault, not a run-time path; nothing catches it.
#pragma once

#include <stdexcept>
#include <string>

namespace velmar {

class NotImplementedError : public std::logic_error {
  public:
    explicit NotImplementedError(const std::string& operation)
        : std::logic_error(operation + " is not implemented by this class") {}
};

}  // namespace velmar
