#include "quotes/LastConnection.h"

#include <unistd.h>
#include <utility>

void LastConnection::Keep(int socket) {
    Close();
    socket_ = socket;
}

void LastConnection::Close() {
    if (socket_ >= 0)
        close(std::exchange(socket_, -1));
}
