// SPDX-License-Identifier: Apache-2.0
//
// One list page. Rows come from the page's model, which changes by differences only, so that the list keeps its place.
import QtQuick
import QtQuick.Controls

FocusScope {
    id: view

    // The page's model, and whether the keyboard is what the user last used (then the current row wears a ring).
    required property var page
    property bool keyboardUsed: false
    readonly property alias list: list

    signal rowOpened(int row)
    signal keyPressed

    function select(row) {
        if (row < 0)
            return;
        list.currentIndex = row;
        list.positionViewAtIndex(row, ListView.Contain);
        // The header of the section stays on top of its rows: the row must not be behind it.
        const item = list.itemAtIndex(row);
        if (!item)
            return;
        topHeader.title = titleOf(item.ListView.section, view.page.titleRevision);
        list.contentY = Math.max(list.originY, Math.min(list.contentY, item.y - topHeader.height));
    }

    // Only measures.
    SectionHeader {
        id: topHeader
        visible: false
        width: list.width
        inset: list.inset
    }

    Rectangle {
        anchors.fill: parent
        color: Theme.ground
    }

    ListView {
        id: list
        objectName: "list"

        readonly property real inset: Theme.inset(width)

        anchors.fill: parent
        focus: true
        model: view.page
        currentIndex: -1
        // The list never scrolls of its own accord: a reload may move the selected row, the eye stays where it is.
        highlightFollowsCurrentItem: false
        keyNavigationEnabled: false
        boundsBehavior: Flickable.DragAndOvershootBounds
        clip: true

        Accessible.role: Accessible.List
        Accessible.name: view.page ? view.page.title : ""

        section.property: "section"
        section.labelPositioning: ViewSection.InlineLabels | ViewSection.CurrentLabelAtStart
        section.delegate: SectionHeader {
            required property string section

            width: list.width
            inset: list.inset
            title: view.titleOf(section, view.page ? view.page.titleRevision : 0)
        }

        delegate: PageRow {
            width: list.width
            inset: list.inset
            firstOfSection: ListView.previousSection !== ListView.section
            lastOfSection: ListView.nextSection !== ListView.section
            selected: ListView.isCurrentItem
            ringed: ListView.isCurrentItem && view.keyboardUsed && list.activeFocus

            onClicked: {
                list.currentIndex = index;
                view.rowOpened(index);
            }
        }

        footer: Item {
            height: 2 * Theme.margin
        }

        ScrollBar.vertical: ScrollBar {
            id: scrollBar

            policy: ScrollBar.AsNeeded
            focusPolicy: Qt.NoFocus
            contentItem: Rectangle {
                implicitWidth: 6
                implicitHeight: 40
                radius: 3
                color: Theme.missing
                opacity: scrollBar.pressed ? 1 : scrollBar.active ? 0.8 : 0.35
                visible: scrollBar.size < 1
            }
            background: null
        }

        // While the list moves, a reload would tug at it: the model waits and reloads once when the list rests.
        Binding {
            target: view.page
            property: "held"
            value: list.moving
        }

        Keys.onPressed: event => {
            if (event.modifiers & (Qt.AltModifier | Qt.ControlModifier | Qt.MetaModifier))
                return;
            switch (event.key) {
            case Qt.Key_Up:
                view.select(currentIndex < 0 ? view.page.rowBefore(count) : view.page.rowBefore(currentIndex));
                break;
            case Qt.Key_Down:
                view.select(view.page.rowAfter(currentIndex));
                break;
            case Qt.Key_Home:
                view.select(view.page.rowAfter(-1));
                break;
            case Qt.Key_End:
                view.select(view.page.rowBefore(count));
                break;
            case Qt.Key_PageDown:
                view.turn(height * 0.9);
                break;
            case Qt.Key_PageUp:
                view.turn(-height * 0.9);
                break;
            case Qt.Key_Return:
            case Qt.Key_Enter:
            case Qt.Key_Space:
            case Qt.Key_Select:
                if (!event.isAutoRepeat && currentIndex >= 0)
                    view.rowOpened(currentIndex);
                break;
            default:
                return;
            }
            view.keyPressed();
            event.accepted = true;
        }
    }

    // The revision only says when to ask again.
    function titleOf(section, revision) {
        return view.page ? view.page.sectionTitle(section) : "";
    }

    // Turns the page by the distance and takes the selection along.
    function turn(distance) {
        const first = list.originY - list.topMargin;
        const last = Math.max(first, first + list.contentHeight - list.height);
        list.contentY = Math.max(first, Math.min(last, list.contentY + distance));
        const reached = list.indexAt(list.width / 2, list.contentY + (distance > 0 ? list.height - Theme.rowHeight
                                                                                  : Theme.rowHeight));
        select(reached);
    }
}
