#include "engine/RememberedConnection.h"

namespace engine {

RememberedConnection& RememberedConnection::processWide() {
    static RememberedConnection connection;
    return connection;
}

}  // namespace engine
