import QtQuick
import QtTest

TestCase {
    id: testCase
    name: "Navigation"
    width: 390
    height: 844
    visible: true
    when: windowShown

    property var view: null

    function init() {
        testNavigator.popToRoot()
        testNavigator.animated = false
        testStore.clear("myLTECDRXConfigDict")
        const component = Qt.createComponent("qrc:/pyxon/PyxonView.qml")
        verify(component.status === Component.Ready, component.errorString())
        view = createTemporaryObject(component, testCase,
                                     { navigator: testNavigator, width: 390, height: 844 })
        verify(view !== null)
        view.forceActiveFocus()
        waitForRendering(view)
    }

    function currentList() {
        return view.stack.currentItem.list
    }

    function titleText() {
        return findChild(view, "titleLabel").text
    }

    function test_launchListShowsTheFourGroups() {
        const list = currentList()
        compare(list.count, 4)
        compare(titleText(), "Pyxon")
        compare(list.currentIndex, 0)
        verify(!findChild(view, "backButton").visible)
    }

    function test_keyboardFromLaunchListToCategoryAndBack() {
        keyClick(Qt.Key_Down)                     // "LTE"
        keyClick(Qt.Key_Return)
        compare(view.stack.depth, 2)
        compare(titleText(), "LTE")
        compare(currentList().count, 14)
        for (let i = 0; i < 7; ++i)
            keyClick(Qt.Key_Down)                 // "C-DRX"
        compare(currentList().currentIndex, 7)
        keyClick(Qt.Key_Enter)
        compare(view.stack.depth, 3)
        compare(titleText(), "C-DRX")
        compare(currentList().count, 1)
        verify(findChild(view, "backButton").visible)

        keyClick(Qt.Key_Escape)
        compare(view.stack.depth, 2)
        compare(titleText(), "LTE")
        compare(testNavigator.depth, 2)
        keyClick(Qt.Key_Escape)
        compare(view.stack.depth, 1)
        compare(titleText(), "Pyxon")
    }

    function test_arrowsStopAtTheEnds() {
        keyClick(Qt.Key_Up)
        compare(currentList().currentIndex, 0)
        for (let i = 0; i < 10; ++i)
            keyClick(Qt.Key_Down)
        compare(currentList().currentIndex, 3)
        keyClick(Qt.Key_Home)
        compare(currentList().currentIndex, 0)
        keyClick(Qt.Key_End)
        compare(currentList().currentIndex, 3)
    }

    function test_pointerTapOpensAndBackButtonReturns() {
        waitForItemPolished(currentList())
        const gsm = currentList().itemAtIndex(3)
        verify(gsm !== null)
        mouseClick(gsm)
        compare(view.stack.depth, 2)
        compare(titleText(), "GSM")
        mouseClick(findChild(view, "backButton"))
        compare(view.stack.depth, 1)
        compare(testNavigator.depth, 1)
    }

    function test_categoryScreenFollowsTheStoreAfterARefresh() {
        verify(testNavigator.open(["LTE", "C-DRX"]))
        compare(view.stack.depth, 3)
        const page = view.stack.currentItem
        compare(page.list.count, 1)

        verify(testStore.setDictionary("myLTECDRXConfigDict",
                                       ["timestamp", "2017-07-14 02:40:00 GMT",
                                        "on_duration_ms", 10, "long_drx_cycle_ms", 320]))
        compare(page.list.count, 1)               // nothing changes before the refresh

        const timer = findChild(page, "refreshTimer")
        verify(timer.running)
        compare(timer.interval, 5000)
        timer.triggered()
        tryCompare(page.list, "count", 3)
        waitForItemPolished(page.list)
        const first = page.list.itemAtIndex(0)
        compare(first.mainText, "timestamp")
        compare(first.detailText, "2017-07-14 02:40:00 GMT")
        compare(page.list.itemAtIndex(2).detailText, "320")
    }

    function test_refreshIntervalFollowsTheNavigator() {
        verify(testNavigator.open(["UMTS", "RRC State"]))
        const timer = findChild(view.stack.currentItem, "refreshTimer")
        testNavigator.refreshIntervalMs = 40
        compare(timer.interval, 40)
        testNavigator.refreshIntervalMs = 5000
        verify(testNavigator.open(["UMTS"]))
        verify(!findChild(view.stack.currentItem, "refreshTimer").running)
    }

    function test_categoryRowOpensTheThirdLevelPlaceholder() {
        verify(testStore.setDictionary("myLTECDRXConfigDict", ["on_duration_ms", 10]))
        verify(testNavigator.open(["LTE", "C-DRX"]))
        keyClick(Qt.Key_Return)
        compare(view.stack.depth, 4)
        compare(titleText(), "on_duration_ms")
        const list = currentList()
        compare(list.count, 1)
        waitForItemPolished(list)
        compare(list.itemAtIndex(0).mainText, "")
        keyClick(Qt.Key_Return)                   // the deepest screen opens nothing
        compare(view.stack.depth, 4)
        keyClick(Qt.Key_Escape)
        compare(titleText(), "C-DRX")
    }
}
