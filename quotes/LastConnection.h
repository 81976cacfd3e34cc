#pragma once

// Keeps the connection of the look-up before, so that it can be closed while the next one's server thinks:
// then it costs no time. For that a run of look-ups has one of these, on the thread of the look-ups. It
// closes what it keeps at its end.
class LastConnection {
  public:
    LastConnection() = default;
    LastConnection(const LastConnection&) = delete;
    LastConnection& operator=(const LastConnection&) = delete;
    ~LastConnection() { Close(); }

    // Takes over the socket, and closes the one it had.
    void Keep(int socket);
    void Close();

  private:
    int socket_ = -1;
};
