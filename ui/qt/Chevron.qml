// SPDX-License-Identifier: Apache-2.0
//
// A small arrow head, drawn from two strokes so that it needs neither a font nor an image.
import QtQuick

Item {
    id: chevron

    property color color: Theme.accent
    property bool pointsBack: false
    property real thickness: 2

    implicitWidth: Math.round(4 + 4 * Theme.textScale)
    implicitHeight: Math.round(7 + 7 * Theme.textScale)
    scale: pointsBack ? -1 : 1

    component Stroke: Rectangle {
        width: chevron.height * 0.5 * Math.SQRT2 + chevron.thickness / 2
        height: chevron.thickness
        radius: chevron.thickness / 2
        color: chevron.color
        antialiasing: true
        x: chevron.width - width
        y: (chevron.height - height) / 2
        transformOrigin: Item.Right
    }

    Stroke { rotation: 45 }
    Stroke { rotation: -45 }
}
