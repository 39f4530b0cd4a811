// One table screen: its items (section headers and rows) in a list, keyboard and pointer
// selection, and the periodic reload for screens that follow the store.
import QtQuick
import QtQuick.Controls
import Pyxon

FocusScope {
    id: page

    property Screen screen
    property Navigator navigator
    property SystemPalette colors
    property Item view          // the navigation view, which knows whether keys are in use
    readonly property alias list: list

    function keyUsed() {
        if (page.view)
            page.view.keyboardActive = true
    }
    function activate(index) {
        if (!page.screen || !page.screen.model.isRow(index))
            return
        list.currentIndex = index
        page.navigator.select(index)
    }
    function move(step) {
        if (!page.screen)
            return
        const next = page.screen.model.rowFrom(list.currentIndex + step, step)
        if (next >= 0)
            list.currentIndex = next
        else if (step < 0)
            list.positionViewAtBeginning()
    }

    StackView.onActivated: list.forceActiveFocus()
    StackView.onRemoved: if (page.navigator && page.screen) page.navigator.release(page.screen)

    Rectangle {
        anchors.fill: parent
        color: page.colors ? page.colors.base : "white"
    }

    ListView {
        id: list
        objectName: "list"
        anchors.fill: parent
        clip: true
        focus: true
        model: page.screen ? page.screen.model : null
        boundsBehavior: Flickable.StopAtBounds
        highlightMoveDuration: 0
        keyNavigationEnabled: false
        currentIndex: -1
        // Keep a row current (headers are never current) and in view.
        onCountChanged: {
            if (page.screen && !page.screen.model.isRow(currentIndex))
                currentIndex = page.screen.model.rowFrom(0, 1)
        }
        onCurrentIndexChanged: if (currentIndex >= 0) positionViewAtIndex(currentIndex, ListView.Contain)
        Component.onCompleted: currentIndex = page.screen ? page.screen.model.rowFrom(0, 1) : -1

        delegate: TableItem {
            width: ListView.view.width
            colors: page.colors
            chevron: page.screen !== null && page.screen.leadsFurther
            current: ListView.isCurrentItem && list.activeFocus && page.view !== null
                     && page.view.keyboardActive
            onTapped: {
                if (page.view)
                    page.view.keyboardActive = false
                page.activate(index)
            }
        }

        Keys.onPressed: (event) => {
            const model = page.screen ? page.screen.model : null
            if (!model)
                return
            event.accepted = true
            switch (event.key) {
            case Qt.Key_Up:
                page.move(-1)
                break
            case Qt.Key_Down:
                page.move(1)
                break
            case Qt.Key_Return:
            case Qt.Key_Enter:
            case Qt.Key_Right:
            case Qt.Key_Space:
                page.activate(list.currentIndex)
                break
            case Qt.Key_Escape:
            case Qt.Key_Left:
            case Qt.Key_Back:
            case Qt.Key_Backspace:
                page.navigator.back()
                break
            case Qt.Key_Home:
                list.currentIndex = model.rowFrom(0, 1)
                list.positionViewAtBeginning()
                break
            case Qt.Key_End:
                list.currentIndex = model.rowFrom(list.count - 1, -1)
                list.positionViewAtEnd()
                break
            case Qt.Key_PageDown:
            case Qt.Key_PageUp: {
                const step = event.key === Qt.Key_PageDown ? 1 : -1
                const target = list.indexAt(0, list.contentY + step * list.height * 0.9)
                const index = target >= 0 ? target : (step > 0 ? list.count - 1 : 0)
                const row = model.rowFrom(index, step)
                list.currentIndex = row >= 0 ? row : model.rowFrom(index, -step)
                break
            }
            default:
                event.accepted = false
                return
            }
            page.keyUsed()
        }

        ScrollIndicator.vertical: ScrollIndicator {}
    }

    Timer {
        objectName: "refreshTimer"
        interval: page.navigator ? page.navigator.refreshIntervalMs : 5000
        repeat: true
        running: page.screen !== null && page.screen.refreshes
        onTriggered: page.screen.update()
    }
}
