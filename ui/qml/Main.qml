// The application window: a phone-sized portrait window holding the navigation view.
import QtQuick
import QtQuick.Controls
import Pyxon

ApplicationWindow {
    id: window

    required property Navigator navigator

    width: 390
    height: 844
    minimumWidth: 320
    minimumHeight: 480
    visible: true
    title: view.title.length > 0 && view.title !== "Pyxon" ? view.title + " – Pyxon" : "Pyxon"
    color: view.colors.window

    PyxonView {
        id: view
        anchors.fill: parent
        navigator: window.navigator
        focus: true
    }

    Component.onCompleted: navigator.rootViewLoaded()
}
