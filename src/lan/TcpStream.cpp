#include "lan/TcpStream.h"

#include <array>

#include "lan/ClientError.h"

namespace lan {
namespace {

std::string reasonOf(const asio::error_code& error) {
    std::string text = error.message();
    if (!text.empty()) {
        text[0] = static_cast<char>(std::tolower(static_cast<unsigned char>(text[0])));
    }
    return text;
}

}  // namespace

bool TcpStream::runUntil(const bool& done, Deadline deadline) {
    m_io.restart();
    while (!done) {
        if (m_io.run_one_until(deadline) == 0) {
            break;
        }
    }
    if (done) {
        return true;
    }
    // Cancel what is pending and let its handler run, so nothing refers to this call later.
    close();
    m_io.restart();
    m_io.run();
    return false;
}

void TcpStream::connect(const std::string& host, std::uint16_t port,
                        std::chrono::milliseconds timeout) {
    close();
    const Deadline deadline = std::chrono::steady_clock::now() + timeout;
    asio::ip::tcp::resolver resolver(m_io);
    asio::ip::tcp::resolver::results_type endpoints;
    asio::error_code error;
    bool done = false;
    resolver.async_resolve(host, std::to_string(port), asio::ip::resolver_base::numeric_service,
                           [&](const asio::error_code& ec, auto results) {
                               error = ec;
                               endpoints = std::move(results);
                               done = true;
                           });
    if (!runUntil(done, deadline)) {
        resolver.cancel();
        throw ClientError("cannot find the host \"" + host + "\" within " + secondsText(timeout));
    }
    if (error) {
        throw ClientError("cannot find the host \"" + host + "\": " + reasonOf(error));
    }
    done = false;
    asio::async_connect(m_socket, endpoints, [&](const asio::error_code& ec, const auto&) {
        error = ec;
        done = true;
    });
    if (!runUntil(done, deadline)) {
        throw ClientError("no answer in " + secondsText(timeout));
    }
    if (error) {
        close();
        throw ClientError(reasonOf(error));
    }
    m_socket.set_option(asio::ip::tcp::no_delay(true), error);
}

void TcpStream::close() {
    asio::error_code ignored;
    m_socket.shutdown(asio::ip::tcp::socket::shutdown_both, ignored);
    m_socket.close(ignored);
}

void TcpStream::writeAll(std::string_view bytes, std::string_view more,
                         std::chrono::milliseconds timeout) {
    if (!isOpen()) {
        throw ClientError("not connected");
    }
    asio::error_code error;
    bool done = false;
    const std::array<asio::const_buffer, 2> parts{asio::buffer(bytes.data(), bytes.size()),
                                                  asio::buffer(more.data(), more.size())};
    asio::async_write(m_socket, parts, [&](const asio::error_code& ec, std::size_t) {
        error = ec;
        done = true;
    });
    if (!runUntil(done, std::chrono::steady_clock::now() + timeout)) {
        throw ClientError("the instrument took no data for " + secondsText(timeout));
    }
    if (error) {
        close();
        throw ClientError(error == asio::error::broken_pipe ||
                                  error == asio::error::connection_reset
                              ? "the instrument closed the connection"
                              : reasonOf(error));
    }
}

void TcpStream::readSome(std::string& out, Deadline deadline, std::chrono::milliseconds timeout) {
    if (!isOpen()) {
        throw ClientError("not connected");
    }
    asio::error_code error;
    std::size_t got = 0;
    bool done = false;
    m_socket.async_read_some(asio::buffer(m_chunk), [&](const asio::error_code& ec, std::size_t n) {
        error = ec;
        got = n;
        done = true;
    });
    if (!runUntil(done, deadline)) {
        throw ClientError("no reply in " + secondsText(timeout));
    }
    out.append(m_chunk, got);
    if (error) {
        close();
        throw ClientError(error == asio::error::eof || error == asio::error::connection_reset
                              ? "the instrument closed the connection"
                              : reasonOf(error));
    }
}

std::size_t TcpStream::available() {
    asio::error_code error;
    const std::size_t count = m_socket.available(error);
    return error ? 0 : count;
}

}  // namespace lan
