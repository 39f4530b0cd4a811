// The Drive map page: the track's points on a local metric projection (no map tiles: the
// machine may be offline), coloured by the serving level where each fix came, with a legend
// and a scale bar. It reads the track at most once a second while it is the page shown, and
// draws only when a point was added.
import QtQuick
import QtQuick.Controls
import QtCharts
import Pyxon

FocusScope {
    id: page

    property Screen screen
    property Navigator navigator
    property SystemPalette colors
    property Item view
    readonly property DriveMapModel map: screen ? screen.map : null
    readonly property bool shown: StackView.status === StackView.Active

    StackView.onRemoved: if (page.navigator && page.screen) page.navigator.release(page.screen)
    StackView.onActivated: page.forceActiveFocus()

    Keys.onPressed: (event) => {
        switch (event.key) {
        case Qt.Key_Escape:
        case Qt.Key_Left:
        case Qt.Key_Back:
        case Qt.Key_Backspace:
            page.navigator.back()
            event.accepted = true
            break
        }
    }

    Rectangle {
        anchors.fill: parent
        color: page.colors ? page.colors.base : "white"
    }

    Text {
        objectName: "emptyText"
        anchors { left: parent.left; right: parent.right; verticalCenter: parent.verticalCenter; margins: 32 }
        visible: page.map !== null && page.map.empty
        text: page.map ? page.map.emptyText : ""
        horizontalAlignment: Text.AlignHCenter
        wrapMode: Text.Wrap
        font.pixelSize: 17
        color: page.colors.text
        opacity: 0.7
    }

    ChartView {
        id: chart
        objectName: "mapView"
        visible: page.map !== null && !page.map.empty
        anchors { top: parent.top; horizontalCenter: parent.horizontalCenter }
        width: Math.min(parent.width, parent.height - legend.height - 16)
        height: width
        antialiasing: true
        animationOptions: ChartView.NoAnimation
        legend.visible: false
        backgroundColor: page.colors.base
        plotAreaColor: Qt.rgba(page.colors.text.r, page.colors.text.g, page.colors.text.b, 0.04)
        backgroundRoundness: 0
        margins { top: 8; bottom: 8; left: 8; right: 8 }

        ValueAxis {
            id: east
            min: page.map ? -page.map.extent : -50
            max: page.map ? page.map.extent : 50
            labelsVisible: false
            lineVisible: false
            gridVisible: false
        }
        ValueAxis {
            id: north
            min: page.map ? -page.map.extent : -50
            max: page.map ? page.map.extent : 50
            labelsVisible: false
            lineVisible: false
            gridVisible: false
        }

        // The scale bar, in the plot's lower left corner.
        Item {
            objectName: "scaleBar"
            readonly property real pixels: page.map && page.map.extent > 0
                                           ? page.map.scaleMetres / (2 * page.map.extent) * chart.plotArea.width : 0
            x: chart.plotArea.x + 12
            y: chart.plotArea.y + chart.plotArea.height - 30
            width: pixels
            height: 22
            Rectangle {
                anchors { left: parent.left; right: parent.right; bottom: parent.bottom }
                height: 3
                color: page.colors.text
            }
            Rectangle {
                anchors { left: parent.left; bottom: parent.bottom }
                width: 2
                height: 9
                color: page.colors.text
            }
            Rectangle {
                anchors { right: parent.right; bottom: parent.bottom }
                width: 2
                height: 9
                color: page.colors.text
            }
            Text {
                objectName: "scaleText"
                anchors { left: parent.left; bottom: parent.bottom; bottomMargin: 5 }
                text: page.map ? page.map.scaleText : ""
                font.pixelSize: 12
                color: page.colors.text
            }
        }

        // North is up.
        Text {
            x: chart.plotArea.x + chart.plotArea.width - width - 10
            y: chart.plotArea.y + 6
            text: "N \u2191"
            font.pixelSize: 13
            font.weight: Font.DemiBold
            color: page.colors.text
        }

        function redraw() {
            if (!page.map)
                return
            if (chart.count === 0) {
                for (let bin = 0; bin < page.map.binCount(); ++bin) {
                    const series = chart.createSeries(ChartView.SeriesTypeScatter, page.map.binName(bin), east, north)
                    series.color = page.map.binColor(bin)
                    series.borderColor = "transparent"
                    series.markerSize = 7
                }
            }
            for (let k = 0; k < chart.count; ++k)
                page.map.fill(k, chart.series(k))
        }
        Component.onCompleted: redraw()
        Connections {
            target: page.map
            function onChanged() { chart.redraw() }
        }
    }

    Column {
        id: legend
        objectName: "legend"
        anchors { top: chart.bottom; topMargin: 8; left: parent.left; leftMargin: 16; right: parent.right }
        visible: page.map !== null && !page.map.empty
        spacing: 4
        Text {
            text: page.map && page.map.technology.length > 0 ? "Serving " + page.map.technology : "Serving level"
            font.pixelSize: 13
            font.weight: Font.DemiBold
            color: page.colors.text
        }
        Repeater {
            model: page.map ? page.map.binCount() : 0
            delegate: Row {
                required property int index
                spacing: 6
                Rectangle {
                    width: 10; height: 10; radius: 5
                    anchors.verticalCenter: parent.verticalCenter
                    color: page.map.binColor(parent.index)
                }
                Text {
                    // Re-read when the map changes (the counts).
                    text: page.map.binName(parent.index) + " (" + (page.map.pointCount, page.map.binSize(parent.index)) + ")"
                    font.pixelSize: 12
                    color: page.colors.text
                }
            }
        }
    }

    Timer {
        objectName: "mapTimer"
        interval: 1000
        repeat: true
        running: page.map !== null && page.shown
        onTriggered: page.map.refresh()
    }
}
