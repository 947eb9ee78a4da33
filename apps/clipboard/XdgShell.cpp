// What wayland-scanner writes of the xdg-shell protocol is C. Read as C++, its constants are seen by other files only
// where a declaration came before them.

#include <xdg-shell-client-protocol.h>

#include <xdg-shell-protocol.c> // NOLINT(bugprone-suspicious-include)
