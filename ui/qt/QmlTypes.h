// Makes the front end's C++ types known to QML under the module name "Pyxon".
#pragma once

namespace pyx::qt {

// Safe to call more than once.
void registerQmlTypes();

}  // namespace pyx::qt
