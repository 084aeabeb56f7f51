// Connects on behalf of a program outside of Wine: the service lets in only processes whose account it can
// tell, and of those outside it can't. A client of the relay sends the port that it wants and a line feed;
// from then on all bytes go to that port and back. Says "port N" on standard output, and ends with its
// standard input.

#include <winsock2.h>
// After <winsock2.h>.
#include <windows.h>

#include <array>
#include <cstdio>
#include <cstdlib>
#include <optional>
#include <string>
#include <thread>

namespace {

constexpr std::size_t kLongestLine = 8;

SOCKET newSocket() {
    return socket(AF_INET, SOCK_STREAM, IPPROTO_TCP);
}

sockaddr_in loopback(unsigned short port) {
    sockaddr_in address{};
    address.sin_family = AF_INET;
    address.sin_port = htons(port);
    address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    return address;
}

/// Byte by byte, so that nothing behind the line is taken.
std::optional<unsigned short> readPort(SOCKET client) {
    std::string line;
    for (char c = 0; line.size() < kLongestLine && recv(client, &c, 1, 0) == 1; line += c)
        if (c == '\n') return static_cast<unsigned short>(std::atoi(line.c_str()));
    return std::nullopt;
}

bool sendAll(SOCKET to, const char* data, int size) {
    while (size > 0) {
        const int sent = send(to, data, size, 0);
        if (sent <= 0) return false;
        data += sent;
        size -= sent;
    }
    return true;
}

/// Until one side ends, which the other one is told.
void pump(SOCKET from, SOCKET to) {
    std::array<char, 65536> buffer{};
    int count = 0;
    do
        count = recv(from, buffer.data(), static_cast<int>(buffer.size()), 0);
    while (count > 0 && sendAll(to, buffer.data(), count));
    shutdown(to, SD_SEND);
    shutdown(from, SD_RECEIVE);
}

void serve(SOCKET client) {
    if (const auto port = readPort(client)) {
        const SOCKET server = newSocket();
        const sockaddr_in address = loopback(*port);
        if (connect(server, reinterpret_cast<const sockaddr*>(&address), sizeof address) == 0) {
            std::thread back([&] { pump(server, client); });
            pump(client, server);
            back.join();
        }
        closesocket(server);
    }
    closesocket(client);
}

void acceptAll(SOCKET listener) {
    for (;;) {
        const SOCKET accepted = accept(listener, nullptr, nullptr);
        if (accepted == INVALID_SOCKET) return;
        std::thread(serve, accepted).detach();
    }
}

}  // namespace

int main() {
    WSADATA data{};
    if (WSAStartup(MAKEWORD(2, 2), &data) != 0) return 1;
    const SOCKET listener = newSocket();
    sockaddr_in address = loopback(0);
    int size = sizeof address;
    auto* const name = reinterpret_cast<sockaddr*>(&address);
    if (bind(listener, name, size) != 0 || listen(listener, SOMAXCONN) != 0 ||
        getsockname(listener, name, &size) != 0)
        return 1;
    std::printf("port %u\n", static_cast<unsigned>(ntohs(address.sin_port)));
    std::fflush(stdout);
    std::thread(acceptAll, listener).detach();
    while (std::getchar() != EOF) {
    }
    std::fflush(stdout);
    TerminateProcess(GetCurrentProcess(), 0);
}
