// The navigation view: a title bar with a back button over a stack of table screens. The stack
// mirrors the navigator: it pushes and pops when the navigator says so.
import QtQuick
import QtQuick.Controls
import Pyxon

FocusScope {
    id: root

    required property Navigator navigator
    readonly property alias stack: stack
    readonly property alias colors: sys
    readonly property Screen screen: stack.currentItem ? stack.currentItem.screen : null
    readonly property string title: screen ? screen.title : ""
    // The current row is marked while the keyboard is in use, not after pointer taps.
    property bool keyboardActive: false
    readonly property string backTitle: {
        const depth = navigator.depth   // re-evaluated on every push and pop
        const previous = depth > 1 ? navigator.screenAt(depth - 2) : null
        return previous ? previous.title : ""
    }

    // Keys go to the list of the screen on top.
    function focusCurrent() {
        if (stack.currentItem && stack.currentItem.list)
            stack.currentItem.list.forceActiveFocus()
    }
    onActiveFocusChanged: if (activeFocus) focusCurrent()

    SystemPalette {
        id: sys
        colorGroup: SystemPalette.Active
    }

    Rectangle {
        id: bar
        anchors { left: parent.left; right: parent.right; top: parent.top }
        height: 52
        color: sys.window
        z: 1

        Item {
            id: backButton
            objectName: "backButton"
            anchors { left: parent.left; top: parent.top; bottom: parent.bottom }
            width: Math.min(backLabel.implicitWidth + 24, bar.width * 0.3)
            visible: root.navigator.depth > 1
            Accessible.role: Accessible.Button
            Accessible.name: "Back"

            Text {
                id: backLabel
                anchors { left: parent.left; leftMargin: 10; right: parent.right; verticalCenter: parent.verticalCenter }
                text: "\u2039 " + (root.backTitle.length > 0 ? root.backTitle : "Back")
                elide: Text.ElideRight
                font.pixelSize: 17
                color: backArea.pressed ? Qt.darker(sys.highlight, 1.3) : sys.highlight
            }
            MouseArea {
                id: backArea
                anchors.fill: parent
                onClicked: {
                    root.keyboardActive = false
                    root.navigator.back()
                }
            }
        }

        Item {
            id: chartButton
            objectName: "chartButton"
            anchors { right: parent.right; top: parent.top; bottom: parent.bottom }
            width: chartLabel.implicitWidth + 24
            visible: root.screen !== null && root.screen.charted
            Accessible.role: Accessible.Button
            Accessible.name: "Chart"

            Text {
                id: chartLabel
                anchors { right: parent.right; rightMargin: 12; verticalCenter: parent.verticalCenter }
                text: "Chart"
                font.pixelSize: 17
                color: chartArea.pressed ? Qt.darker(sys.highlight, 1.3) : sys.highlight
            }
            MouseArea {
                id: chartArea
                anchors.fill: parent
                onClicked: {
                    root.keyboardActive = false
                    root.navigator.openChart()
                }
            }
        }

        Item {
            id: mapButton
            objectName: "mapButton"
            anchors { right: parent.right; top: parent.top; bottom: parent.bottom }
            width: mapLabel.implicitWidth + 24
            visible: root.navigator.mapOffered && root.navigator.depth === 1
            Accessible.role: Accessible.Button
            Accessible.name: "Drive map"

            Text {
                id: mapLabel
                anchors { right: parent.right; rightMargin: 12; verticalCenter: parent.verticalCenter }
                text: "Map"
                font.pixelSize: 17
                color: mapArea.pressed ? Qt.darker(sys.highlight, 1.3) : sys.highlight
            }
            MouseArea {
                id: mapArea
                anchors.fill: parent
                onClicked: {
                    root.keyboardActive = false
                    root.navigator.openDriveMap()
                }
            }
        }

        Text {
            id: titleLabel
            objectName: "titleLabel"
            anchors.centerIn: parent
            width: bar.width - 2 * Math.max(backButton.width, chartButton.visible ? chartButton.width : 16,
                                            mapButton.visible ? mapButton.width : 16, 16) - 8
            horizontalAlignment: Text.AlignHCenter
            text: root.title
            elide: Text.ElideRight
            font.pixelSize: 17
            font.weight: Font.DemiBold
            color: sys.windowText
        }

        Rectangle {
            anchors { left: parent.left; right: parent.right; bottom: parent.bottom }
            height: 1
            color: sys.mid
            opacity: 0.6
        }
    }

    StackView {
        id: stack
        objectName: "stack"
        anchors { left: parent.left; right: parent.right; top: bar.bottom; bottom: statusLine.top }
        focus: true
        onCurrentItemChanged: if (root.activeFocus) root.focusCurrent()
        initialItem: ScreenPage {
            screen: root.navigator.screenAt(0)
            navigator: root.navigator
            view: root
            colors: sys
        }
    }

    Component {
        id: pageComponent
        ScreenPage {}
    }
    Component {
        id: chartComponent
        ChartPage {}
    }
    Component {
        id: mapComponent
        DriveMapPage {}
    }

    // The status line: what the GPS receiver gives (or why nothing), with --gps.
    Rectangle {
        id: statusLine
        objectName: "statusLine"
        anchors { left: parent.left; right: parent.right; bottom: parent.bottom }
        height: visible ? 26 : 0
        visible: root.navigator.gpsStatus.length > 0
        color: sys.window
        Rectangle {
            anchors { left: parent.left; right: parent.right; top: parent.top }
            height: 1
            color: sys.mid
            opacity: 0.6
        }
        Text {
            objectName: "gpsStatus"
            anchors { left: parent.left; leftMargin: 12; right: parent.right; rightMargin: 12; verticalCenter: parent.verticalCenter }
            text: root.navigator.gpsStatus
            elide: Text.ElideRight
            font.pixelSize: 13
            color: sys.windowText
        }
        Timer {
            interval: 1000
            repeat: true
            running: root.navigator.mapOffered
            onTriggered: root.navigator.updateGpsStatus()
        }
    }

    Connections {
        target: root.navigator
        function onPushed(screen) {
            stack.push(screen.chart ? chartComponent : screen.map ? mapComponent : pageComponent, { screen: screen, navigator: root.navigator, colors: sys, view: root },
                       root.navigator.animated ? StackView.PushTransition : StackView.Immediate)
        }
        function onPopped() {
            stack.pop(root.navigator.animated ? StackView.PopTransition : StackView.Immediate)
        }
    }

    Shortcut {
        sequences: [StandardKey.Back]
        onActivated: root.navigator.back()
    }
}
