// Connects on behalf of a program outside of Wine: the service lets in only processes whose account it can
// tell, and of those outside it can't. A client of the relay sends the port that it wants and a line feed;
// from then on all bytes go to that port and back. Says "port N" on standard output, and ends with its
// standard input.

#include <array>
#include <boost/asio/buffer.hpp>
#include <boost/asio/io_context.hpp>
#include <boost/asio/ip/tcp.hpp>
#include <boost/asio/write.hpp>
#include <cstdio>
#include <cstdlib>
#include <string>
#include <thread>

namespace {

using boost::asio::ip::tcp;
using boost::system::error_code;

tcp::endpoint loopback(unsigned short port) {
    return {boost::asio::ip::address_v4::loopback(), port};
}

/// Byte by byte, so that nothing behind the line is taken; 0 if none comes.
unsigned short readPort(tcp::socket& client) {
    std::string line;
    error_code error;
    for (char c = 0; client.read_some(boost::asio::buffer(&c, 1), error) == 1; line += c)
        if (c == '\n') return static_cast<unsigned short>(std::atoi(line.c_str()));
    return 0;
}

/// Until one side ends, which the other one is told.
void pump(tcp::socket& from, tcp::socket& to) {
    std::array<char, 65536> buffer{};
    error_code error;
    while (!error) {
        const std::size_t count = from.read_some(boost::asio::buffer(buffer), error);
        if (!error) boost::asio::write(to, boost::asio::buffer(buffer, count), error);
    }
    to.shutdown(tcp::socket::shutdown_send, error);
    from.shutdown(tcp::socket::shutdown_receive, error);
}

void serve(tcp::socket client) {
    tcp::socket server(client.get_executor());
    error_code error;
    if (server.connect(loopback(readPort(client)), error)) return;
    std::thread back([&] { pump(server, client); });
    pump(client, server);
    back.join();
}

}  // namespace

int main() {
    boost::asio::io_context context;
    tcp::acceptor acceptor(context, loopback(0));
    std::printf("port %u\n", static_cast<unsigned>(acceptor.local_endpoint().port()));
    std::fflush(stdout);
    std::thread([&] {
        for (;;)
            std::thread(serve, acceptor.accept()).detach();
    }).detach();
    while (std::getchar() != EOF) {
    }
    std::fflush(stdout);
    std::_Exit(0);
}
