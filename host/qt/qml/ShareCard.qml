import QtQuick
import Nimbra.Window

// Offers ways to share a file.
Sheet {
    id: share

    readonly property bool isNarrow: width < 520

    title: texts.text("share")
    isAtBottom: isNarrow
    sheetWidth: isNarrow ? width : 440
    sheetHeight: Math.min(column.implicitHeight + 32, height - 24)

    function takeFocus() {
        closeButton.forceActiveFocus(Qt.OtherFocusReason);
    }

    onIsShownChanged: {
        if (isShown)
            place.text = sharing.usualFolder;
    }
    onEscaped: sharing.cancel()

    Flickable {
        anchors.fill: parent
        contentHeight: column.implicitHeight + 32
        boundsBehavior: Flickable.StopAtBounds
        clip: true

        Column {
            id: column

            x: Theme.gap
            y: Theme.gap
            width: parent.width - 2 * Theme.gap
            spacing: 12

            Item {
                id: head

                // Where there is no room beside the way out, the names stand below it.
                readonly property bool isStacked: heading.implicitWidth > width - closeButton.width - 8

                width: parent.width
                height: isStacked ? closeButton.height + names.implicitHeight : Math.max(closeButton.height, names.implicitHeight)

                Column {
                    id: names

                    anchors.left: parent.left
                    width: parent.width - (head.isStacked ? 0 : closeButton.width + 8)
                    y: head.isStacked ? closeButton.height : (head.height - height) / 2
                    spacing: 2

                    Text {
                        id: heading

                        width: parent.width
                        text: texts.text("share")
                        color: Theme.text
                        font.pixelSize: Theme.body
                        font.weight: Font.DemiBold
                        horizontalAlignment: Text.AlignLeft
                        Accessible.role: Accessible.Heading
                        Accessible.name: text
                    }
                    Text {
                        width: parent.width
                        text: sharing.fileName
                        textFormat: Text.PlainText
                        color: Theme.faint
                        font.pixelSize: Theme.small
                        wrapMode: Text.WrapAnywhere
                        horizontalAlignment: Text.AlignLeft
                        Accessible.role: Accessible.StaticText
                        Accessible.name: text
                    }
                }
                PushButton {
                    id: closeButton

                    objectName: "shareClose"
                    anchors.right: parent.right
                    title: texts.text("cancel")
                    onPressed: sharing.cancel()
                }
            }

            Card {
                width: parent.width

                Repeater {
                    model: sharing.ways

                    CardRow {
                        required property var modelData

                        objectName: "way" + modelData.way
                        title: modelData.title
                        detail: modelData.isAvailable ? "" : texts.text("notAvailable")
                        enabled: modelData.isAvailable
                        onPressed: sharing.share(modelData.way)
                    }
                }
                // Here and below: what sends the file nowhere, no page has to allow.
                CardRow {
                    objectName: "copyPath"
                    title: texts.text("copyPath")
                    onPressed: sharing.copyPath()
                }
            }

            Card {
                width: parent.width

                Item {
                    width: parent.width
                    height: placeLabel.implicitHeight + place.height + 28

                    Text {
                        id: placeLabel

                        x: Theme.gap
                        y: 10
                        width: parent.width - 2 * Theme.gap
                        text: texts.text("saveIn")
                        color: Theme.faint
                        font.pixelSize: Theme.small
                        horizontalAlignment: Text.AlignLeft
                        Accessible.ignored: true
                    }
                    Rectangle {
                        anchors.fill: place
                        anchors.leftMargin: -8
                        anchors.rightMargin: -8
                        radius: 8
                        color: "transparent"
                        border.width: place.activeFocus ? 3 : 1
                        border.color: place.activeFocus ? Theme.accent : Theme.edge
                    }
                    TextInput {
                        id: place

                        objectName: "place"
                        anchors.top: placeLabel.bottom
                        anchors.topMargin: 6
                        x: Theme.gap + 8
                        width: parent.width - 2 * Theme.gap - 16
                        height: Math.max(Theme.touch, implicitHeight)
                        verticalAlignment: TextInput.AlignVCenter
                        color: Theme.text
                        selectionColor: Theme.accent
                        selectedTextColor: Theme.accentText
                        font.pixelSize: Theme.body
                        clip: true
                        activeFocusOnTab: true
                        onAccepted: sharing.save(text)
                        Accessible.role: Accessible.EditableText
                        Accessible.name: texts.text("saveIn")
                        Accessible.focusable: true
                    }
                }
                CardRow {
                    objectName: "save"
                    title: texts.text("save")
                    enabled: place.text.trim() !== ""
                    onPressed: sharing.save(place.text)
                }
            }

            Text {
                width: parent.width
                visible: sharing.problem !== ""
                text: sharing.problem
                textFormat: Text.PlainText
                color: Theme.failure
                font.pixelSize: Theme.small
                wrapMode: Text.Wrap
                horizontalAlignment: Text.AlignLeft
                Accessible.role: Accessible.AlertMessage
                Accessible.name: text
            }
        }
    }
}
