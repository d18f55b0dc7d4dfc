// RuntimeDirectory: where message-port sockets live: $VELMAR_RUNTIME_DIR, else $XDG_RUNTIME_DIR/velmar, else
// /tmp/velmar-<uid>. The directory is created with mode 0700 on first use.
//
// Contract: path() answers the directory only when it is a real directory (not a symbolic link) owned by
// this user and private (an existing one is narrowed to 0700); otherwise nullopt with the reason in why and
// in the system log. A relative $VELMAR_RUNTIME_DIR is refused; a relative $XDG_RUNTIME_DIR is ignored, as
// the XDG rules say. socketPathFor() also refuses a name with a '/' in it and a path that a Unix socket
// address cannot hold.
#pragma once

#include <optional>
#include <string>

namespace velmar {

class RuntimeDirectory {
  public:
    // The directory, created if needed; nullopt (with a logged reason) when it cannot be made private.
    static std::optional<std::string> path(std::string* why = nullptr);
    // The socket file of the port named `name`.
    static std::optional<std::string> socketPathFor(const std::string& name, std::string* why = nullptr);
};

}  // namespace velmar
