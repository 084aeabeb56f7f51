#include "client/panel/PanelServing.h"

namespace vexa::client {

ServePanel demoPanel() {
    return nullptr;
}

}  // namespace vexa::client
