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
    // Line colours, told apart on either background.
    readonly property var lightLines: ["#1f77b4", "#d62728", "#2ca02c", "#ff7f0e", "#9467bd", "#8c564b", "#e377c2", "#17becf", "#7f7f7f", "#bcbd22"]
    readonly property var darkLines: ["#5aa9e6", "#ff6b6b", "#63d471", "#ffa94d", "#b197fc", "#d4a373", "#f783ac", "#3bc9db", "#ced4da", "#e9ec5f"]
    function lineColor(index) {
        const lines = page.dark ? page.darkLines : page.lightLines
        return lines[index % lines.length]
    }
    // Ticks fit the width: about one per 90 pixels, at least three.
    readonly property int timeTicks: Math.max(3, Math.min(7, Math.floor(width / 90)))

    // The lines are never drawn wider than the page: the model hands the chart no more
    // points than its pixels can show.
    Binding {
        target: page.chart
        property: "columns"
        value: Math.floor(page.width)
        when: page.chart !== null && page.width > 0
    }

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
        anchors { top: missing.visible ? missing.bottom : selector.bottom; topMargin: 4; left: parent.left; right: parent.right; bottom: parent.bottom }
        visible: page.chart !== null && !page.chart.empty

        Repeater {
            model: page.chart ? page.chart.panelCount : 0
            delegate: Item {
                id: panel
                required property int index
                property string shown: ""
                property var names: []
                readonly property alias timeAxis: timeAxis
                readonly property alias valueAxis: valueAxis
                objectName: "panel" + index
                width: panels.width
                height: panels.height / Math.max(1, page.chart.panelCount)

                ChartView {
                    id: view
                    objectName: "chartView"
                    anchors { left: parent.left; right: parent.right; top: parent.top; bottom: legend.top }
                    antialiasing: true
                    animationOptions: ChartView.NoAnimation
                    theme: page.dark ? ChartView.ChartThemeDark : ChartView.ChartThemeLight
                    // The plot area shows this background: a plot area colour of its own, even
                    // the same one, would be painted over it again on every change.
                    backgroundColor: page.colors.base
                    backgroundRoundness: 0
                    margins { top: 2; bottom: 0; left: 4; right: 8 }
                    legend.visible: false
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
                }

                // The legend wraps onto as many rows as its names need.
                Flow {
                    id: legend
                    objectName: "legend"
                    anchors { left: parent.left; right: parent.right; bottom: parent.bottom; leftMargin: 16; rightMargin: 8; bottomMargin: 6 }
                    spacing: 10
                    Text {
                        visible: text.length > 0
                        text: page.chart ? page.chart.caption(panel.index) : ""
                        font.pixelSize: 12
                        font.weight: Font.DemiBold
                        color: page.colors.text
                    }
                    Repeater {
                        model: panel.names
                        delegate: Row {
                            required property string modelData
                            required property int index
                            spacing: 4
                            Rectangle {
                                width: 14; height: 3; radius: 1
                                anchors.verticalCenter: parent.verticalCenter
                                color: page.lineColor(parent.index)
                            }
                            Text {
                                text: parent.modelData
                                font.pixelSize: 12
                                color: page.colors.text
                            }
                        }
                    }
                }

                // The lines, panels or texts changed: one line series per segment. The series
                // drawn already are kept for the new segments (named and coloured again); only
                // those missing are made and those left over removed, so that lines coming and
                // going leave no series behind.
                function redraw() {
                    if (!page.chart || panel.index >= page.chart.panelCount)
                        return
                    const names = page.chart.seriesNames(panel.index)
                    const segments = page.chart.segmentCount(panel.index)
                    let owners = []
                    for (let k = 0; k < segments; ++k)
                        owners.push(page.chart.segmentLine(panel.index, k))
                    const signature = names.join("\n") + "|" + owners.join(",") + "|" + page.dark
                    if (signature !== panel.shown) {
                        panel.range = ""
                        while (view.count > segments)
                            view.removeSeries(view.series(view.count - 1))
                        for (let k = 0; k < segments; ++k) {
                            const line = k < view.count ? view.series(k)
                                : view.createSeries(ChartView.SeriesTypeLine, names[owners[k]], timeAxis, valueAxis)
                            line.name = names[owners[k]]
                            line.color = page.lineColor(owners[k])
                            line.width = 2
                        }
                        panel.names = names
                        panel.shown = signature
                    }
                    // Emptied before the axes move and filled after: each line is laid out once.
                    for (let k = 0; k < view.count; ++k)
                        page.chart.clearChanged(panel.index, k, view.series(k))
                    moveWindow(true)
                    setRange()
                    for (let k = 0; k < view.count; ++k)
                        page.chart.fill(panel.index, k, view.series(k))
                }

                // The same lines as drawn: only those whose points changed take them, emptied
                // before the axes follow the window and the values (and filled after), so that
                // each line is laid out once a refresh however many of these changed.
                function extend() {
                    if (!page.chart || panel.index >= page.chart.panelCount)
                        return
                    for (let k = 0; k < view.count; ++k)
                        page.chart.clearChanged(panel.index, k, view.series(k))
                    setRange()
                    moveWindow(false)
                    for (let k = 0; k < view.count; ++k)
                        page.chart.extend(panel.index, k, view.series(k))
                }

                // The value axis is set (and laid out again) only when its range moved, in one
                // change.
                property string range: ""
                function setRange() {
                    const key = page.chart.minimum(panel.index) + ":" + page.chart.maximum(panel.index)
                    if (key === panel.range)
                        return
                    page.chart.showRange(panel.index, valueAxis)
                    panel.range = key
                }

                // The newest time the axis ends at. The axis moves only when that moves by a
                // pixel or more (at 30 minutes a second is a fraction of one): nothing is laid
                // out again for a move no one can see.
                property real shownToMs: 0
                function moveWindow(always) {
                    const spanMs = page.chart.toMs - page.chart.fromMs
                    const pixels = Math.abs(page.chart.toMs - panel.shownToMs) * view.plotArea.width / spanMs
                    if (!always && spanMs > 0 && pixels < 1)
                        return
                    page.chart.showWindow(timeAxis)
                    panel.shownToMs = page.chart.toMs
                }

                Component.onCompleted: redraw()
                Connections {
                    target: page.chart
                    function onChanged() { panel.redraw() }
                    function onExtended() { panel.extend() }
                    function onWindowMoved() { panel.moveWindow(false) }
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
