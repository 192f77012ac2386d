// tests/gui/ipc_peer.cpp - a peer of the command channel that is built on the toolkit's own
// connections, and so knows nothing of ours.
//
//     ipc_peer client PATH      asks the server at PATH all there is to ask
//     ipc_peer serve PATH [MS]  serves PATH until a client hangs up; MS: how long an execute takes
//     ipc_peer send SERVICE TEXT...   the program's own client, one call of SendCommand for each
//
// Prints a line for everything that happens.
#include <cstdarg>
#include <cstdio>
#include <cstdlib>
#include <cstring>

#include <wx/app.h>
#include <wx/evtloop.h>
#include <wx/ipc.h>
#include <wx/log.h>

#include "app/Ipc.h"
#include "app/IpcClient.h"

static void Say(const char *format, ...)
{
    va_list arguments;
    va_start(arguments, format);
    vprintf(format, arguments);
    va_end(arguments);
    putchar('\n');
    fflush(stdout);
}

static int Usage()
{
    fprintf(stderr, "usage: ipc_peer client PATH | serve PATH [MS] | send SERVICE TEXT...\n");
    return 2;
}

// --- A client ---

class ToolkitConnection : public wxConnection
{
public:
    bool OnAdvise(const wxString &, const wxString &item, const void *data, size_t size,
                  wxIPCFormat format) override
    {
        Say("advised of %s: %s", (const char *)item.utf8_str(),
            (const char *)GetTextFromData(data, size, format).utf8_str());
        advised = true;
        return true;
    }

    bool OnDisconnect() override
    {
        Say("disconnected");
        return true; // not deleted: the owner does that
    }

    bool advised = false;
};

class ToolkitClient : public wxClient
{
public:
    wxConnectionBase *OnMakeConnection() override { return new ToolkitConnection; }
};

static ToolkitConnection *Connect(ToolkitClient *client, const wxString &path,
                                  const wxString &topic)
{
    wxConnectionBase *connection = client->MakeConnection("localhost", path, topic);
    Say("%s: %s", (const char *)topic.utf8_str(), connection ? "connected" : "refused");
    return static_cast<ToolkitConnection *>(connection);
}

static void Request(wxConnection *connection, const char *item)
{
    size_t size = 0;
    const char *data = static_cast<const char *>(connection->Request(item, &size));
    if (data)
        Say("%s: %zu bytes \"%.*s\"", item, size, int(size), data);
    else
        Say("%s: nothing", item);
}

static void WaitForAdvice(ToolkitConnection *connection)
{
    for (int i = 0; i < 500 && !connection->advised; ++i) {
        wxEventLoopBase::GetActive()->DispatchTimeout(10);
        wxTheApp->ProcessPendingEvents();
    }
}

static void AskEverything(const wxString &path)
{
    ToolkitClient client;
    delete Connect(&client, path, "commandline");
    ToolkitConnection *connection = Connect(&client, path, "CommandLine");
    if (!connection)
        return;
    for (const char *item : {"Date", "Date+len", "bytes[3]", "date", "Date+x", "Bytes[3]"})
        Request(connection, item);
    Say("poke: %d", connection->Poke("Date", "2000"));
    Say("start advise: %d", connection->StartAdvise("news"));
    WaitForAdvice(connection);
    Say("stop advise: %d", connection->StopAdvise("news"));
    Say("execute: %d", connection->Execute(wxString(L"'-bone \u00FC'")));
    Say("execute wide: %d", connection->Execute(L"'-btwo \u00FC'"));
    Say("execute 8-bit: %d", connection->Execute("'-bthree \xFC'"));
    Say("execute bitmap: %d", connection->Execute("-bfour", 7, wxIPC_BITMAP));
    Request(connection, "bytes[3]");
    Say("goodbye: %d", connection->Disconnect());
    delete connection;
}

// --- A server ---

class ServedConnection : public wxConnection
{
public:
    explicit ServedConnection(int delay) : m_delay(delay) {}

    bool OnExec(const wxString &topic, const wxString &data) override
    {
        Say("execute %s: %s", (const char *)topic.utf8_str(), (const char *)data.utf8_str());
        wxMilliSleep(m_delay);
        return true;
    }

    bool OnPoke(const wxString &, const wxString &item, const void *data, size_t size,
                wxIPCFormat format) override
    {
        Say("poke %s: %s", (const char *)item.utf8_str(),
            (const char *)GetTextFromData(data, size, format).utf8_str());
        return true;
    }

    const void *OnRequest(const wxString &, const wxString &item, size_t *size,
                          wxIPCFormat) override
    {
        Say("request %s", (const char *)item.utf8_str());
        Advise("news", "nothing new"); // in front of the answer
        *size = wxNO_LEN;
        return item == "known" ? "answer" : nullptr;
    }

    bool OnDisconnect() override
    {
        Say("client left");
        wxTheApp->ExitMainLoop();
        return wxConnection::OnDisconnect();
    }

private:
    int m_delay;
};

class ToolkitServer : public wxServer
{
public:
    explicit ToolkitServer(int delay) : m_delay(delay) {}

    wxConnectionBase *OnAcceptConnection(const wxString &topic) override
    {
        Say("accept %s", (const char *)topic.utf8_str());
        return topic == "CommandLine" ? new ServedConnection(m_delay) : nullptr;
    }

private:
    int m_delay;
};

// --- The program ---

class PeerApp : public wxAppConsole
{
public:
    bool OnInit() override
    {
        wxLog::EnableLogging(false);
        return true;
    }

    int OnRun() override
    {
        if (argv[1] == "client") {
            wxEventLoop loop; // for what the server sends unasked
            wxEventLoopActivator active(&loop);
            AskEverything(argv[2]);
            return 0;
        }
        ToolkitServer server(argc > 3 ? wxAtoi(argv[3]) : 0);
        if (!server.Create(argv[2]))
            return 1;
        Say("serving");
        return wxAppConsole::OnRun();
    }
};

wxIMPLEMENT_APP_NO_MAIN(PeerApp);

// --- The program's own client ---

static void UseService(const char *service)
{
    std::string data;
    MyClient client(30000);
    if (!client.Connect(service, Ipc_Topic))
        return;
    for (const char *item : {"known", "unknown"}) {
        bool answered = client.Connection()->Request(item, &data);
        Say("%s: %s", item, answered ? data.c_str() : "nothing");
    }
    Say("poke: %d", client.Connection()->Poke("item", "value"));
}

static int Send(int argc, char **argv)
{
    for (int i = 3; i < argc; ++i)
        Say("sent: %d", SendCommand(argv[2], argv[i], 30000));
    if (argc == 3)
        UseService(argv[2]);
    return 0;
}

int main(int argc, char **argv)
{
    if (argc < 3)
        return Usage();
    if (strcmp(argv[1], "send") == 0)
        return Send(argc, argv);
    return wxEntry(argc, argv);
}
