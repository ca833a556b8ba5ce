// SPDX-License-Identifier: Apache-2.0
//
// The header of a section. A section without a title only takes the distance that keeps two groups apart.
import QtQuick

Rectangle {
    id: header

    property string title
    property real inset: Theme.margin

    height: title === "" ? Theme.margin : caption.implicitHeight + 2 * Theme.rowBreath
    color: Theme.ground

    Text {
        id: caption
        objectName: "sectionTitle"

        visible: header.title !== ""
        anchors.bottom: parent.bottom
        anchors.bottomMargin: Theme.rowBreath - 3
        x: header.inset + Theme.rowPadding
        width: parent.width - 2 * x
        text: header.title
        textFormat: Text.PlainText
        wrapMode: Text.Wrap
        color: Theme.accent
        font.pixelSize: Theme.headerSize
        font.weight: Font.DemiBold
        font.letterSpacing: 0.4

        Accessible.role: Accessible.Heading
        Accessible.name: text
        Accessible.ignored: !visible
    }
}
