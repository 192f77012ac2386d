// app/IpcClient.h - the client's side of the command channel.
#pragma once

#include <cstdint>
#include <memory>
#include <string>

struct IpcMessage;

// A connection to a server. Every operation but Open may take the time that the constructor names.
class CmdConnection
{
public:
    CmdConnection(int socket, int milliseconds); // the socket is ours
    ~CmdConnection();
    CmdConnection(const CmdConnection &) = delete;
    CmdConnection &operator=(const CmdConnection &) = delete;

    // Comes first. False when the server refuses the topic, or does not answer in time.
    bool Open(const char *topic, int milliseconds);

    // Comes last: sends the text, says goodbye and waits for the server to hang up, which tells
    // that it has read all. True, too, when the time is up and the server still holds the text: a
    // busy one reads it later. False when it was not sent completely or the server hung up
    // without reading it.
    bool Execute(const char *text);

    // False when the server has no such item, or does not answer in time.
    bool Request(const char *item, std::string *data);

    // True when it was sent; no server answers.
    bool Poke(const char *item, const char *text);

private:
    bool Send(const std::string &bytes, int32_t end);
    bool ReceiveAnswer(IpcMessage *answer, int32_t end);
    bool TakeMessage(IpcMessage *message, int32_t end);
    bool ReadMore(int32_t end);
    void OnAdvise();
    void OnDisconnect();

    int m_socket;
    int m_milliseconds;
    std::string m_input; // received, not yet decoded
};

class MyClient
{
public:
    explicit MyClient(int milliseconds) : m_milliseconds(milliseconds) {}
    ~MyClient(); // disconnects

    // At the private path of the service, then at the path that is its name.
    bool Connect(const char *service, const char *topic);

    CmdConnection *Connection() const { return m_connection.get(); } // null when there is none

private:
    int m_milliseconds;
    std::unique_ptr<CmdConnection> m_connection;
};
