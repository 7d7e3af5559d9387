#include "lan/Vxi11Server.h"

#include "lan/Vxi11.h"
#include "scpi/ProgramMessage.h"

namespace lan {

namespace {

constexpr std::size_t maxAbortRecordBytes = 1024;
constexpr std::size_t maxDeviceNameBytes = 256;
constexpr std::size_t maxSrqHandleBytes = 40;

std::chrono::milliseconds milliseconds(std::uint32_t value) {
    return std::chrono::milliseconds(value);
}

// A reply whose results are the error code and `zeros` more words of zero: the shape of
// each procedure's result when it fails.
std::string errorReply(std::uint32_t xid, std::uint32_t error, int zeros = 0) {
    std::string record = rpc::beginReply(xid, rpc::AcceptStat::Success);
    XdrWriter writer(record);
    writer.u32(error);
    for (int i = 0; i < zeros; ++i) {
        writer.u32(0);
    }
    return record;
}

std::string wordsReply(std::uint32_t xid, std::initializer_list<std::uint32_t> words) {
    std::string record = rpc::beginReply(xid, rpc::AcceptStat::Success);
    XdrWriter writer(record);
    for (const auto word : words) {
        writer.u32(word);
    }
    return record;
}

// Result shapes, counted in words after the error code.
constexpr int writeZeros = 1;  // size
constexpr int readZeros = 2;   // reason, empty data
constexpr int statusZeros = 1;
constexpr int createZeros = 3;  // link, abort port, maximum receive size

}  // namespace

Vxi11Server::Vxi11Server(ServerContext& context, scpi::Device& device,
                         const asio::ip::address& address, Options options)
    : m_context(context),
      m_device(device),
      m_options(options),
      m_state(asio::make_strand(context.io())),
      m_waiting(m_state),
      m_abort(context, {address, options.abortPort},
              {vxi11::abortProgram, vxi11::version, maxAbortRecordBytes},
              [this](ConnectionId, const rpc::Call& call, XdrReader& arguments, Reply reply) {
                  handleAbort(call, arguments, std::move(reply));
              }),
      m_core(
          context, {address, options.corePort},
          {vxi11::coreProgram, vxi11::version, options.maxMessageBytes + (1u << 20)},
          [this](ConnectionId connection, const rpc::Call& call, XdrReader& arguments,
                 Reply reply) { handleCore(connection, call, arguments, std::move(reply)); },
          [this](ConnectionId connection) {
              asio::post(m_state, [this, connection] { connectionClosed(connection); });
          }) {}

void Vxi11Server::handleCore(ConnectionId connection, const rpc::Call& call, XdrReader& arguments,
                             Reply reply) {
    const std::uint32_t xid = call.xid;
    auto onState = [this](auto work) { asio::post(m_state, std::move(work)); };
    switch (call.procedure) {
        case vxi11::createLink: {
            arguments.i32("client id");
            const bool lock = arguments.boolean("lock device");
            const std::uint32_t lockTimeout = arguments.u32("lock timeout");
            std::string device(arguments.opaque("device name", maxDeviceNameBytes));
            onState([=, this, device = std::move(device)]() mutable {
                createLink(connection, xid, lock, lockTimeout, std::move(device), reply);
            });
            return;
        }
        case vxi11::deviceWrite: {
            const std::uint32_t link = arguments.u32("link");
            const std::uint32_t ioTimeout = arguments.u32("I/O timeout");
            const std::uint32_t lockTimeout = arguments.u32("lock timeout");
            const std::uint32_t flags = arguments.u32("flags");
            std::string data(arguments.opaque("data", m_options.maxMessageBytes));
            onState([=, this, data = std::move(data)]() mutable {
                write(xid, link, ioTimeout, lockTimeout, flags, std::move(data), reply);
            });
            return;
        }
        case vxi11::deviceRead: {
            const std::uint32_t link = arguments.u32("link");
            const std::uint32_t requestSize = arguments.u32("request size");
            const std::uint32_t ioTimeout = arguments.u32("I/O timeout");
            const std::uint32_t lockTimeout = arguments.u32("lock timeout");
            const std::uint32_t flags = arguments.u32("flags");
            const std::uint32_t termChar = arguments.u32("termination character");
            onState([=, this] {
                read(xid, link, requestSize, ioTimeout, lockTimeout, flags, termChar, reply);
            });
            return;
        }
        case vxi11::deviceReadStb:
        case vxi11::deviceTrigger:
        case vxi11::deviceClear:
        case vxi11::deviceRemote:
        case vxi11::deviceLocal: {
            const std::uint32_t link = arguments.u32("link");
            const std::uint32_t flags = arguments.u32("flags");
            const std::uint32_t lockTimeout = arguments.u32("lock timeout");
            arguments.u32("I/O timeout");
            const std::uint32_t procedure = call.procedure;
            onState([=, this] {
                const int zeros = procedure == vxi11::deviceReadStb ? statusZeros : 0;
                whenUnlocked(
                    xid, link, flags, lockTimeout, zeros, reply,
                    [=, this](Vxi11Link& target) { generic(xid, procedure, target, reply); });
            });
            return;
        }
        case vxi11::deviceLock: {
            const std::uint32_t link = arguments.u32("link");
            const std::uint32_t flags = arguments.u32("flags");
            const std::uint32_t lockTimeout = arguments.u32("lock timeout");
            onState([=, this] { lock(xid, link, flags, lockTimeout, reply); });
            return;
        }
        case vxi11::deviceUnlock: {
            const std::uint32_t link = arguments.u32("link");
            onState([=, this] {
                if (!find(link)) {
                    reply(errorReply(xid, vxi11::invalidLink));
                } else if (m_lockHolder != link) {
                    reply(errorReply(xid, vxi11::noLockHeld));
                } else {
                    m_lockHolder = 0;
                    reply(errorReply(xid, vxi11::noError));
                    m_waiting.retry();
                }
            });
            return;
        }
        case vxi11::deviceEnableSrq: {
            const std::uint32_t link = arguments.u32("link");
            arguments.boolean("enable");
            arguments.opaque("handle", maxSrqHandleBytes);
            onState([=, this] {
                reply(errorReply(xid, find(link) ? vxi11::noError : vxi11::invalidLink));
            });
            return;
        }
        case vxi11::destroyLink: {
            const std::uint32_t link = arguments.u32("link");
            onState([=, this] {
                if (!find(link)) {
                    reply(errorReply(xid, vxi11::invalidLink));
                    return;
                }
                destroy(link);
                reply(errorReply(xid, vxi11::noError));
            });
            return;
        }
        case vxi11::deviceDocmd:
            reply(errorReply(xid, vxi11::operationNotSupported, 1));  // empty data_out
            return;
        case vxi11::createInterruptChannel:
        case vxi11::destroyInterruptChannel:
            reply(errorReply(xid, vxi11::operationNotSupported));
            return;
        default:
            reply(rpc::beginReply(xid, rpc::AcceptStat::ProcedureUnavailable));
    }
}

void Vxi11Server::handleAbort(const rpc::Call& call, XdrReader& arguments, Reply reply) {
    if (call.procedure != vxi11::deviceAbort) {
        reply(rpc::beginReply(call.xid, rpc::AcceptStat::ProcedureUnavailable));
        return;
    }
    const std::uint32_t link = arguments.u32("link");
    asio::post(m_state, [this, xid = call.xid, link, reply = std::move(reply)] {
        if (!find(link)) {
            reply(errorReply(xid, vxi11::invalidLink));
            return;
        }
        m_waiting.abort(link);
        reply(errorReply(xid, vxi11::noError));
    });
}

void Vxi11Server::createLink(ConnectionId connection, std::uint32_t xid, bool lock,
                             std::uint32_t lockTimeout, std::string device, Reply reply) {
    if (scpi::upperCased(device) != "INST0") {
        reply(errorReply(xid, vxi11::invalidAddress, createZeros));
        return;
    }
    if (m_links.size() + m_linksOpening >= m_options.maxLinks) {
        reply(errorReply(xid, vxi11::outOfResources, createZeros));
        return;
    }
    ++m_linksOpening;
    m_connections.insert(connection);
    std::uint32_t id = m_nextLink++;
    if (m_nextLink == 0) {
        m_nextLink = 1;
    }
    m_context.execute([=, this] {
        std::shared_ptr<scpi::Session> session;
        try {
            session = m_device.openSession();
        } catch (...) {
            // Answered below as a device that cannot be reached.
        }
        asio::post(m_state, [=, this] {
            --m_linksOpening;
            if (!session) {
                reply(errorReply(xid, vxi11::deviceNotAccessible, createZeros));
                return;
            }
            if (!m_connections.contains(connection)) {
                return;  // the client went away while the session opened
            }
            m_links[id] =
                std::make_shared<Vxi11Link>(id, connection, session, m_options.maxMessageBytes);
            auto created = [=, this] {
                reply(wordsReply(xid, {vxi11::noError, id, abortPort(), m_options.maxReceiveSize}));
            };
            if (!lock) {
                created();
                return;
            }
            m_waiting.wait(
                id, milliseconds(lockTimeout),
                [=, this] {
                    if (lockedByOther(id)) {
                        return false;
                    }
                    m_lockHolder = id;
                    created();
                    return true;
                },
                [=, this](bool aborted) {
                    destroy(id);
                    reply(errorReply(xid, aborted ? vxi11::aborted : vxi11::deviceLocked,
                                     createZeros));
                });
        });
    });
}

void Vxi11Server::write(std::uint32_t xid, std::uint32_t link, std::uint32_t ioTimeout,
                        std::uint32_t lockTimeout, std::uint32_t flags, std::string data,
                        Reply reply) {
    auto bytes = std::make_shared<std::string>(std::move(data));
    whenUnlocked(xid, link, flags, lockTimeout, writeZeros, reply, [=, this](Vxi11Link&) {
        m_waiting.wait(
            link, milliseconds(ioTimeout),
            [=, this] {
                auto target = findShared(link);
                if (!target) {
                    reply(errorReply(xid, vxi11::invalidLink, writeZeros));
                    return true;
                }
                if (!target->hasRoom()) {
                    return false;
                }
                target->write(*bytes, (flags & vxi11::flagEnd) != 0);
                reply(wordsReply(xid, {vxi11::noError, static_cast<std::uint32_t>(bytes->size())}));
                run(target);
                return true;
            },
            [=](bool aborted) {
                reply(errorReply(xid, aborted ? vxi11::aborted : vxi11::ioTimeout, writeZeros));
            });
    });
}

void Vxi11Server::read(std::uint32_t xid, std::uint32_t link, std::uint32_t requestSize,
                       std::uint32_t ioTimeout, std::uint32_t lockTimeout, std::uint32_t flags,
                       std::uint32_t termChar, Reply reply) {
    std::optional<char> terminator;
    if (flags & vxi11::flagTermCharSet) {
        terminator = static_cast<char>(termChar);
    }
    whenUnlocked(xid, link, flags, lockTimeout, readZeros, reply, [=, this](Vxi11Link&) {
        m_waiting.wait(
            link, milliseconds(ioTimeout),
            [=, this] {
                Vxi11Link* target = find(link);
                if (!target) {
                    reply(errorReply(xid, vxi11::invalidLink, readZeros));
                    return true;
                }
                if (!target->hasOutput()) {
                    return false;
                }
                const auto piece = target->read(requestSize, terminator);
                std::string record = rpc::beginReply(xid, rpc::AcceptStat::Success);
                XdrWriter writer(record);
                writer.u32(vxi11::noError);
                writer.u32(piece.reason);
                writer.opaque(piece.bytes);
                reply(std::move(record));
                return true;
            },
            [=](bool aborted) {
                reply(errorReply(xid, aborted ? vxi11::aborted : vxi11::ioTimeout, readZeros));
            });
    });
}

void Vxi11Server::generic(std::uint32_t xid, std::uint32_t procedure, Vxi11Link& link,
                          const Reply& reply) {
    switch (procedure) {
        case vxi11::deviceReadStb:
            m_context.execute([xid, reply, session = link.session(), mav = link.hasOutput()] {
                try {
                    reply(wordsReply(xid, {vxi11::noError, session->statusByte(mav)}));
                } catch (...) {
                    reply(errorReply(xid, vxi11::ioError, statusZeros));
                }
            });
            return;
        case vxi11::deviceTrigger:
            link.trigger();
            run(findShared(link.id()));
            break;
        case vxi11::deviceClear:
            link.clear();
            m_waiting.retry();
            m_context.execute([xid, reply, session = link.session()] {
                try {
                    session->clear();
                    reply(errorReply(xid, vxi11::noError));
                } catch (...) {
                    reply(errorReply(xid, vxi11::ioError));
                }
            });
            return;
        default:  // remote and local change nothing on a LAN instrument
            break;
    }
    reply(errorReply(xid, vxi11::noError));
}

void Vxi11Server::lock(std::uint32_t xid, std::uint32_t link, std::uint32_t flags,
                       std::uint32_t lockTimeout, const Reply& reply) {
    if (!find(link)) {
        reply(errorReply(xid, vxi11::invalidLink));
        return;
    }
    const auto timeout =
        (flags & vxi11::flagWaitLock) ? milliseconds(lockTimeout) : std::chrono::milliseconds(0);
    m_waiting.wait(
        link, timeout,
        [=, this] {
            if (!find(link)) {
                reply(errorReply(xid, vxi11::invalidLink));
                return true;
            }
            if (lockedByOther(link)) {
                return false;
            }
            m_lockHolder = link;
            reply(errorReply(xid, vxi11::noError));
            return true;
        },
        [=](bool aborted) {
            reply(errorReply(xid, aborted ? vxi11::aborted : vxi11::deviceLocked));
        });
}

void Vxi11Server::whenUnlocked(std::uint32_t xid, std::uint32_t link, std::uint32_t flags,
                               std::uint32_t lockTimeout, int zeros, const Reply& reply,
                               std::function<void(Vxi11Link&)> answer) {
    if (!find(link)) {
        reply(errorReply(xid, vxi11::invalidLink, zeros));
        return;
    }
    const auto timeout =
        (flags & vxi11::flagWaitLock) ? milliseconds(lockTimeout) : std::chrono::milliseconds(0);
    m_waiting.wait(
        link, timeout,
        [=, this] {
            Vxi11Link* target = find(link);
            if (!target) {
                reply(errorReply(xid, vxi11::invalidLink, zeros));
                return true;
            }
            if (lockedByOther(link)) {
                return false;
            }
            answer(*target);
            return true;
        },
        [=](bool aborted) {
            reply(errorReply(xid, aborted ? vxi11::aborted : vxi11::deviceLocked, zeros));
        });
}

void Vxi11Server::run(const std::shared_ptr<Vxi11Link>& link) {
    bool interrupted = false;
    auto work = link->startWork(interrupted);
    if (!work) {
        return;
    }
    m_context.execute(
        [this, link, work = std::move(*work), interrupted, generation = link->generation()] {
            std::string response;
            bool failed = false;
            try {
                auto& session = *link->session();
                if (interrupted) {
                    session.reportError(-410, "Query INTERRUPTED");
                }
                switch (work.kind) {
                    case Vxi11Link::Work::Kind::Message:
                        response = session.execute(work.text);
                        break;
                    case Vxi11Link::Work::Kind::Error:
                        session.reportError(work.errorCode, work.text);
                        break;
                    case Vxi11Link::Work::Kind::Trigger:
                        response = session.execute("*TRG");
                        break;
                }
            } catch (...) {
                // A device that throws has broken its contract; only this link is dropped.
                failed = true;
            }
            asio::post(m_state,
                       [this, link, generation, failed, response = std::move(response)]() mutable {
                           if (failed) {
                               destroy(link->id());
                               return;
                           }
                           link->workDone(generation, std::move(response));
                           run(link);
                           m_waiting.retry();
                       });
        });
}

void Vxi11Server::destroy(std::uint32_t link) {
    auto found = m_links.find(link);
    if (found == m_links.end()) {
        return;
    }
    found->second->clear();
    m_links.erase(found);
    if (m_lockHolder == link) {
        m_lockHolder = 0;
    }
    m_waiting.retry();
}

void Vxi11Server::connectionClosed(ConnectionId connection) {
    m_connections.erase(connection);
    std::vector<std::uint32_t> owned;
    for (const auto& [id, link] : m_links) {
        if (link->owner() == connection) {
            owned.push_back(id);
        }
    }
    for (const auto id : owned) {
        destroy(id);
    }
}

Vxi11Link* Vxi11Server::find(std::uint32_t link) {
    return findShared(link).get();
}

std::shared_ptr<Vxi11Link> Vxi11Server::findShared(std::uint32_t link) {
    const auto found = m_links.find(link);
    return found == m_links.end() ? nullptr : found->second;
}

}  // namespace lan
