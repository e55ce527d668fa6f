import QtQuick
import Nimbra.Window

// A row of a list in its group's card, or the heading of a group; with what stands under the group
// where it is the last one.
FocusScope {
    id: row

    required property int index
    required property string kind
    required property string label
    required property string title
    required property string distinction
    required property string value
    required property bool isOn
    required property bool isLocked
    required property string application
    required property url iconSource
    required property string footer
    required property bool hasStatus
    required property bool isFirst
    required property bool isLast

    readonly property bool isGroup: kind === "group"
    readonly property bool isSwitch: kind === "switch"
    readonly property bool isUsable: !isLocked
    // Where the row itself stands, between its heading and what is under it.
    readonly property real cardTop: card.y
    readonly property real cardBottom: card.y + card.height
    // Whether the user has been led here.
    property bool isLit: false
    property var list
    signal used

    readonly property real columnWidth: Math.min(width - 2 * Theme.gap, Theme.widestColumn)
    readonly property real margin: (width - columnWidth) / 2

    // What stands beside the title, from its leading edge: an icon; to its trailing edge: marks.
    readonly property real iconSpace: application !== "" ? icon.width + 12 : 0
    readonly property real lockSpace: isLocked ? 12 + 10 : 0
    readonly property real markSpace: (isSwitch ? 52 + 12 : (kind === "link" ? 8 * Theme.symbol + 12 : 0)) + lockSpace
    readonly property real room: columnWidth - 2 * Theme.gap - iconSpace - markSpace

    // The value, side by side with the title where there is room, else below it.
    readonly property real valueWidth: valueLoader.item ? valueLoader.item.implicitWidth : 0
    readonly property real valueHeight: valueLoader.item ? valueLoader.item.height : 0
    // The title is measured for a row without a value as well: asked for the first time when one has
    // come, the measure would change while what depends on it is being set.
    readonly property bool isStacked: titleLabel.implicitWidth + valueWidth + 12 > room && valueWidth > 0
    // The title with what tells it apart below it.
    readonly property real titleHeight: titleLabel.height + (distinctionLoader.active ? Math.ceil(distinctionLoader.implicitHeight) + 2 : 0)
    readonly property real labelsHeight: isStacked ? titleHeight + 4 + valueHeight : Math.max(titleHeight, valueHeight)

    function use() {
        if (!isUsable)
            return;
        if (isSwitch)
            list.set(index, !isOn);
        else
            list.tap(index);
        used();
    }

    width: ListView.view ? ListView.view.width : 320
    implicitHeight: below.y + below.height
    activeFocusOnTab: false
    // The list keeps what it does not need for other rows: nobody is told of that.
    ListView.onPooled: visible = false
    ListView.onReused: visible = true

    Accessible.role: isGroup ? Accessible.Heading : (isSwitch ? Accessible.CheckBox : (kind === "link" ? Accessible.Link : Accessible.Button))
    Accessible.name: title !== "" ? title : footer
    Accessible.description: {
        const told = [];
        if (distinction !== "")
            told.push(distinction);
        if (!isSwitch && value !== "")
            told.push(value);
        if (isLocked)
            told.push(texts.text("locked"));
        return told.join(", ");
    }
    Accessible.ignored: isGroup && title === ""
    Accessible.checkable: isSwitch
    Accessible.checked: isSwitch && isOn
    Accessible.focusable: !isGroup
    Accessible.focused: activeFocus
    Accessible.onPressAction: use()
    Accessible.onToggleAction: use()

    Keys.onPressed: event => {
        if (event.key === Qt.Key_Space || event.key === Qt.Key_Return || event.key === Qt.Key_Enter) {
            event.accepted = true;
            if (!event.isAutoRepeat)
                use();
        }
    }

    // Above a group's card.
    Loader {
        id: heading

        width: parent.width
        // Rows before the first heading have none.
        height: row.isGroup ? (row.title !== "" && status === Loader.Ready ? Math.ceil(implicitHeight) + 26 : 20) : (row.index === 0 ? 20 : 0)
        active: row.isGroup && row.title !== ""
        sourceComponent: Item {
            implicitHeight: headingLabel.implicitHeight

            Text {
                id: headingLabel

                anchors.bottom: parent.bottom
                anchors.bottomMargin: 6
                x: row.margin + Theme.gap
                width: row.columnWidth - 2 * Theme.gap
                text: row.title
                textFormat: Text.PlainText
                color: Theme.faint
                font.pixelSize: Theme.small
                wrapMode: Text.Wrap
                horizontalAlignment: Text.AlignLeft
                Accessible.ignored: true
            }
        }
    }

    MouseArea {
        id: card

        x: row.margin
        y: heading.height
        width: row.columnWidth
        height: row.isGroup ? 0 : Math.max(52, Math.ceil(row.labelsHeight) + 22)
        visible: !row.isGroup
        clip: true
        onClicked: {
            if (row.ListView.view)
                row.ListView.view.focusRow(row.index, Qt.MouseFocusReason);
            row.use();
        }

        // Rounded where the card begins and ends; what is beyond is cut.
        Rectangle {
            y: row.isFirst ? 0 : -Theme.radius
            width: parent.width
            height: parent.height + (row.isFirst ? 0 : Theme.radius) + (row.isLast ? 0 : Theme.radius)
            radius: Theme.radius
            color: card.pressed && row.isUsable ? Theme.pressed : (row.isLit ? Theme.lit : Theme.card)
            border.width: Theme.strong ? 1 : 0
            border.color: Theme.line
        }
        Rectangle {
            x: texts.rightToLeft ? 0 : parent.width - width
            y: parent.height - 1
            width: parent.width - Theme.gap - row.iconSpace
            height: 1
            color: Theme.line
            visible: !row.isLast
        }

        Image {
            id: icon

            anchors.left: parent.left
            anchors.leftMargin: Theme.gap
            anchors.verticalCenter: parent.verticalCenter
            width: 32
            height: 32
            visible: row.application !== ""
            asynchronous: false
            sourceSize: Qt.size(64, 64)
            source: row.iconSource
        }
        Text {
            id: titleLabel

            anchors.left: parent.left
            anchors.leftMargin: Theme.gap + row.iconSpace
            y: (parent.height - (row.isStacked ? row.labelsHeight : row.titleHeight)) / 2
            width: row.room - (row.isStacked || row.valueWidth === 0 ? 0 : row.valueWidth + 12)
            text: row.title
            textFormat: Text.PlainText
            color: row.isLocked ? Theme.faint : (row.kind === "button" ? Theme.accent : Theme.text)
            font.pixelSize: Theme.body
            wrapMode: Text.Wrap
            horizontalAlignment: Text.AlignLeft
            Accessible.ignored: true
        }
        Loader {
            id: distinctionLoader

            anchors.left: titleLabel.left
            anchors.top: titleLabel.bottom
            anchors.topMargin: 2
            width: titleLabel.width
            active: row.distinction !== ""
            sourceComponent: Text {
                text: row.distinction
                textFormat: Text.PlainText
                color: Theme.faint
                font.pixelSize: Theme.small
                wrapMode: Text.Wrap
                horizontalAlignment: Text.AlignLeft
                Accessible.ignored: true
            }
        }
        Loader {
            id: valueLoader

            anchors.right: parent.right
            anchors.rightMargin: Theme.gap + row.markSpace
            // By its middle: the card's height comes from this one's, and would set a place anew that
            // is just being set.
            anchors.verticalCenter: parent.verticalCenter
            anchors.verticalCenterOffset: row.isStacked ? (row.labelsHeight - row.valueHeight) / 2 : 0
            width: row.isStacked ? row.room : row.valueWidth
            active: row.value !== "" && !row.isSwitch
            sourceComponent: Text {
                text: row.value
                textFormat: Text.PlainText
                color: Theme.faint
                font.pixelSize: Theme.body
                wrapMode: Text.Wrap
                horizontalAlignment: Text.AlignLeft
                Accessible.ignored: true
            }
        }
        Loader {
            id: mark

            anchors.right: parent.right
            anchors.rightMargin: Theme.gap
            anchors.verticalCenter: parent.verticalCenter
            sourceComponent: row.isSwitch ? switchMark : (row.kind === "link" ? chevron : null)
        }
        Loader {
            anchors.right: mark.left
            anchors.rightMargin: 10
            anchors.verticalCenter: parent.verticalCenter
            active: row.isLocked
            sourceComponent: LockMark {}
        }
        Component {
            id: switchMark

            SwitchMark {
                isOn: row.isOn
                isLocked: row.isLocked
            }
        }
        Component {
            id: chevron

            Chevron {}
        }
    }

    // Under the card of a group.
    Loader {
        id: below

        x: row.margin + Theme.gap
        y: card.y + card.height
        width: row.columnWidth - 2 * Theme.gap
        height: item ? item.height : 0
        active: row.isLast && (row.footer !== "" || row.hasStatus)
        sourceComponent: Item {
            height: status.y + status.height

            Text {
                id: footer

                y: 8
                width: parent.width
                visible: row.footer !== ""
                text: row.footer
                textFormat: Text.PlainText
                color: Theme.faint
                font.pixelSize: Theme.small
                wrapMode: Text.Wrap
                horizontalAlignment: Text.AlignLeft
                Accessible.role: Accessible.StaticText
                Accessible.name: text
            }
            Loader {
                id: status

                y: row.footer !== "" ? Math.ceil(footer.implicitHeight) + 12 : 0
                width: parent.width
                height: active ? Math.ceil(Math.max(pane.statusHeight, item ? item.textBottom : 0)) : 0
                active: row.hasStatus
                sourceComponent: ViewTree {
                    views: pane.status
                    spokenText: pane.statusText
                }
            }
        }
    }
}
