// SPDX-License-Identifier: Apache-2.0
//
// The quiet line below the list: whether the service is there, what feeds it, how old the last record is.
import QtQuick

Rectangle {
    id: line

    property string text

    implicitHeight: caption.implicitHeight + 2 * 9
    color: Theme.bar

    Rectangle {
        width: parent.width
        height: 1
        color: Theme.edge
    }

    Text {
        id: caption
        objectName: "statusText"

        y: 9
        anchors.left: parent.left
        anchors.leftMargin: Theme.inset(line.width) + Theme.rowPadding
        anchors.right: parent.right
        anchors.rightMargin: Theme.inset(line.width)
        text: line.text
        textFormat: Text.PlainText
        wrapMode: Text.Wrap
        color: Theme.label
        font.pixelSize: Theme.statusSize

        Accessible.role: Accessible.StaticText
        Accessible.name: text
    }
}
