import QtQuick
import QtTest

// The chart pages as a user meets them: the button that opens them, the words shown before
// anything has arrived, one panel per unit over one time window, the window selector, and a
// refresh that reads the history only when it has changed, and a time axis that follows the
// newest time.
TestCase {
    id: testCase
    name: "Chart"
    width: 390
    height: 844
    visible: true
    when: windowShown

    property var view: null
    // 2024-06-01 00:00:00 UTC.
    readonly property real start: 1717200000000

    SignalSpy {
        id: changedSpy
        signalName: "changed"
    }

    SignalSpy {
        id: movedSpy
        signalName: "windowMoved"
    }

    SignalSpy {
        id: extendedSpy
        signalName: "extended"
    }

    function init() {
        testNavigator.popToRoot()
        testNavigator.animated = false
        testStore.clearHistory()
        const component = Qt.createComponent("qrc:/pyxon/PyxonView.qml")
        verify(component.status === Component.Ready, component.errorString())
        view = createTemporaryObject(component, testCase,
                                     { navigator: testNavigator, width: 390, height: 844 })
        verify(view !== null)
        view.forceActiveFocus()
        waitForRendering(view)
    }

    function openChart(group, category) {
        verify(testNavigator.open([group, category]))
        const button = findChild(view, "chartButton")
        verify(button.visible)
        mouseClick(button)
        compare(view.stack.depth, 4)
        waitForRendering(view)
        return view.stack.currentItem
    }

    function idle(rxlev, atMs) {
        verify(testStore.record("myGSMIdleScellMeasDict", ["idle_rxlev_dBm", rxlev], atMs))
    }

    function test_onlyScreensOfMeasuredQuantitiesOfferAChart() {
        verify(testNavigator.open(["LTE", "C-DRX"]))
        verify(!findChild(view, "chartButton").visible)
        verify(testNavigator.open(["LTE", "Serving Cell Meas"]))
        verify(findChild(view, "chartButton").visible)
        verify(testNavigator.open(["GSM"]))
        verify(!findChild(view, "chartButton").visible)
    }

    function test_emptyHistorySaysSoInWords() {
        const page = openChart("GSM", "Idle Serv Cell Meas")
        compare(findChild(view, "titleLabel").text, "GSM serving")
        const words = findChild(page, "emptyText")
        verify(words.visible)
        verify(words.text.indexOf("Nothing has arrived yet") === 0, words.text)
        verify(!findChild(page, "panels").visible)
        compare(page.chart.panelCount, 0)
        verify(page.chart.empty)
    }

    function test_onePanelPerUnitOverOneTimeWindow() {
        idle(-82, start)
        idle(-80, start + 30000)
        verify(testStore.record("myGSMConnRfMeasDict", ["cs_rxlev_sub", 29], start + 60000))
        const page = openChart("GSM", "Connected Serv Cell Meas")
        const chart = page.chart
        verify(!chart.empty)
        verify(!findChild(page, "emptyText").visible)
        compare(chart.panelCount, 2)
        compare(chart.unit(0), "dBm")
        compare(chart.seriesNames(0), ["RxLev idle"])
        compare(chart.unit(1), "RxLev")
        compare(chart.seriesNames(1), ["RxLev connected"])
        compare(chart.windowMinutes, 5)
        compare(chart.toMs, start + 60000)
        compare(chart.fromMs, start + 60000 - 5 * 60000)
        compare(chart.segmentCount(0), 1)
        compare(chart.segmentLine(0, 0), 0)
        verify(chart.minimum(0) < -82 && chart.maximum(0) > -80)
        compare(chart.missingText, "")
        compare(chart.caption(0), "")
        verify(findChild(page, "panel0") !== null)
        verify(findChild(page, "panel1") !== null)
    }

    function test_quantitiesNeverReportedAreNamed() {
        idle(-82, start)
        const page = openChart("GSM", "Idle Serv Cell Meas")
        compare(page.chart.missingText, "RxLev connected")
        const missing = findChild(page, "missingText")
        verify(missing.visible)
        compare(missing.text, "Not reported: RxLev connected")
    }

    function test_windowSelectorChoosesHowMuchIsShown() {
        idle(-90, start)
        idle(-70, start + 4 * 60000)
        const page = openChart("GSM", "Idle Serv Cell Meas")
        const chart = page.chart
        compare(chart.minimum(0) <= -90, true)
        mouseClick(findChild(page, "window1"))
        compare(chart.windowMinutes, 1)
        // Only the newest point is within the last minute.
        verify(chart.minimum(0) > -90, chart.minimum(0))
        compare(chart.fromMs, start + 3 * 60000)
        mouseClick(findChild(page, "window30"))
        compare(chart.windowMinutes, 30)
        chart.windowMinutes = 7   // not a choice: ignored
        compare(chart.windowMinutes, 30)
    }

    function test_refreshReadsTheHistoryOnlyWhenItChanged() {
        idle(-82, start)
        const page = openChart("GSM", "Idle Serv Cell Meas")
        changedSpy.target = page.chart
        changedSpy.clear()
        page.chart.refresh()
        compare(changedSpy.count, 0)
        idle(-81, start + 2000)
        page.chart.refresh()
        compare(changedSpy.count, 0)
        compare(page.chart.toMs, start + 2000)
        compare(page.chart.points(0, 0).length, 2)
    }

    // What the page draws: the line series of the first panel's chart view.
    function drawnMatchesTheModel(page, segment) {
        const drawn = findChild(findChild(page, "panel0"), "chartView").series(segment)
        const points = page.chart.points(0, segment)
        compare(drawn.count, points.length)
        for (let i = 0; i < points.length; ++i) {
            compare(drawn.at(i).x, points[i].x)
            compare(drawn.at(i).y, points[i].y)
        }
    }

    function test_newPointsExtendTheDrawnLinesWithoutRedrawingThem() {
        idle(-82, start)
        const page = openChart("GSM", "Idle Serv Cell Meas")
        const chart = page.chart
        mouseClick(findChild(page, "window1"))
        changedSpy.target = chart
        extendedSpy.target = chart
        changedSpy.clear()
        extendedSpy.clear()
        // Two minutes of a point every two seconds: the first minute's points leave the window.
        for (let i = 1; i <= 60; ++i) {
            idle(-82 + (i % 7), start + i * 2000)
            chart.refresh()
            drawnMatchesTheModel(page, 0)
        }
        compare(changedSpy.count, 0)
        compare(extendedSpy.count, 60)
        compare(chart.segmentCount(0), 1)
        const points = chart.points(0, 0)
        verify(points[0].x >= chart.fromMs, points[0].x)
        compare(points[points.length - 1].x, start + 120000)
        // A value within the newest slot changes the newest point(s) in place.
        idle(-60, start + 120500)
        chart.refresh()
        compare(extendedSpy.count, 61)
        drawnMatchesTheModel(page, 0)
        compare(chart.maximum(0) >= -60, true)
        // After a pause the line breaks: a new segment is a new line series.
        idle(-75, start + 140000)
        chart.refresh()
        compare(changedSpy.count, 1)
        compare(chart.segmentCount(0), 2)
        drawnMatchesTheModel(page, 0)
        drawnMatchesTheModel(page, 1)
        // And the next point extends the new segment.
        idle(-74, start + 142000)
        chart.refresh()
        compare(changedSpy.count, 1)
        compare(extendedSpy.count, 62)
        drawnMatchesTheModel(page, 1)
    }

    // GSM neighbours heard at atMs: [arfcn, rxlev] pairs.
    function gsmNeighbours(cells, atMs) {
        let entries = []
        for (const cell of cells)
            entries.push(["arfcn", cell[0], "rxlev", cell[1]])
        verify(testStore.record("myGSMNbrMeasDict", ["gsm_ncell_meas", entries], atMs))
    }

    // Every line the first panel draws: one line series per segment, named and coloured as its
    // line in the legend, with the segment's points.
    function drawnLinesMatchTheModel(page) {
        const chart = page.chart
        const panel = findChild(page, "panel0")
        const view = findChild(panel, "chartView")
        compare(view.count, chart.segmentCount(0))
        const names = chart.seriesNames(0)
        compare(panel.names, names)
        for (let k = 0; k < view.count; ++k) {
            const line = chart.segmentLine(0, k)
            compare(view.series(k).name, names[line])
            verify(Qt.colorEqual(view.series(k).color, page.lineColor(line)))
            drawnMatchesTheModel(page, k)
        }
    }

    function test_neighboursComingAndGoingLeaveNoLinesBehind() {
        gsmNeighbours([[58, -70]], start - 2000)
        const page = openChart("GSM", "GSM Neighbor Cell Meas")
        const chart = page.chart
        const view = findChild(findChild(page, "panel0"), "chartView")
        changedSpy.target = chart
        changedSpy.clear()
        // Ten minutes of neighbours every two seconds: one always there, three of six others in
        // turn, each gone long enough now and then for its line to break.
        let most = 0
        let kept = null
        for (let i = 0; i < 300; ++i) {
            let cells = [[58, -70 - (i % 5)]]
            for (let n = 0; n < 6; ++n) {
                if (Math.floor(i / (7 + n)) % 2 === n % 2)
                    cells.push([60 + n, -80 - n - (i % 3)])
            }
            gsmNeighbours(cells, start + i * 2000)
            chart.refresh()
            drawnLinesMatchTheModel(page)
            most = Math.max(most, chart.segmentCount(0))
            if (i === 0)
                kept = view.series(0)
        }
        // The first line series drew a segment all along, whichever: kept, not made anew.
        verify(view.series(0) === kept)
        verify(changedSpy.count > 20, changedSpy.count)
        verify(most > 7, most)
        // Nothing is left of the lines that went: as many series as segments, no more.
        compare(view.count, chart.segmentCount(0))
        // Only the always-heard neighbour after the others stop.
        for (let i = 300; i < 460; ++i) {
            gsmNeighbours([[58, -72]], start + i * 2000)
            chart.refresh()
        }
        compare(chart.seriesNames(0), ["ARFCN 58"])
        compare(chart.segmentCount(0), 1)
        compare(view.count, 1)
        drawnLinesMatchTheModel(page)
        const legend = findChild(findChild(page, "panel0"), "legend")
        compare(legend.children.length, 3)  // the caption, one name and the repeater
    }

    function test_thePlotAreaShowsThePageBackground() {
        idle(-82, start)
        idle(-80, start + 30000)
        const page = openChart("GSM", "Idle Serv Cell Meas")
        const chartView = findChild(findChild(page, "panel0"), "chartView")
        waitForRendering(view)
        const image = grabImage(view)
        const area = chartView.plotArea
        verify(area.width > 100 && area.height > 100, area.width + "x" + area.height)
        // Inside the corners of the plot area, clear of the grid and of the line.
        const corners = [[area.x + 4, area.y + 4], [area.x + area.width - 5, area.y + 4],
                         [area.x + 4, area.y + area.height - 5],
                         [area.x + area.width - 5, area.y + area.height - 5]]
        for (const corner of corners) {
            const at = chartView.mapToItem(view, corner[0], corner[1])
            const seen = image.pixel(Math.round(at.x), Math.round(at.y))
            verify(Qt.colorEqual(seen, page.colors.base), seen + " at " + at)
        }
    }

    function test_aLongWindowDrawsNoMorePointsThanThePageHasPixels() {
        // Half an hour of a low and a high value in every two-second slot.
        for (let i = 0; i < 900; ++i) {
            idle(-80 - (i % 4), start + i * 2000)
            idle(-70 + (i % 3), start + i * 2000 + 1000)
        }
        const page = openChart("GSM", "Idle Serv Cell Meas")
        const chart = page.chart
        compare(chart.columns, Math.floor(page.width))
        // Five minutes: every slot, its low and its high value.
        compare(chart.segmentCount(0), 1)
        compare(chart.points(0, 0).length, 2 * 150)
        drawnMatchesTheModel(page, 0)
        // Half an hour on 390 pixels: two slots to a column, as low and as high as both.
        mouseClick(findChild(page, "window30"))
        compare(chart.segmentCount(0), 1)
        const points = chart.points(0, 0)
        compare(points.length, 2 * 450)
        let lowest = 0
        let highest = -200
        for (const point of points) {
            lowest = Math.min(lowest, point.y)
            highest = Math.max(highest, point.y)
        }
        compare(lowest, -83)
        compare(highest, -68)
        compare(chart.minimum(0) <= -83 && chart.maximum(0) >= -68, true)
        drawnMatchesTheModel(page, 0)
        // Each column spans its slots: from the first slot's time, low then high.
        compare(points[0].x, start)
        compare(points[1].x, start + 1)
        compare(points[0].y, -81)
        compare(points[1].y, -69)
    }

    function test_theValueAxisCoversTheLinesInRoundNumbers() {
        idle(-82, start)
        const page = openChart("GSM", "Idle Serv Cell Meas")
        const chart = page.chart
        const axis = findChild(page, "panel0").valueAxis
        const covers = () => {
            verify(axis.min <= chart.minimum(0) && axis.max >= chart.maximum(0),
                   axis.min + ".." + axis.max + " for " + chart.minimum(0) + ".." + chart.maximum(0))
            const step = (axis.max - axis.min) / (axis.tickCount - 1)
            compare(Math.round(axis.min / step) * step, axis.min)
            compare(Math.round(axis.max / step) * step, axis.max)
        }
        covers()
        idle(-40, start + 2000)
        chart.refresh()
        covers()
        verify(axis.max >= -40)
        idle(-110, start + 4000)
        chart.refresh()
        covers()
        verify(axis.min <= -110)
    }

    function lteTxPower(dBm, atMs) {
        verify(testStore.record("myLTETxPowerDict",
                                ["tx_power_info", [["pusch_tx_power", dBm]]], atMs))
    }

    function test_theTimeAxisFollowsOtherKindsWithoutRereadingTheLines() {
        idle(-82, start)
        const page = openChart("GSM", "Idle Serv Cell Meas")
        changedSpy.target = page.chart
        movedSpy.target = page.chart
        changedSpy.clear()
        movedSpy.clear()
        lteTxPower(20, start + 60000)
        page.chart.refresh()
        compare(changedSpy.count, 0)
        compare(movedSpy.count, 1)
        compare(page.chart.toMs, start + 60000)
        compare(page.chart.fromMs, start + 60000 - 5 * 60000)
        verify(!page.chart.empty)
        const axis = findChild(page, "panel0").timeAxis
        compare(axis.max.getTime(), start + 60000)
        compare(axis.min.getTime(), start + 60000 - 5 * 60000)
        // A move of less than a pixel is not drawn; the model follows all the same.
        lteTxPower(20, start + 60010)
        page.chart.refresh()
        compare(movedSpy.count, 2)
        compare(page.chart.toMs, start + 60010)
        compare(axis.max.getTime(), start + 60000)

        // Once the GSM line is older than the window, the page says so.
        lteTxPower(21, start + 6 * 60000)
        page.chart.refresh()
        compare(changedSpy.count, 1)
        verify(page.chart.empty)
        verify(page.chart.emptyText.indexOf("RxLev idle") >= 0, page.chart.emptyText)
    }

    function test_updatesWhileShownAndStopsWhenClosed() {
        const page = openChart("GSM", "Idle Serv Cell Meas")
        const timer = findChild(page, "chartTimer")
        verify(timer.running)
        compare(timer.interval, 1000)
        verify(page.chart.empty)
        idle(-75, start)
        tryVerify(() => !page.chart.empty, 3000)
        verify(findChild(page, "panels").visible)
        testNavigator.back()
        compare(view.stack.depth, 3)
        verify(!timer.running)
    }

    function test_backFromTheChartReturnsToItsScreen() {
        openChart("LTE", "Tx Power")
        compare(findChild(view, "titleLabel").text, "LTE serving")
        keyClick(Qt.Key_Escape)
        compare(view.stack.depth, 3)
        compare(findChild(view, "titleLabel").text, "Tx Power")
    }
}
