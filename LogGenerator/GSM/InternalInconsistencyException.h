// InternalInconsistencyException: the assertion failure of the object-based GSM generator, raised when a blob
// breaks an assumption the generator cannot recover from (it is not a property list, or it holds a value
// that is not a string, dictionary or array).
//
// Contract: carries the failing operation, the receiver, the source file name, the line number and the
// description. Nothing catches it: one that leaves the generator ends the program.
#pragma once

#include <exception>
#include <string>

namespace velmar {

class InternalInconsistencyException : public std::exception {
  public:
    InternalInconsistencyException(std::string method, std::string object, std::string file, int line,
                                   std::string description);

    const std::string& method() const { return method_; }
    const std::string& object() const { return object_; }
    const std::string& file() const { return file_; }
    int line() const { return line_; }
    const std::string& description() const { return description_; }

    // "Assertion failure in <method> (<file>:<line>): <description>"
    const char* what() const noexcept override { return message_.c_str(); }

  private:
    std::string method_;
    std::string object_;
    std::string file_;
    int line_;
    std::string description_;
    std::string message_;
};

}  // namespace velmar
