#include "LogGenerator/GSM/InternalInconsistencyException.h"

namespace velmar {

InternalInconsistencyException::InternalInconsistencyException(std::string method, std::string object,
                                                               std::string file, int line,
                                                               std::string description)
    : method_(std::move(method)),
      object_(std::move(object)),
      file_(std::move(file)),
      line_(line),
      description_(std::move(description)),
      message_("Assertion failure in " + method_ + " (" + file_ + ":" + std::to_string(line_) +
               "): " + description_) {}

}  // namespace velmar
