#include "lan/RawSocketClient.h"

#include "lan/ClientError.h"
#include "scpi/Block.h"
#include "scpi/ProgramMessage.h"

namespace lan {
namespace {

// The longest response taken: a block at the codec's limit and its header.
constexpr std::size_t maxResponseBytes = scpi::maxBlockBytes + 64;

}  // namespace

void RawSocketClient::connect(std::chrono::milliseconds timeout) {
    m_buffer.clear();
    m_stream.connect(m_host, m_port, timeout);
}

void RawSocketClient::send(std::string_view message, std::chrono::milliseconds timeout) {
    m_stream.writeAll(message, "\n", timeout);
}

void RawSocketClient::garbage(const std::string& why) {
    m_stream.close();
    m_buffer.clear();
    throw ClientError(why);
}

std::string RawSocketClient::readResponse(std::chrono::milliseconds timeout) {
    const auto deadline = std::chrono::steady_clock::now() + timeout;
    std::size_t scanned = 0;
    for (;;) {
        if (!m_buffer.empty() && m_buffer.front() == '#') {
            std::optional<scpi::BlockHeader> header;
            try {
                header = scpi::readBlockHeader(m_buffer);
            } catch (const scpi::Error& error) {
                garbage("the reply is not a valid block (" + error.message + ")");
            }
            if (header) {
                const std::size_t end = header->headerBytes + header->dataBytes;
                std::size_t terminator = end;
                if (m_buffer.size() > terminator && m_buffer[terminator] == '\r') {
                    ++terminator;
                }
                if (m_buffer.size() > terminator) {
                    if (m_buffer[terminator] != '\n') {
                        garbage("the reply's block is not followed by its end of message");
                    }
                    std::string response = m_buffer.substr(0, end);
                    m_buffer.erase(0, terminator + 1);
                    return response;
                }
            }
        } else if (const auto nl = m_buffer.find('\n', scanned); nl != std::string::npos) {
            if (nl + 1 == m_buffer.size() && m_stream.available() == 0) {
                const std::size_t end = nl > 0 && m_buffer[nl - 1] == '\r' ? nl - 1 : nl;
                std::string response = m_buffer.substr(0, end);
                m_buffer.clear();
                return response;
            }
            scanned = nl + 1;
            if (scanned < m_buffer.size()) {
                continue;
            }
        } else {
            scanned = m_buffer.size();
        }
        if (m_buffer.size() > maxResponseBytes) {
            garbage("the reply exceeds " + std::to_string(maxResponseBytes >> 20) +
                    " MiB without its end");
        }
        try {
            m_stream.readSome(m_buffer, deadline, timeout);
        } catch (const ClientError&) {
            m_buffer.clear();
            throw;
        }
    }
}

}  // namespace lan
