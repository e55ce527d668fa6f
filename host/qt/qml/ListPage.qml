import QtQuick
import Nimbra.Window

// A page: its bar, and its rows in cards.
FocusScope {
    id: page

    property alias title: bar.title
    property alias backTitle: bar.backTitle
    property alias hasBack: bar.hasBack
    property bool canRefresh: false
    property bool isRefreshing: false
    property var rows
    // What the row is called that the user was led to; empty for none.
    property string litLabel
    readonly property alias view: list
    signal back
    signal refresh

    readonly property real contentWidth: Math.min(width - 2 * Theme.gap, Theme.widestColumn) - 2 * Theme.gap

    function focusRow(row, reason) {
        list.focusRow(row, reason);
    }
    function focusFirst() {
        list.focusRow(list.nextRow(-1, 1), Qt.OtherFocusReason);
    }
    function showRow(label) {
        const row = rows.indexOf(label);
        if (row < 0)
            return false;
        litLabel = rows.labelOf(row);
        if (rows.isRow(row))
            list.focusRow(row, Qt.OtherFocusReason);
        list.bringTo(row, ListView.Center);
        return true;
    }
    // Whether a part of the row's card is in sight.
    function isRowShown(row) {
        // Rows that have come or gone just now have moved others.
        list.forceLayout();
        const item = list.itemAtIndex(row);
        return item !== null && item.y + item.cardBottom > list.contentY && item.y + item.cardTop < list.contentY + list.height;
    }
    function search() {
        if (searchBar.visible)
            searchField.forceActiveFocus(Qt.ShortcutFocusReason);
    }

    Rectangle {
        anchors.fill: parent
        color: Theme.page
    }

    TitleBar {
        id: bar

        width: parent.width
        hasRefresh: page.canRefresh
        isRefreshing: page.isRefreshing
        onBack: page.back()
        onRefresh: page.refresh()
    }

    Item {
        id: searchBar

        anchors.top: bar.bottom
        width: parent.width
        height: visible ? searchField.implicitHeight + 24 + (nothing.visible ? nothing.implicitHeight + 8 : 0) : 0
        visible: page.rows.isSearchable
        onVisibleChanged: {
            if (!visible && searchField.activeFocus)
                page.focusFirst();
        }

        SearchField {
            id: searchField

            anchors.horizontalCenter: parent.horizontalCenter
            y: 12
            width: Math.min(parent.width - 2 * Theme.gap, Theme.widestColumn)
            text: page.rows.search
            onEdited: text => page.rows.search = text
            onFinished: page.focusFirst()
        }
        Text {
            id: nothing

            anchors.top: searchField.bottom
            anchors.topMargin: 8
            x: searchField.x + Theme.gap
            width: searchField.width - 2 * Theme.gap
            visible: page.rows.isFruitless
            text: texts.text("noApplications", page.rows.search)
            textFormat: Text.PlainText
            color: Theme.faint
            font.pixelSize: Theme.small
            wrapMode: Text.Wrap
            horizontalAlignment: Text.AlignLeft
            Accessible.role: Accessible.StaticText
            Accessible.name: text
        }
    }

    // Whoever comes to the rows with Tab begins with the first, whoever comes back with the last.
    Item {
        activeFocusOnTab: !list.activeFocus && list.nextRow(-1, 1) >= 0
        onActiveFocusChanged: {
            if (activeFocus)
                list.focusRow(list.nextRow(-1, 1), Qt.TabFocusReason);
        }
    }

    ListView {
        id: list

        objectName: "rows"
        anchors.top: searchBar.bottom
        anchors.bottom: parent.bottom
        width: parent.width
        clip: true
        focus: true
        // Only to go on from its last row.
        activeFocusOnTab: activeFocus
        model: page.rows
        reuseItems: true
        cacheBuffer: 200
        currentIndex: -1
        highlightFollowsCurrentItem: false
        boundsBehavior: page.canRefresh ? Flickable.DragOverBounds : Flickable.StopAtBounds
        bottomMargin: 32
        Accessible.role: Accessible.List
        Accessible.name: page.title

        function nextRow(from, step) {
            let row = from + step;
            while (row >= 0 && row < count && !page.rows.isRow(row))
                row += step;
            return row >= 0 && row < count ? row : -1;
        }
        function bringTo(row, place) {
            // Where a row stands is a guess until those around it have been made.
            positionViewAtIndex(row, place);
            forceLayout();
            positionViewAtIndex(row, place);
            keepCardInSight(row);
        }
        // Moves no further than it must. What explains a row is a part of it and may be higher than
        // the list: what must be seen is the card, from its top on where it is higher as well.
        function keepCardInSight(row) {
            const item = itemAtIndex(row);
            if (item === null)
                return;
            const top = item.y + (item.isGroup ? 0 : item.cardTop);
            const bottom = item.y + (item.isGroup ? item.height : item.cardBottom);
            contentY = Math.min(top, Math.max(bottom - height, contentY));
        }
        function focusRow(row, reason) {
            if (row < 0)
                return false;
            currentIndex = row;
            bringTo(row, ListView.Contain);
            if (nextRow(row, -1) < 0) {
                positionViewAtBeginning();
                keepCardInSight(row);
            }
            if (currentItem)
                currentItem.forceActiveFocus(reason);
            return true;
        }
        // Whether the focus has gone to another row.
        function step(by, reason) {
            return focusRow(nextRow(currentIndex, by), reason);
        }

        onActiveFocusChanged: {
            if (activeFocus && (!currentItem || !currentItem.activeFocus))
                focusRow(page.rows.isRow(currentIndex) ? currentIndex : nextRow(-1, 1), Qt.TabFocusReason);
        }

        Keys.onPressed: event => {
            const page = Math.max(1, Math.floor(height / 60));
            switch (event.key) {
            case Qt.Key_Down:
                event.accepted = step(1, Qt.OtherFocusReason) || true;
                break;
            case Qt.Key_Up:
                event.accepted = step(-1, Qt.OtherFocusReason) || true;
                break;
            case Qt.Key_Tab:
                event.accepted = step(1, Qt.TabFocusReason);
                break;
            case Qt.Key_Backtab:
                event.accepted = step(-1, Qt.BacktabFocusReason);
                break;
            case Qt.Key_Home:
                event.accepted = focusRow(nextRow(-1, 1), Qt.OtherFocusReason) || true;
                break;
            case Qt.Key_End:
                event.accepted = focusRow(nextRow(count, -1), Qt.OtherFocusReason) || true;
                break;
            case Qt.Key_PageDown:
                event.accepted = focusRow(nextRow(Math.min(currentIndex + page, count) - 1, 1), Qt.OtherFocusReason) || focusRow(nextRow(count, -1), Qt.OtherFocusReason) || true;
                break;
            case Qt.Key_PageUp:
                event.accepted = focusRow(nextRow(Math.max(currentIndex - page, -1) + 1, -1), Qt.OtherFocusReason) || focusRow(nextRow(-1, 1), Qt.OtherFocusReason) || true;
                break;
            }
        }

        // Who looks at the beginning goes on to look at it when something comes before it.
        Connections {
            property bool wasAtBeginning: true

            target: page.rows
            function onRowsAboutToBeInserted() {
                wasAtBeginning = list.atYBeginning;
            }
            function onRowsInserted() {
                if (wasAtBeginning)
                    Qt.callLater(list.positionViewAtBeginning);
            }
        }

        onDragEnded: {
            if (page.canRefresh && contentY < originY - 64)
                page.refresh();
        }

        // Around the card of the row that has the focus.
        Rectangle {
            readonly property Item row: list.currentItem

            parent: list.contentItem
            visible: row !== null && row.activeFocus
            x: visible ? row.margin + 1 : 0
            y: visible ? row.y + row.cardTop + 1 : 0
            z: 2
            width: visible ? row.columnWidth - 2 : 0
            height: visible ? row.cardBottom - row.cardTop - 2 : 0
            radius: Theme.radius - 1
            color: "transparent"
            border.color: Theme.accent
            border.width: Theme.strong ? 4 : 3
        }

        delegate: RowItem {
            id: rowItem

            list: page.rows
            isLit: page.litLabel !== "" && rowItem.label === page.litLabel
            onUsed: page.litLabel = ""
        }

        add: Transition {
            enabled: Theme.calm > 0
            NumberAnimation {
                property: "opacity"
                from: 0
                to: 1
                duration: Theme.calm
            }
        }
        remove: Transition {
            enabled: Theme.calm > 0
            NumberAnimation {
                property: "opacity"
                to: 0
                duration: Theme.quick
            }
        }
        displaced: Transition {
            enabled: Theme.calm > 0
            NumberAnimation {
                property: "y"
                duration: Theme.calm
                easing.type: Easing.OutQuad
            }
            // Whoever was still coming is there.
            NumberAnimation {
                property: "opacity"
                to: 1
                duration: Theme.quick
            }
        }
    }

    Item {
        activeFocusOnTab: !list.activeFocus && list.nextRow(-1, 1) >= 0
        onActiveFocusChanged: {
            if (activeFocus)
                list.focusRow(list.nextRow(list.count, -1), Qt.BacktabFocusReason);
        }
    }

    ScrollMark {
        view: list
    }
}
