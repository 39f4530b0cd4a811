// One item of a table screen: a section header, or a row with its main text on the left and
// its detail text on the right. Long texts wrap and the row grows to fit them.
import QtQuick

Rectangle {
    id: item

    property SystemPalette colors
    property bool chevron: false
    property bool current: false
    readonly property bool header: model.kind === "header"
    readonly property string mainText: model.text === undefined || model.text === null ? "" : model.text
    readonly property string detailText: model.detail === undefined || model.detail === null ? "" : model.detail

    signal tapped()

    implicitHeight: header ? headerLabel.implicitHeight + 26
                           : Math.max(48, Math.max(mainLabel.implicitHeight, detailLabel.implicitHeight) + 24)
    color: header ? colors.window
                  : (current || tap.pressed ? Qt.rgba(colors.highlight.r, colors.highlight.g, colors.highlight.b, 0.22)
                                            : colors.base)

    Text {
        id: headerLabel
        visible: item.header
        anchors { left: parent.left; right: parent.right; bottom: parent.bottom; leftMargin: 16; rightMargin: 16; bottomMargin: 6 }
        text: item.header ? item.mainText : ""
        wrapMode: Text.WrapAtWordBoundaryOrAnywhere
        font.pixelSize: 14
        font.weight: Font.DemiBold
        color: item.colors.windowText
        opacity: 0.65
    }

    Item {
        id: content
        visible: !item.header
        anchors { fill: parent; leftMargin: 16; rightMargin: item.chevron ? 30 : 16 }

        readonly property real spacing: 12
        // The main text takes what it needs when both fit on one line; otherwise it keeps at
        // least 45% of the width and both wrap.
        readonly property real keyWidth: item.detailText.length === 0
                                         ? width
                                         : Math.min(mainMetrics.advanceWidth + 1,
                                                    Math.max(width * 0.45,
                                                             width - detailMetrics.advanceWidth - 1 - spacing))

        TextMetrics {
            id: mainMetrics
            font: mainLabel.font
            text: item.mainText
        }
        TextMetrics {
            id: detailMetrics
            font: detailLabel.font
            text: item.detailText
        }

        Text {
            id: mainLabel
            anchors { left: parent.left; verticalCenter: parent.verticalCenter }
            width: content.keyWidth
            text: item.header ? "" : item.mainText
            wrapMode: Text.WrapAtWordBoundaryOrAnywhere
            font.pixelSize: 16
            color: item.colors.text
        }

        Text {
            id: detailLabel
            anchors { right: parent.right; verticalCenter: parent.verticalCenter }
            width: Math.max(0, content.width - content.keyWidth - content.spacing)
            text: item.header ? "" : item.detailText
            horizontalAlignment: Text.AlignRight
            wrapMode: Text.WrapAtWordBoundaryOrAnywhere
            font.pixelSize: 15
            color: item.colors.text
            opacity: 0.6
        }
    }

    Text {
        visible: item.chevron && !item.header
        anchors { right: parent.right; rightMargin: 14; verticalCenter: parent.verticalCenter }
        text: "\u203A"
        font.pixelSize: 22
        color: item.colors.text
        opacity: 0.35
    }

    Rectangle {
        visible: !item.header
        anchors { left: parent.left; right: parent.right; bottom: parent.bottom; leftMargin: 16 }
        height: 1
        color: item.colors.mid
        opacity: 0.35
    }

    TapHandler {
        id: tap
        enabled: !item.header
        onTapped: item.tapped()
    }
}
