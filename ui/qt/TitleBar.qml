// SPDX-License-Identifier: Apache-2.0
//
// The bar above the page: the way back and the page's title, which stands over its column where there is room.
import QtQuick
import QtQuick.Controls

Rectangle {
    id: bar

    property string title
    // Where the page belongs; empty at the top.
    property string context
    property bool canGoBack: false

    readonly property real inset: Theme.inset(width)

    signal backRequested

    implicitHeight: Math.max(Theme.barHeight, texts.implicitHeight + 2 * 8)
    color: Theme.bar

    AbstractButton {
        id: backButton
        objectName: "backButton"

        visible: bar.canGoBack
        x: texts.x - 4 - width
        anchors.verticalCenter: parent.verticalCenter
        width: Theme.rowHeight
        height: Theme.rowHeight
        // The list keeps the keyboard; Tab reaches the button all the same.
        focusPolicy: Qt.TabFocus

        Accessible.name: qsTr("Back")
        Accessible.role: Accessible.Button
        Accessible.onPressAction: clicked()

        onClicked: bar.backRequested()
        Keys.onReturnPressed: clicked()
        Keys.onEnterPressed: clicked()

        contentItem: Item {
            Chevron {
                anchors.centerIn: parent
                anchors.horizontalCenterOffset: -2
                width: 10
                height: 18
                thickness: 2.5
                pointsBack: true
            }
        }
        background: Rectangle {
            radius: width / 2
            color: backButton.down ? Theme.cardPressed : backButton.hovered ? Theme.cardHovered : "transparent"
            border.width: backButton.visualFocus ? Theme.focusWidth : 0
            border.color: Theme.accent
        }
    }

    Column {
        id: texts

        anchors.verticalCenter: parent.verticalCenter
        anchors.left: parent.left
        anchors.right: parent.right
        anchors.leftMargin: Math.max(bar.inset + Theme.rowPadding, bar.canGoBack ? Theme.rowHeight + 8 : 0)
        anchors.rightMargin: bar.inset

        Text {
            objectName: "context"

            visible: text !== ""
            width: parent.width
            text: bar.context
            textFormat: Text.PlainText
            wrapMode: Text.Wrap
            color: Theme.label
            font.pixelSize: Theme.statusSize

            Accessible.role: Accessible.StaticText
            Accessible.name: text
            Accessible.ignored: !visible
        }
        Text {
            objectName: "title"

            width: parent.width
            text: bar.title
            textFormat: Text.PlainText
            wrapMode: Text.Wrap
            color: Theme.text
            font.pixelSize: Theme.titleSize
            font.weight: Font.DemiBold

            Accessible.role: Accessible.Heading
            Accessible.name: text
        }
    }

    Rectangle {
        anchors.bottom: parent.bottom
        width: parent.width
        height: 1
        color: Theme.edge
    }
}
