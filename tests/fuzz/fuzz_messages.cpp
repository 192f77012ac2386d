// tests/fuzz/fuzz_messages.cpp - any bytes as what a peer of the command channel sends.
//
// Whatever pieces they arrive in, the same messages come out, within their bounds, and every one
// takes exactly the bytes that belong to it.
#include <algorithm>
#include <cstdint>
#include <cstring>
#include <string>
#include <vector>

#include "app/IpcMessage.h"
#include "tests/fuzz/Demand.h"

static void CheckBounds(const IpcMessage &message, size_t used, size_t length)
{
    DEMAND(used > 0 && used <= length);
    DEMAND(message.name.size() <= IPC_NAME_SIZE);
    DEMAND(message.data.size() <= IPC_DATA_SIZE);
    DEMAND(used <= 1 + 4 + message.name.size() + 1 + 4 + message.data.size());
}

static void CheckText(const IpcMessage &message)
{
    std::string text;
    if (!Ipc_CommandText(&message, &text))
        return;
    DEMAND(text.find('\0') == text.npos);
    DEMAND(text.size() <= 2 * message.data.size());
    // What can be said comes back as it was, unless it has grown out of bounds.
    IpcMessage again = {};
    size_t used = 0;
    std::string bytes = Ipc_Execute(text.c_str());
    IpcResult result = Ipc_Decode(IPC_FROM_CLIENT, bytes.data(), bytes.size(), &again, &used);
    DEMAND(result == (text.size() < IPC_DATA_SIZE ? IPC_COMPLETE : IPC_BAD));
    DEMAND(result == IPC_BAD || (used == bytes.size() && again.data == text + '\0'));
    bool wide = message.format == IPC_UTF16_TEXT || message.format == IPC_UTF32_TEXT;
    DEMAND(!wide || bytes[1] == IPC_UTF8_TEXT);
}

// One byte less is not enough, and the answer before the end is never "bad".
static void CheckPrefixes(IpcSide from, const char *bytes, size_t used)
{
    IpcMessage message;
    size_t taken;
    size_t step = std::max<size_t>(1, used / 64);
    for (size_t length = 0; length < used; length += step)
        DEMAND(Ipc_Decode(from, bytes, length, &message, &taken) == IPC_MORE);
    DEMAND(Ipc_Decode(from, bytes, used - 1, &message, &taken) == IPC_MORE);
    DEMAND(Ipc_Decode(from, bytes, used, &message, &taken) == IPC_COMPLETE && taken == used);
}

static void CheckAll(IpcSide from, const std::string &text)
{
    size_t start = 0;
    for (;;) {
        // A copy of exactly these bytes: reading behind them is seen.
        std::vector<char> rest(text.begin() + static_cast<long>(start), text.end());
        IpcMessage message = {};
        size_t used = 0;
        if (Ipc_Decode(from, rest.data(), rest.size(), &message, &used) != IPC_COMPLETE)
            return;
        CheckBounds(message, used, rest.size());
        CheckPrefixes(from, rest.data(), used);
        if (message.code == IPC_EXECUTE)
            CheckText(message);
        start += used;
    }
}

extern "C" int LLVMFuzzerInitialize(int *, char ***)
{
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size)
{
    std::string text(reinterpret_cast<const char *>(data), size);
    CheckAll(IPC_FROM_CLIENT, text);
    CheckAll(IPC_FROM_SERVER, text);
    return 0;
}
