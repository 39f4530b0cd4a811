import QtQuick
import QtTest

// The Drive map page as a user meets it: the Map button on the launch list, the words shown
// before any position, the points in the colour of their serving level with the legend's
// counts, a scale bar of a round length, and the page drawn again when a point is added.
TestCase {
    id: testCase
    name: "DriveMap"
    width: 390
    height: 844
    visible: true
    when: windowShown

    property var view: null

    function init() {
        testNavigator.popToRoot()
        testNavigator.animated = false
        testDrive.clear()
        const component = Qt.createComponent("qrc:/pyxon/PyxonView.qml")
        verify(component.status === Component.Ready, component.errorString())
        view = createTemporaryObject(component, testCase,
                                     { navigator: testNavigator, width: 390, height: 844 })
        verify(view !== null)
        waitForRendering(view)
    }

    function openMap() {
        const button = findChild(view, "mapButton")
        verify(button.visible)
        mouseClick(button)
        compare(view.stack.depth, 2)
        waitForRendering(view)
        return view.stack.currentItem
    }

    function test_theMapButtonIsOnTheLaunchListOnly() {
        verify(findChild(view, "mapButton").visible)
        verify(testNavigator.open(["LTE"]))
        verify(!findChild(view, "mapButton").visible)
    }

    function test_withoutPositionsThePageSaysHowToGetThem() {
        const page = openMap()
        compare(findChild(view, "titleLabel").text, "Drive map")
        const words = findChild(page, "emptyText")
        verify(words.visible)
        verify(words.text.indexOf("--gps") >= 0, words.text)
        verify(!findChild(page, "mapView").visible)
    }

    function test_pointsAreBinnedByServingLevelWithLegendAndScale() {
        // About 1.1 km north to south, 0.7 km east to west, in Paris.
        for (let i = 0; i < 10; ++i)
            testDrive.addPoint(48.8566 + i * 0.001, 2.3522 + i * 0.001, i % 5, -75 - 10 * (i % 5))
        testDrive.addPoint(48.8566, 2.3622, -1, 0)
        const page = openMap()
        const map = page.map
        verify(!map.empty)
        compare(map.pointCount, 11)
        compare(map.binCount(), 6)
        for (let bin = 0; bin < 5; ++bin)
            compare(map.binSize(bin), 2)
        compare(map.binSize(5), 1)
        compare(map.binName(0), "excellent")
        compare(map.binName(5), "no level")
        compare(map.technology, "")   // the newest point has no level
        // A square view around the track, and a round scale.
        verify(map.extent > 500 && map.extent < 800, map.extent)
        compare(map.scaleMetres, 200)
        compare(map.scaleText, "200 m")
        const chart = findChild(page, "mapView")
        verify(chart.visible)
        compare(chart.count, 6)
        compare(chart.series(0).count, 2)
        compare(chart.series(5).count, 1)
        // North is up: the northernmost point has the largest y.
        const top = chart.series(4).at(1)
        verify(top.y > 0, top.y)
        verify(findChild(page, "scaleBar").width > 10)
        verify(findChild(page, "legend").visible)
    }

    function test_aNewPointIsDrawnAtTheNextRefresh() {
        testDrive.addPoint(48.8566, 2.3522, 0, -70)
        const page = openMap()
        const chart = findChild(page, "mapView")
        compare(chart.series(0).count, 1)
        testDrive.addPoint(48.8570, 2.3530, 0, -72)
        page.map.refresh()
        compare(chart.series(0).count, 2)
        compare(page.map.technology, "LTE RSRP")
        const timer = findChild(page, "mapTimer")
        verify(timer.running)
        keyClick(Qt.Key_Escape)
        compare(view.stack.depth, 1)
    }
}
