#include "ExtensionContext.h"

namespace platform {

ExtensionContext::ExtensionContext(QList<ExtensionItem> inputItems,
                                   std::shared_ptr<AuxiliaryConnection> connection)
    : inputItems_(std::move(inputItems)), connection_(std::move(connection)) {}

} // namespace platform
