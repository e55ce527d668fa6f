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
    // Whether the user has been led here.
    property bool isLit: false
    property var list
    signal used

    // Side by side where there is room, else the value below its title.
    readonly property real room: card.width - 2 * Theme.gap - icon.space - marks.space
    readonly property bool isStacked: valueLabel.text !== "" && titleLabel.implicitWidth + valueLabel.implicitWidth + 12 > room

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
    implicitHeight: heading.height + card.height + below.height
    activeFocusOnTab: false
    // The list keeps what it does not need for other rows: nobody is told of that.
    ListView.onPooled: visible = false
    ListView.onReused: visible = true

    Accessible.role: isGroup ? Accessible.Heading : (isSwitch ? Accessible.CheckBox : (kind === "link" ? Accessible.Link : Accessible.Button))
    Accessible.name: title !== "" ? title : footer
    Accessible.description: {
        const told = [];
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
                x: Theme.gap + column.margin
                width: column.width - 2 * Theme.gap
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

    QtObject {
        id: column

        readonly property real width: Math.min(row.width - 2 * Theme.gap, Theme.widestColumn)
        readonly property real margin: (row.width - width) / 2
    }

    Item {
        id: card

        anchors.top: heading.bottom
        x: column.margin
        width: column.width
        height: row.isGroup ? 0 : Math.max(52, Math.ceil(labels.implicitHeight) + 22)
        visible: !row.isGroup
        clip: true

        // Rounded where the card begins and ends; what is beyond is cut.
        Rectangle {
            id: face

            y: row.isFirst ? 0 : -Theme.radius
            width: parent.width
            height: parent.height + (row.isFirst ? 0 : Theme.radius) + (row.isLast ? 0 : Theme.radius)
            radius: Theme.radius
            color: area.pressed && row.isUsable ? Theme.pressed : (row.isLit ? Theme.lit : Theme.card)
            border.width: Theme.strong ? 1 : 0
            border.color: Theme.line

            Behavior on color {
                enabled: Theme.quick > 0 && !area.pressed
                ColorAnimation {
                    duration: Theme.quick
                }
            }
        }
        Rectangle {
            anchors.right: parent.right
            anchors.bottom: parent.bottom
            width: parent.width - Theme.gap - icon.space
            height: 1
            color: Theme.line
            visible: !row.isLast
        }

        MouseArea {
            id: area

            anchors.fill: parent
            onClicked: {
                if (row.ListView.view)
                    row.ListView.view.focusRow(row.index, Qt.MouseFocusReason);
                row.use();
            }
        }

        Image {
            id: icon

            readonly property real space: row.application !== "" ? width + 12 : 0

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

        Item {
            id: labels

            anchors.left: parent.left
            anchors.leftMargin: Theme.gap + icon.space
            anchors.right: parent.right
            anchors.rightMargin: Theme.gap + marks.space
            anchors.verticalCenter: parent.verticalCenter
            implicitHeight: row.isStacked ? titleLabel.height + 4 + valueLabel.height : Math.max(titleLabel.height, valueLabel.height)
            height: implicitHeight

            Text {
                id: titleLabel

                anchors.left: parent.left
                width: parent.width - (row.isStacked || valueLabel.text === "" ? 0 : valueLabel.width + 12)
                y: row.isStacked ? 0 : (parent.height - height) / 2
                text: row.title
                textFormat: Text.PlainText
                color: row.isLocked ? Theme.faint : (row.kind === "button" ? Theme.accent : Theme.text)
                font.pixelSize: Theme.body
                wrapMode: Text.Wrap
                horizontalAlignment: Text.AlignLeft
                Accessible.ignored: true
            }
            Text {
                id: valueLabel

                x: row.isStacked || texts.rightToLeft ? 0 : parent.width - width
                width: row.isStacked ? parent.width : implicitWidth
                y: row.isStacked ? titleLabel.height + 4 : (parent.height - height) / 2
                text: row.isSwitch ? "" : row.value
                textFormat: Text.PlainText
                color: Theme.faint
                font.pixelSize: Theme.body
                wrapMode: Text.Wrap
                horizontalAlignment: Text.AlignLeft
                Accessible.ignored: true
            }
        }

        Item {
            id: marks

            readonly property real lockSpace: row.isLocked ? 12 + 10 : 0
            readonly property real space: (row.isSwitch ? 52 + 12 : (row.kind === "link" ? 8 + 12 : 0)) + lockSpace

            anchors.right: parent.right
            anchors.rightMargin: Theme.gap
            anchors.verticalCenter: parent.verticalCenter
            width: row.isSwitch ? 52 : 8
            height: 32

            Loader {
                anchors.right: parent.left
                anchors.rightMargin: 10
                anchors.verticalCenter: parent.verticalCenter
                active: row.isLocked
                sourceComponent: LockMark {}
            }
            Loader {
                anchors.verticalCenter: parent.verticalCenter
                active: row.isSwitch
                sourceComponent: SwitchMark {
                    isOn: row.isOn
                    isLocked: row.isLocked
                }
            }
            Loader {
                anchors.verticalCenter: parent.verticalCenter
                active: row.kind === "link"
                sourceComponent: Chevron {}
            }
        }

        Loader {
            anchors.fill: parent
            anchors.margins: 1
            active: row.activeFocus
            sourceComponent: Rectangle {
                radius: Theme.radius - 1
                color: "transparent"
                border.color: Theme.accent
                border.width: Theme.strong ? 4 : 3
            }
        }
    }

    // Under the card of a group.
    Item {
        id: below

        readonly property bool isHere: row.isLast && (row.footer !== "" || row.hasStatus)

        anchors.top: card.bottom
        x: column.margin + Theme.gap
        width: column.width - 2 * Theme.gap
        height: isHere ? footer.space + status.height : 0
        visible: isHere

        Loader {
            id: footer

            readonly property real space: active ? Math.ceil(implicitHeight) + 12 : 0

            y: 8
            width: parent.width
            active: below.isHere && row.footer !== ""
            sourceComponent: Text {
                text: row.footer
                textFormat: Text.PlainText
                color: Theme.faint
                font.pixelSize: Theme.small
                wrapMode: Text.Wrap
                horizontalAlignment: Text.AlignLeft
                Accessible.role: Accessible.StaticText
                Accessible.name: text
            }
        }
        Loader {
            id: status

            y: footer.space
            width: parent.width
            height: active ? Math.ceil(Math.max(pane.statusHeight, status.item ? status.item.textBottom : 0)) : 0
            active: below.isHere && row.hasStatus
            sourceComponent: ViewTree {
                views: pane.status
                spokenText: pane.statusText
            }
        }
    }
}
