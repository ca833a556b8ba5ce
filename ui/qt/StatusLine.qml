// SPDX-License-Identifier: Apache-2.0
//
// The quiet line below the list, about the page above it: what fills it, how old its values are, and why no more come.
import QtQuick

Rectangle {
    id: line

    property string text
    // Which mark and which colour it wears.
    property string kind: "live"

    implicitHeight: caption.implicitHeight + 2 * 9
    color: Theme.bar

    Rectangle {
        width: parent.width
        height: 1
        color: Theme.edge
    }

    StatusMark {
        id: mark
        objectName: "statusMark"

        readonly property real gap: Math.round(6 * Theme.textScale)

        x: caption.x - width - gap
        y: caption.y + (caption.implicitHeight / caption.lineCount - height) / 2
        kind: line.kind
        color: caption.color
        ground: line.color
    }

    Text {
        id: caption
        objectName: "statusText"

        y: 9
        anchors.left: parent.left
        // The mark hangs beside the text, which stands under the titles where there is room for that.
        anchors.leftMargin: Math.max(Theme.inset(line.width) + Theme.rowPadding, 8 + mark.width + mark.gap)
        anchors.right: parent.right
        anchors.rightMargin: Theme.inset(line.width)
        text: line.text
        textFormat: Text.PlainText
        wrapMode: Text.Wrap
        color: Theme.statusColors[line.kind]
        font.pixelSize: Theme.statusSize

        Accessible.role: Accessible.StaticText
        Accessible.name: text
    }
}
