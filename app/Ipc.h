// app/Ipc.h - the command channel: a service on a local socket that takes command lines.
//
// Speaks the wire format of the toolkit's own socket connections, so that any program built on
// those can be a peer. A service name of any form maps to one path (Sys_PrivatePath); where the
// name is itself a path at which a socket can stand, the service is there as well.
//
// Peers are not trusted to be well: nothing waits for them, what they send is bounded, and only a
// message that arrived completely is carried out.
#pragma once

#include <string>

class MyFrame;
class MyServer; // app/IpcServer.h

// What every connection is about; others are refused.
inline constexpr char Ipc_Topic[] = "CommandLine";

// The socket path of a service; "" when there is none (Sys_LastErrorText() says why).
std::string Ipc_SocketPath(const char *service);

// The name of the service itself, where a socket can stand at it, else "".
std::string Ipc_NamedPath(const char *service);

// Serves `service` for the frame, in the event loop; null, logged, when that fails. The caller
// deletes the server; it may outlive the frame.
MyServer *StartCommandServer(const char *service, MyFrame *frame);

// Hands a command line to who serves `service`. Connecting and sending may take `milliseconds`
// each. Returns 1 when it was sent completely and not left unread, else 0, logged.
int SendCommand(const char *service, const char *text, int milliseconds = 1000);
