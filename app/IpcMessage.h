// app/IpcMessage.h - the messages of the command channel as they stand on the wire.
//
// The wire format of the toolkit's own socket connections: a byte that says what it is, then, as
// the code has them, a name, the format of the data, and the data. Names and data follow their
// length in four bytes, the lowest first. Lengths come from strangers: they are bounded before
// anything is kept.
#pragma once

#include <cstddef>
#include <string>

enum IpcCode {
    IPC_EXECUTE = 1,       // format, data
    IPC_REQUEST = 2,       // name, format
    IPC_POKE = 3,          // name, format, data; no answer
    IPC_ADVISE_START = 4,  // name; answered by the code alone, or IPC_FAIL
    IPC_ADVISE = 6,        // name, format, data; from the server
    IPC_ADVISE_STOP = 7,   // like IPC_ADVISE_START
    IPC_REQUEST_REPLY = 8, // data
    IPC_FAIL = 9,
    IPC_CONNECT = 10, // name (the topic); answered by the code alone, or IPC_FAIL
    IPC_DISCONNECT = 11
};

enum IpcFormat {
    IPC_TEXT = 1,
    IPC_UTF16_TEXT = 13,
    IPC_UTF8_TEXT = 17,
    IPC_UTF32_TEXT = 18,
    IPC_PRIVATE = 20 // what programs say that name no format
};

enum { IPC_NAME_SIZE = 256, IPC_DATA_SIZE = 64 * 1024 };

enum IpcSide { IPC_FROM_CLIENT, IPC_FROM_SERVER };

struct IpcMessage {
    int code;
    int format;
    std::string name; // topic or item
    std::string data;
};

// Reads the message that starts at `bytes`. IPC_COMPLETE: `*message` holds it, `*used` says how
// many bytes it took. IPC_MORE: they are the start of one. IPC_BAD: no message of that side starts
// so, or it is too long. Only IPC_COMPLETE changes `*message` and `*used`.
enum IpcResult { IPC_MORE, IPC_COMPLETE, IPC_BAD };
IpcResult Ipc_Decode(IpcSide from, const char *bytes, size_t length, IpcMessage *message,
                     size_t *used);

// The text of an IPC_EXECUTE, up to its first NUL: 8-bit text as it is, Unicode as UTF-8. 0 when
// the data is no text.
int Ipc_CommandText(const IpcMessage *message, std::string *text);

// Messages and answers, ready to be sent. Texts go as UTF-8 when they are UTF-8, else as 8-bit
// text, and with the NUL at their end.
std::string Ipc_CodeAlone(IpcCode code);
std::string Ipc_Connect(const char *topic);
std::string Ipc_Execute(const char *text);
std::string Ipc_Request(const char *item);
std::string Ipc_Poke(const char *item, const char *text);
std::string Ipc_Advise(const char *item, const char *text);
std::string Ipc_Reply(const std::string &data);
