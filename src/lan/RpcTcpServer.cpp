#include "lan/RpcTcpServer.h"

#include <array>

#include "lan/RecordMarking.h"

namespace lan {

class RpcTcpServer::RpcConnection : public Connection,
                                    public std::enable_shared_from_this<RpcConnection> {
  public:
    RpcConnection(RpcTcpServer& server, ConnectionId id, asio::ip::tcp::socket socket)
        : m_server(server),
          m_id(id),
          m_socket(std::move(socket)),
          m_reader(server.m_program.maxRecordBytes) {}

    void start() {
        asio::dispatch(m_socket.get_executor(), [self = shared_from_this()] { self->process(); });
    }

    void close() override {
        std::error_code ignored;
        m_socket.close(ignored);
    }

  private:
    void process() {
        try {
            while (m_begin < m_end) {
                m_begin +=
                    m_reader.feed(std::string_view(m_buffer.data() + m_begin, m_end - m_begin));
                if (m_reader.complete()) {
                    dispatch();
                    return;
                }
            }
        } catch (const ProtocolError&) {
            end();
            return;
        }
        m_socket.async_read_some(asio::buffer(m_buffer),
                                 [self = shared_from_this()](std::error_code error, std::size_t n) {
                                     if (error) {
                                         self->end();
                                         return;
                                     }
                                     self->m_begin = 0;
                                     self->m_end = n;
                                     self->process();
                                 });
    }

    void dispatch() {
        XdrReader reader(m_reader.record());
        const rpc::Call call = rpc::readCall(reader);
        const auto& program = m_server.m_program;
        if (call.program != program.number) {
            send(rpc::beginReply(call.xid, rpc::AcceptStat::ProgramUnavailable));
            return;
        }
        if (call.version != program.version) {
            send(rpc::beginReply(call.xid, rpc::AcceptStat::ProgramMismatch, program.version));
            return;
        }
        auto reply = [self = shared_from_this()](std::string record) {
            asio::dispatch(
                self->m_socket.get_executor(),
                [self, record = std::move(record)]() mutable { self->send(std::move(record)); });
        };
        try {
            m_server.m_handler(m_id, call, reader, std::move(reply));
        } catch (const ProtocolError&) {
            send(rpc::beginReply(call.xid, rpc::AcceptStat::GarbageArguments));
        }
    }

    void send(std::string record) {
        if (m_ended) {
            return;
        }
        finishRecord(record);
        m_out = std::move(record);
        asio::async_write(m_socket, asio::buffer(m_out),
                          [self = shared_from_this()](std::error_code error, std::size_t) {
                              std::string().swap(self->m_out);
                              if (error) {
                                  self->end();
                                  return;
                              }
                              self->m_reader.next();
                              self->process();
                          });
    }

    void end() {
        if (m_ended) {
            return;
        }
        m_ended = true;
        close();
        if (m_server.m_closed) {
            m_server.m_closed(m_id);
        }
    }

    RpcTcpServer& m_server;
    ConnectionId m_id;
    asio::ip::tcp::socket m_socket;
    RecordReader m_reader;
    std::array<char, 16384> m_buffer{};
    std::size_t m_begin = 0;
    std::size_t m_end = 0;
    std::string m_out;
    bool m_ended = false;
};

RpcTcpServer::RpcTcpServer(ServerContext& context, const asio::ip::tcp::endpoint& endpoint,
                           Program program, Handler handler,
                           std::function<void(ConnectionId)> closed)
    : m_program(program),
      m_handler(std::move(handler)),
      m_closed(std::move(closed)),
      m_listener(context, endpoint, [this](asio::ip::tcp::socket socket) {
          auto connection = std::make_shared<RpcConnection>(*this, m_nextId++, std::move(socket));
          connection->start();
          return std::shared_ptr<Connection>(connection);
      }) {}

}  // namespace lan
