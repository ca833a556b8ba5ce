// SPDX-License-Identifier: Apache-2.0
//
// Every colour and every size of the window, in one place. Nothing else in this room holds a literal colour.
// Each text colour keeps a contrast of at least 4.5 : 1 on every ground that it is drawn on (see textPairs).
pragma Singleton
import QtQuick

QtObject {
    id: theme

    // Set by the window: whether the system asks for a dark look, and how large it wants text (1 to 2).
    property bool dark: false
    property real textScale: 1
    // Families that the window found on this machine; empty means the toolkit's own choice.
    property string valueFamily: ""

    // Grounds.
    readonly property color ground: dark ? "#0d1114" : "#eef1f3"
    readonly property color bar: dark ? "#12181c" : "#f8fafb"
    readonly property color card: dark ? "#171e23" : "#ffffff"
    readonly property color cardHovered: dark ? "#1c252b" : "#f6f9fa"
    readonly property color cardPressed: dark ? "#22303a" : "#e3edf1"
    readonly property color cardSelected: dark ? "#16313b" : "#dceef3"

    // Lines.
    readonly property color edge: dark ? "#263139" : "#d6dde1"
    readonly property color divider: dark ? "#222c33" : "#e4e9ec"

    // Texts and marks.
    readonly property color text: dark ? "#e8eef1" : "#12191d"
    readonly property color label: dark ? "#a3b3bc" : "#4a5860"
    readonly property color value: dark ? "#e8eef1" : "#12191d"
    readonly property color missing: dark ? "#8b9ba4" : "#5a6870"
    readonly property color accent: dark ? "#63cfe3" : "#00627a"

    // What is amiss, in the line below the list. Each has a mark of its own, too.
    readonly property color stale: dark ? "#f0b44c" : "#855000"
    readonly property color ended: dark ? "#b9adf5" : "#5b4a9c"
    readonly property color failed: dark ? "#ff8f86" : "#b3261e"
    readonly property color away: dark ? "#f493c6" : "#9c2767"

    // The colour of each kind of status, by its name.
    readonly property var statusColors: ({
        live: label, waiting: label, unfillable: label, stale: stale, ended: ended, failed: failed, away: away
    })

    // Which colour stands on which ground; the contrast of each pair is tested in both looks.
    readonly property var textPairs: [
        [text, ground], [text, bar], [text, card], [text, cardHovered], [text, cardPressed], [text, cardSelected],
        [label, ground], [label, bar], [label, card], [label, cardHovered], [label, cardPressed], [label, cardSelected],
        [value, card], [value, cardHovered], [value, cardPressed], [value, cardSelected],
        [missing, card], [missing, cardHovered], [missing, cardPressed], [missing, cardSelected],
        [accent, ground], [accent, bar], [accent, card], [accent, cardHovered], [accent, cardPressed],
        [accent, cardSelected],
        [stale, bar], [ended, bar], [failed, bar], [away, bar]
    ]

    // Text sizes in pixels.
    readonly property int textSize: Math.round(15 * textScale)
    readonly property int labelSize: Math.round(14 * textScale)
    readonly property int titleSize: Math.round(18 * textScale)
    readonly property int headerSize: Math.round(13 * textScale)
    readonly property int statusSize: Math.round(12.5 * textScale)

    // Distances in pixels. A finger needs 48.
    readonly property int rowHeight: 48
    readonly property int barHeight: 56
    readonly property int columnWidth: Math.round(680 * Math.min(textScale, 1.5))
    readonly property int margin: 12
    readonly property int rowPadding: 16
    readonly property int rowBreath: 11
    readonly property int gap: 20
    readonly property int radius: 12
    readonly property int focusWidth: 2

    // How far the column of a page stands from both sides: on a desk it stays narrow, in the middle.
    function inset(width: real): real {
        return Math.max(margin, (width - columnWidth) / 2);
    }

    // Milliseconds that a page takes to slide in.
    property int slide: 160
}
