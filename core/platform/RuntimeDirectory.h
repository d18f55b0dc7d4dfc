// RuntimeDirectory: where message-port sockets live: $VELMAR_RUNTIME_DIR, else $XDG_RUNTIME_DIR/velmar, else
// /tmp/velmar-<uid>. The directory is created with mode 0700 on first use.
#pragma once

#include <optional>
#include <string>

namespace velmar {

class RuntimeDirectory {
public:
    // The directory, created if needed; nullopt (with a logged reason) when it cannot be made private.
    static std::optional<std::string> path();
    // The socket file of the port named `name`.
    static std::optional<std::string> socketPathFor(const std::string& name);
};

}  // namespace velmar
