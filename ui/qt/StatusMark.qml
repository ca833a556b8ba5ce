// SPDX-License-Identifier: Apache-2.0
//
// The mark of a kind of status, so that colour alone says nothing: drawn from rectangles, so that it needs neither a
// font nor an image. Each kind has a shape of its own.
import QtQuick

Item {
    id: mark

    property string kind
    property color color: Theme.label
    property color ground: Theme.bar
    readonly property real thickness: Math.max(1.5, width / 8)

    implicitWidth: Theme.statusSize
    implicitHeight: implicitWidth

    component Dot: Rectangle {
        anchors.verticalCenter: parent.verticalCenter
        height: width
        radius: width / 2
        color: mark.color
        antialiasing: true
    }
    component Stroke: Rectangle {
        anchors.centerIn: parent
        width: mark.width
        height: mark.thickness
        radius: height / 2
        color: mark.color
        antialiasing: true
    }

    // Live: a dot.
    Dot {
        visible: mark.kind === "live"
        anchors.horizontalCenter: parent.horizontalCenter
        width: mark.width / 2
    }

    // Waiting: three dots.
    Row {
        visible: mark.kind === "waiting"
        anchors.fill: parent
        spacing: mark.width / 8

        Repeater {
            model: 3
            Dot { width: mark.width / 4 }
        }
    }

    // Unfillable: a stroke, as where a value is missing.
    Stroke { visible: mark.kind === "unfillable" }

    // Stale: a clock.
    Rectangle {
        visible: mark.kind === "stale"
        anchors.fill: parent
        radius: width / 2
        color: "transparent"
        border.width: mark.thickness
        border.color: mark.color
        antialiasing: true

        Rectangle {
            x: (parent.width - width) / 2
            y: parent.height * 0.22
            width: mark.thickness
            height: parent.height * 0.34
            color: mark.color
        }
        Rectangle {
            x: (parent.width - mark.thickness) / 2
            y: parent.height * 0.56 - height
            width: parent.width * 0.3
            height: mark.thickness
            color: mark.color
        }
    }

    // Ended: a square, as on the key that stops a player.
    Rectangle {
        visible: mark.kind === "ended"
        anchors.centerIn: parent
        width: mark.width * 0.75
        height: width
        color: mark.color
    }

    // Failed: an exclamation mark on a disc.
    Rectangle {
        visible: mark.kind === "failed"
        anchors.fill: parent
        radius: width / 2
        color: mark.color
        antialiasing: true

        Rectangle {
            x: (parent.width - width) / 2
            y: parent.height * 0.2
            width: mark.thickness
            height: parent.height * 0.36
            color: mark.ground
        }
        Rectangle {
            x: (parent.width - width) / 2
            y: parent.height * 0.66
            width: mark.thickness
            height: width
            color: mark.ground
        }
    }

    // Away: a cross.
    Stroke {
        visible: mark.kind === "away"
        rotation: 45
    }
    Stroke {
        visible: mark.kind === "away"
        rotation: -45
    }
}
