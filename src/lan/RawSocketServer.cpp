#include "lan/RawSocketServer.h"

#include <array>
#include <deque>

#include "scpi/MessageFramer.h"

namespace lan {

namespace {

// Complete messages waiting to run, and responses waiting to be sent, beyond which the
// connection stops reading or running: a client that floods or never reads holds only this.
constexpr std::size_t maxQueuedInput = 1u << 20;
constexpr std::size_t maxQueuedOutput = 1u << 20;

}  // namespace

class RawSocketServer::RawConnection : public Connection,
                                       public std::enable_shared_from_this<RawConnection> {
  public:
    RawConnection(RawSocketServer& server, asio::ip::tcp::socket socket)
        : m_context(server.m_context),
          m_device(server.m_device),
          m_options(server.m_options),
          m_socket(std::move(socket)),
          m_idle(m_socket.get_executor()),
          m_split(m_socket.get_executor()),
          m_framer(m_options.maxMessageBytes),
          m_restarts(m_options.faults ? m_options.faults->restarts() : 0) {}

    void start() {
        m_context.execute([self = shared_from_this()] {
            auto session = std::shared_ptr<scpi::Session>(self->m_device.openSession());
            asio::dispatch(self->m_socket.get_executor(), [self, session] {
                self->m_session = session;
                self->read();
            });
        });
    }

    void close() override {
        m_closed = true;
        std::error_code ignored;
        m_socket.close(ignored);
        m_idle.cancel();
        m_split.cancel();
    }

  private:
    // A message to run, or (errorCode set) an error the framer found, to queue in order.
    struct Item {
        std::string text;
        int errorCode = 0;
    };

    // Bytes to send; `sent` counts the NL too.
    struct Out {
        std::string bytes;
        bool newline = true;
        std::size_t sent = 0;
        std::size_t size() const { return bytes.size() + (newline ? 1 : 0); }
    };

    void read() {
        if (m_reading || m_eof || m_closed || m_queuedBytes >= maxQueuedInput) {
            return;
        }
        m_reading = true;
        m_socket.async_read_some(asio::buffer(m_buffer),
                                 [self = shared_from_this()](std::error_code error, std::size_t n) {
                                     self->m_reading = false;
                                     if (error) {
                                         self->ended(error);
                                         return;
                                     }
                                     self->received(std::string_view(self->m_buffer.data(), n));
                                 });
    }

    void received(std::string_view bytes) {
        if (m_stalled) {
            read();  // only to notice when the client goes
            return;
        }
        m_framer.feed(bytes);
        for (;;) {
            try {
                auto message = m_framer.next();
                if (!message) {
                    break;
                }
                enqueue({std::move(*message)});
            } catch (const scpi::Error& error) {
                enqueue({error.message, error.code});
            }
        }
        if (m_framer.pendingIsCompleteText()) {
            m_idle.expires_after(m_options.idleGap);
            m_idle.async_wait([self = shared_from_this()](std::error_code error) {
                if (!error && !self->m_closed && self->m_framer.pendingIsCompleteText()) {
                    self->enqueue({std::move(*self->m_framer.takePending())});
                    self->run();
                }
            });
        } else {
            m_idle.cancel();
        }
        run();
        read();
    }

    void enqueue(Item item) {
        m_queuedBytes += item.text.size();
        m_queue.push_back(std::move(item));
    }

    // A read error or EOF: what arrived whole still runs and is answered while the socket
    // lasts; a message cut off by the disconnect never does.
    void ended(std::error_code error) {
        m_eof = true;
        m_framer.reset();
        m_idle.cancel();
        if (error != asio::error::eof) {
            m_queue.clear();
        }
        finishIfDone();
    }

    void run() {
        if (m_executing || m_closed || m_closing || m_stalled || m_queue.empty() ||
            m_outBytes > maxQueuedOutput) {
            return;
        }
        LinkFaults* faults = m_options.faults;
        if (faults && faults->restarts() != m_restarts) {
            close();  // the instrument restarted since this connection opened
            return;
        }
        Item item = std::move(m_queue.front());
        m_queue.pop_front();
        m_queuedBytes -= item.text.size();
        m_executing = true;
        m_context.execute([self = shared_from_this(), faults, item = std::move(item)] {
            std::string response;
            auto action = LinkFaults::Action::None;
            bool failed = false;
            try {
                if (item.errorCode == 0) {
                    if (faults) {
                        action = faults->before(item.text);
                    }
                    response = self->m_session->execute(item.text);
                    if (action == LinkFaults::Action::Restart) {
                        faults->restart();
                    }
                } else {
                    self->m_session->reportError(item.errorCode, item.text);
                }
            } catch (...) {
                // A device that throws has broken its contract; only this client is dropped.
                failed = true;
            }
            asio::dispatch(self->m_socket.get_executor(),
                           [self, failed, action, response = std::move(response)]() mutable {
                               self->executed(failed, action, std::move(response));
                           });
        });
    }

    void executed(bool failed, LinkFaults::Action action, std::string response) {
        m_executing = false;
        if (failed) {
            close();
            return;
        }
        using Action = LinkFaults::Action;
        switch (action) {
            case Action::None:
                break;
            case Action::Drop:
            case Action::Restart:
                // The response still goes out whole; the connection closes after it.
                if (!response.empty()) {
                    send({std::move(response)});
                }
                closeAfterOutput();
                return;
            case Action::CutResponse:
                response.resize(response.size() / 2);
                send({std::move(response), false});
                closeAfterOutput();
                return;
            case Action::Stall:
                m_stalled = true;
                m_queue.clear();
                m_queuedBytes = 0;
                return;
            case Action::Garbage:
                send({std::string(LinkFaults::garbage), false});
                run();
                read();
                return;
        }
        if (!response.empty()) {
            send({std::move(response)});
        }
        run();
        read();
        finishIfDone();
    }

    void closeAfterOutput() {
        m_closing = true;
        m_queue.clear();
        m_queuedBytes = 0;
        if (m_out.empty()) {
            close();
        }
    }

    void send(Out out) {
        if (m_closed) {
            return;
        }
        m_outBytes += out.size();
        m_out.push_back(std::move(out));
        if (m_out.size() == 1) {
            write();
        }
    }

    // Writes the front response, or with a split delay its first half now and the rest later.
    void write() {
        static constexpr char newline = '\n';
        Out& out = m_out.front();
        std::size_t end = out.size();
        if (out.sent == 0 && m_options.faults && end >= 2 &&
            m_options.faults->splitDelay().count() > 0) {
            end /= 2;
        }
        const std::size_t textEnd = std::min(end, out.bytes.size());
        const bool withNewline = out.newline && end == out.size();
        const std::array<asio::const_buffer, 2> buffers{
            asio::buffer(out.bytes.data() + std::min(out.sent, textEnd),
                         textEnd - std::min(out.sent, textEnd)),
            asio::buffer(&newline, withNewline ? 1 : 0)};
        asio::async_write(m_socket, buffers,
                          [self = shared_from_this(), end](std::error_code error, std::size_t) {
                              self->written(error, end);
                          });
    }

    void written(std::error_code error, std::size_t end) {
        if (error) {
            m_out.clear();
            m_outBytes = 0;
            m_queue.clear();
            close();
            return;
        }
        Out& out = m_out.front();
        out.sent = end;
        if (out.sent < out.size()) {
            m_split.expires_after(m_options.faults->splitDelay());
            m_split.async_wait([self = shared_from_this()](std::error_code e) {
                if (!e && !self->m_closed) {
                    self->write();
                }
            });
            return;
        }
        m_outBytes -= out.size();
        m_out.pop_front();
        if (!m_out.empty()) {
            write();
        } else if (m_closing) {
            close();
            return;
        }
        run();
        finishIfDone();
    }

    void finishIfDone() {
        if (m_eof && !m_executing && m_queue.empty() && m_out.empty()) {
            close();
        }
    }

    ServerContext& m_context;
    scpi::Device& m_device;
    const Options m_options;
    asio::ip::tcp::socket m_socket;
    asio::steady_timer m_idle;
    asio::steady_timer m_split;
    scpi::MessageFramer m_framer;
    const std::uint64_t m_restarts;
    std::shared_ptr<scpi::Session> m_session;
    std::array<char, 65536> m_buffer{};
    std::deque<Item> m_queue;
    std::size_t m_queuedBytes = 0;
    std::deque<Out> m_out;
    std::size_t m_outBytes = 0;
    bool m_reading = false;
    bool m_executing = false;
    bool m_eof = false;
    bool m_closed = false;
    // A fault ends the connection once what is queued to send has gone.
    bool m_closing = false;
    // A fault left the client waiting: nothing more runs or is answered.
    bool m_stalled = false;
};

RawSocketServer::RawSocketServer(ServerContext& context, scpi::Device& device,
                                 const asio::ip::tcp::endpoint& endpoint, Options options)
    : m_context(context),
      m_device(device),
      m_options(options),
      m_listener(context, endpoint, [this](asio::ip::tcp::socket socket) {
          auto connection = std::make_shared<RawConnection>(*this, std::move(socket));
          connection->start();
          return std::shared_ptr<Connection>(connection);
      }) {}

}  // namespace lan
