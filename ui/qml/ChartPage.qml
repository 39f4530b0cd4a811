// A chart page: the history of one chart as small multiples stacked vertically, one panel per
// unit, all over the same time window, with a window selector above them. It reads the
// history at most once a second while it is the page shown, and not at all otherwise.
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
    readonly property ChartModel chart: screen ? screen.chart : null
    readonly property bool dark: colors ? colors.base.hslLightness < 0.5 : false
    readonly property bool shown: StackView.status === StackView.Active
    // Ticks fit the width: about one per 90 pixels, at least three.
    readonly property int timeTicks: Math.max(3, Math.min(7, Math.floor(width / 90)))

    StackView.onRemoved: if (page.navigator && page.screen) page.navigator.release(page.screen)
    StackView.onActivated: page.forceActiveFocus()

    Keys.onPressed: (event) => {
        const choices = page.chart ? page.chart.windowChoices : []
        const at = page.chart ? choices.indexOf(page.chart.windowMinutes) : -1
        switch (event.key) {
        case Qt.Key_Escape:
        case Qt.Key_Left:
        case Qt.Key_Back:
        case Qt.Key_Backspace:
            page.navigator.back()
            break
        case Qt.Key_Plus:
        case Qt.Key_Up:
            if (at > 0) page.chart.windowMinutes = choices[at - 1]
            break
        case Qt.Key_Minus:
        case Qt.Key_Down:
            if (at >= 0 && at + 1 < choices.length) page.chart.windowMinutes = choices[at + 1]
            break
        default:
            return
        }
        event.accepted = true
    }

    Rectangle {
        anchors.fill: parent
        color: page.colors ? page.colors.base : "white"
    }

    Row {
        id: selector
        objectName: "windowSelector"
        anchors { top: parent.top; topMargin: 8; horizontalCenter: parent.horizontalCenter }
        spacing: 0

        Repeater {
            model: page.chart ? page.chart.windowChoices : []
            delegate: Rectangle {
                required property int modelData
                required property int index
                readonly property bool chosen: page.chart !== null && page.chart.windowMinutes === modelData
                objectName: "window" + modelData
                width: Math.min(80, (page.width - 32) / 4)
                height: 32
                radius: 7
                color: chosen ? page.colors.highlight : "transparent"
                border.color: page.colors.highlight
                border.width: 1
                Accessible.role: Accessible.RadioButton
                Accessible.name: modelData + " min"
                Accessible.checked: chosen

                Text {
                    anchors.centerIn: parent
                    text: parent.modelData + " min"
                    font.pixelSize: 15
                    color: parent.chosen ? page.colors.highlightedText : page.colors.highlight
                }
                MouseArea {
                    anchors.fill: parent
                    onClicked: page.chart.windowMinutes = parent.modelData
                }
            }
        }
    }

    Text {
        id: missing
        objectName: "missingText"
        anchors { top: selector.bottom; topMargin: 6; left: parent.left; right: parent.right; leftMargin: 16; rightMargin: 16 }
        visible: page.chart !== null && !page.chart.empty && page.chart.missingText.length > 0
        height: visible ? implicitHeight : 0
        text: page.chart ? "Not reported: " + page.chart.missingText : ""
        wrapMode: Text.Wrap
        font.pixelSize: 13
        color: page.colors.text
        opacity: 0.6
    }

    Text {
        objectName: "emptyText"
        anchors { left: parent.left; right: parent.right; verticalCenter: parent.verticalCenter; margins: 32 }
        visible: page.chart !== null && page.chart.empty
        text: page.chart ? page.chart.emptyText : ""
        horizontalAlignment: Text.AlignHCenter
        wrapMode: Text.Wrap
        font.pixelSize: 17
        color: page.colors.text
        opacity: 0.7
    }

    Column {
        id: panels
        objectName: "panels"
        anchors { top: missing.bottom; topMargin: 4; left: parent.left; right: parent.right; bottom: parent.bottom }
        visible: page.chart !== null && !page.chart.empty

        Repeater {
            model: page.chart ? page.chart.panelCount : 0
            delegate: ChartView {
                id: panel
                required property int index
                property string shownNames: ""
                objectName: "panel" + index
                width: panels.width
                height: panels.height / Math.max(1, page.chart.panelCount)
                antialiasing: true
                animationOptions: ChartView.NoAnimation
                theme: page.dark ? ChartView.ChartThemeDark : ChartView.ChartThemeLight
                backgroundColor: page.colors.base
                backgroundRoundness: 0
                plotAreaColor: page.colors.base
                margins { top: 2; bottom: 2; left: 4; right: 8 }
                legend.alignment: Qt.AlignBottom
                legend.labelColor: page.colors.text
                legend.font.pixelSize: 12
                localizeNumbers: false

                DateTimeAxis {
                    id: timeAxis
                    format: page.chart && page.chart.windowMinutes <= 1 ? "HH:mm:ss" : "HH:mm"
                    tickCount: page.timeTicks
                    labelsColor: page.colors.text
                    labelsFont.pixelSize: 11
                    gridLineColor: Qt.rgba(page.colors.text.r, page.colors.text.g, page.colors.text.b, 0.12)
                    lineVisible: false
                }
                ValueAxis {
                    id: valueAxis
                    labelFormat: "%.0f"
                    tickCount: 5
                    titleText: page.chart ? page.chart.unit(panel.index) : ""
                    titleFont.pixelSize: 12
                    titleBrush: page.colors.text
                    labelsColor: page.colors.text
                    labelsFont.pixelSize: 11
                    gridLineColor: Qt.rgba(page.colors.text.r, page.colors.text.g, page.colors.text.b, 0.12)
                    lineVisible: false
                }

                function redraw() {
                    if (!page.chart || panel.index >= page.chart.panelCount)
                        return
                    const names = page.chart.seriesNames(panel.index)
                    const joined = names.join("\n")
                    if (joined !== panel.shownNames) {
                        panel.removeAllSeries()
                        for (let i = 0; i < names.length; ++i) {
                            const line = panel.createSeries(ChartView.SeriesTypeLine, names[i], timeAxis, valueAxis)
                            line.width = 2
                        }
                        panel.shownNames = joined
                    }
                    timeAxis.min = new Date(page.chart.fromMs)
                    timeAxis.max = new Date(page.chart.toMs)
                    valueAxis.min = page.chart.minimum(panel.index)
                    valueAxis.max = page.chart.maximum(panel.index)
                    valueAxis.applyNiceNumbers()
                    for (let i = 0; i < panel.count; ++i)
                        page.chart.fill(panel.index, i, panel.series(i))
                }

                Component.onCompleted: redraw()
                Connections {
                    target: page.chart
                    function onChanged() { panel.redraw() }
                }
            }
        }
    }

    Timer {
        objectName: "chartTimer"
        interval: 1000
        repeat: true
        running: page.chart !== null && page.shown
        onTriggered: page.chart.refresh()
    }
}
