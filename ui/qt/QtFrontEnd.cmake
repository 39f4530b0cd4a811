# The Qt Quick front end (target pyx_ui_qt): list models and the navigator over the
# controllers, and the QML compiled into the binary as resources under qrc:/pyxon/.
# GLOBAL: the program links pyx_ui_qt from another directory and needs the Qt targets there.
find_package(Qt6 6.4 QUIET GLOBAL COMPONENTS Core Gui Widgets Qml Quick QuickControls2 Charts)
if(NOT Qt6_FOUND)
  message(STATUS "Qt 6 Quick not found: building without the window")
  return()
endif()

add_library(pyx_ui_qt STATIC
  qt/TableModel.cpp qt/Navigator.cpp qt/MainQueueBridge.cpp qt/QmlTypes.cpp
  qt/Screenshots.cpp qt/QtFrontEnd.cpp qt/ChartModel.cpp qt/DriveMapModel.cpp
  qt/TableModel.h qt/Navigator.h qt/Screenshots.h qt/ChartModel.h qt/DriveMapModel.h)
set_target_properties(pyx_ui_qt PROPERTIES AUTOMOC ON)
target_link_libraries(pyx_ui_qt
  PUBLIC pyx_ui Qt6::Core Qt6::Gui Qt6::Widgets Qt6::Qml Qt6::Quick Qt6::Charts
  PRIVATE Qt6::QuickControls2)
qt_add_resources(pyx_ui_qt pyxon_qml
  PREFIX /pyxon
  BASE qml
  FILES qml/Main.qml qml/PyxonView.qml qml/ScreenPage.qml qml/TableItem.qml qml/ChartPage.qml
        qml/DriveMapPage.qml)
pyxon_target(pyx_ui_qt)
