// SPDX-License-Identifier: Apache-2.0
//
// One row: a label, and its value beside it or, where both together are too wide, below it.
import QtQuick
import QtQuick.Controls

ItemDelegate {
    id: row

    required property int index
    required property string label
    required property string value
    required property bool hasValue
    required property bool isShown
    required property bool disclosure
    required property string spoken

    property real inset: Theme.margin
    property bool firstOfSection: false
    property bool lastOfSection: false
    property bool selected: false
    property bool ringed: false


    visible: isShown
    height: isShown ? Math.max(Theme.rowHeight, content.implicitHeight + 2 * Theme.rowBreath) : 0
    padding: 0
    // The list moves the focus by itself; a click only selects.
    focusPolicy: Qt.NoFocus

    Accessible.role: Accessible.ListItem
    Accessible.name: spoken
    Accessible.ignored: !isShown
    Accessible.focusable: true
    Accessible.focused: selected && activeFocus
    Accessible.selected: selected
    Accessible.selectable: true
    Accessible.onPressAction: clicked()

    // Names of enumeration values have no blanks. They may break behind an underscore, and where that is not enough,
    // anywhere; they are never cut.
    function breakable(text: string): string {
        return text.replace(/_/g, "_\u200b");
    }

    contentItem: Item {
        id: content

        readonly property real room: row.width - 2 * (row.inset + Theme.rowPadding)
                                     - (row.disclosure ? chevron.width + Theme.gap : 0)
        // A row that leads to another list needs no value; in any other row one without a value misses it.
        readonly property bool isMissing: row.value === "" && !row.disclosure
        readonly property bool isLabelAlone: row.value === "" && row.disclosure
        readonly property real valueWidth: isMissing ? stroke.width : valueText.implicitWidth
        readonly property real valueHeight: isLabelAlone ? 0 : valueText.implicitHeight
        // Beside each other if that takes one line.
        readonly property bool beside: isLabelAlone || row.value.indexOf("\n") < 0
                                       && labelText.implicitWidth + Theme.gap + valueWidth <= room

        implicitHeight: beside ? Math.max(labelText.implicitHeight, valueHeight)
                               : labelText.implicitHeight + 3 + valueHeight

        Text {
            id: labelText
            objectName: "label"

            x: row.inset + Theme.rowPadding
            y: content.beside ? (content.height - height) / 2 : (content.height - content.implicitHeight) / 2
            width: content.room
            text: row.breakable(row.label)
            textFormat: Text.PlainText
            wrapMode: Text.Wrap
            color: row.disclosure ? Theme.text : Theme.label
            font.pixelSize: row.disclosure ? Theme.textSize : Theme.labelSize
        }

        Text {
            id: valueText
            objectName: "value"

            x: labelText.x
            y: content.beside ? (content.height - height) / 2 : labelText.y + labelText.height + 3
            width: content.room
            horizontalAlignment: content.beside ? Text.AlignRight : Text.AlignLeft
            text: row.breakable(row.value)
            textFormat: Text.PlainText
            wrapMode: Text.Wrap
            color: Theme.value
            font.family: Theme.valueFamily
            font.pixelSize: Theme.textSize
        }

        // A value that is not there is a short quiet stroke, not a text that somebody could take for one. It stands
        // where the value would: below a label that leaves no room beside it.
        Rectangle {
            id: stroke
            objectName: "missing"

            visible: content.isMissing
            x: labelText.x + (content.beside ? content.room - width : 0)
            y: valueText.y + (valueText.height - height) / 2
            width: Theme.textSize
            height: 2
            radius: 1
            color: Theme.missing
        }

        Chevron {
            id: chevron

            visible: row.disclosure
            anchors.verticalCenter: parent.verticalCenter
            x: parent.width - row.inset - Theme.rowPadding - width
            color: Theme.missing
        }
    }

    // A section is one card. Its first and last row carry the round corners: the rectangle reaches past the row there
    // where it must not be round, and is cut.
    background: Item {
        clip: true

        Rectangle {
            x: row.inset
            y: row.firstOfSection ? 0 : -Theme.radius
            width: parent.width - 2 * row.inset
            height: parent.height + (row.firstOfSection ? 0 : Theme.radius) + (row.lastOfSection ? 0 : Theme.radius)
            radius: Theme.radius
            color: row.down ? Theme.cardPressed
                            : row.selected ? Theme.cardSelected : row.hovered ? Theme.cardHovered : Theme.card
            border.width: 1
            border.color: Theme.edge
        }
        Rectangle {
            visible: !row.firstOfSection
            x: row.inset + Theme.rowPadding
            width: parent.width - 2 * x
            height: 1
            color: Theme.divider
        }
        Rectangle {
            objectName: "focusRing"

            visible: row.ringed
            x: row.inset + 2
            y: 2
            width: parent.width - 2 * x
            height: parent.height - 4
            radius: Theme.radius - 2
            color: "transparent"
            border.width: Theme.focusWidth
            border.color: Theme.accent
        }
    }
}
