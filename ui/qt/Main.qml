// SPDX-License-Identifier: Apache-2.0
//
// The window: title bar, the stack of pages, status line.
import QtQuick
import QtQuick.Controls

ApplicationWindow {
    id: window

    // What the window shows and asks; made in C++.
    required property var viewer
    readonly property QtObject theme: Theme

    width: 400
    height: 800
    minimumWidth: 240
    minimumHeight: 320
    // The first page bears the program's own name.
    title: stack.depth > 1 ? "probeview – " + stack.currentItem.page.title : "probeview"
    color: Theme.ground

    palette.window: Theme.ground
    palette.windowText: Theme.text
    palette.base: Theme.card
    palette.text: Theme.text
    palette.button: Theme.bar
    palette.buttonText: Theme.text
    palette.highlight: Theme.accent

    property bool keyboardUsed: false

    Binding {
        target: Theme
        property: "dark"
        value: window.viewer.dark
    }
    Binding {
        target: Theme
        property: "textScale"
        value: window.viewer.textScale
    }
    Binding {
        target: Theme
        property: "valueFamily"
        value: window.viewer.valueFamily
    }

    function open(row) {
        // A second tap while a page still slides in is not meant for the page beneath.
        if (stack.busy)
            return;
        const page = viewer.open(row);
        if (page)
            stack.push(pageView, { page: page });
    }

    function back() {
        if (stack.busy || stack.depth < 2)
            return;
        viewer.back();
        stack.pop();
    }

    header: TitleBar {
        context: stack.depth > 2 ? stack.get(stack.depth - 2).page.title : ""
        title: stack.currentItem ? stack.currentItem.page.title : ""
        canGoBack: stack.depth > 1
        onBackRequested: window.back()
    }

    footer: StatusLine {
        visible: text !== ""
        text: window.viewer.statusText
        kind: window.viewer.statusKind
    }

    Component {
        id: pageView

        PageView {
            keyboardUsed: window.keyboardUsed
            onRowOpened: row => window.open(row)
            onKeyPressed: window.keyboardUsed = true
            StackView.onActivated: {
                forceActiveFocus();
                if (window.keyboardUsed && list.currentIndex < 0)
                    select(page.rowAfter(-1));
            }
            // Until now the page was still on the screen, sliding out.
            StackView.onRemoved: window.viewer.release(page)
        }
    }

    StackView {
        id: stack
        objectName: "stack"

        anchors.fill: parent
        focus: true

        Component.onCompleted: {
            for (const page of window.viewer.firstPages)
                push(pageView, { page: page }, StackView.Immediate);
        }

        component Slide: NumberAnimation {
            property: "x"
            duration: Theme.slide
            easing.type: Easing.OutCubic
        }
        pushEnter: Transition { Slide { from: stack.width; to: 0 } }
        pushExit: Transition { Slide { from: 0; to: -stack.width / 4 } }
        popEnter: Transition { Slide { from: -stack.width / 4; to: 0 } }
        popExit: Transition { Slide { from: 0; to: stack.width } }
    }

    // Wherever the keyboard is, the list or the back button. There is nothing to type into, so plain keys may lead back.
    Shortcut {
        sequences: ["Esc", "Left", "Backspace", "Alt+Left", "Back"]
        autoRepeat: false
        onActivated: {
            window.keyboardUsed = true;
            window.back();
        }
    }

    // The program ends with its only window.
    Shortcut {
        sequences: ["Ctrl+Q", "Ctrl+W"]
        autoRepeat: false
        onActivated: window.close()
    }

    Item {
        anchors.fill: parent

        // Whoever touches the screen or the mouse needs no ring around the current row.
        PointHandler {
            acceptedButtons: Qt.AllButtons
            onActiveChanged: {
                if (active)
                    window.keyboardUsed = false;
            }
        }
    }

    // The mouse's own back button, wherever the pointer is.
    MouseArea {
        anchors.fill: parent
        acceptedButtons: Qt.BackButton
        onClicked: window.back()
    }
}
