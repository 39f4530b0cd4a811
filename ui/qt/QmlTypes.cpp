#include "ui/qt/QmlTypes.h"

#include <QQmlEngine>

#include <mutex>

#include "ui/qt/ChartModel.h"
#include "ui/qt/DriveMapModel.h"
#include "ui/qt/Navigator.h"
#include "ui/qt/TableModel.h"

namespace pyx::qt {

void registerQmlTypes() {
    static std::once_flag once;
    std::call_once(once, [] {
        const QString made = QStringLiteral("made by the navigator");
        qmlRegisterUncreatableType<Navigator>("Pyxon", 1, 0, "Navigator", made);
        qmlRegisterUncreatableType<Screen>("Pyxon", 1, 0, "Screen", made);
        qmlRegisterUncreatableType<TableModel>("Pyxon", 1, 0, "TableModel", made);
        qmlRegisterUncreatableType<ChartModel>("Pyxon", 1, 0, "ChartModel", made);
        qmlRegisterUncreatableType<DriveMapModel>("Pyxon", 1, 0, "DriveMapModel", made);
    });
}

}  // namespace pyx::qt
