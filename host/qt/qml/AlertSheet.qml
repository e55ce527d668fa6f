import QtQuick
import Nimbra.Window

// Tells or asks something.
Sheet {
    id: alert

    // With `title`, `message` and `actions`; kept while the alert goes.
    property var shown: ({
            "title": "",
            "message": "",
            "actions": []
        })

    readonly property bool isAside: shown.actions.length === 2 && width >= 300 && Theme.scale <= 1.3

    title: shown.title !== "" ? shown.title : shown.message
    sheetWidth: Math.min(parent.width - 48, 360 * Math.min(Theme.scale, 1.6))
    sheetHeight: words.height + answers.height

    function cancelIndex() {
        const actions = shown.actions;
        for (let index = 0; index < actions.length; ++index) {
            if (actions[index].isCancel)
                return index;
        }
        return actions.length === 1 ? 0 : -1;
    }
    function takeFocus() {
        const button = answerButtons.itemAt(Math.max(0, cancelIndex()));
        if (button)
            button.forceActiveFocus(Qt.OtherFocusReason);
    }

    onEscaped: {
        const cancel = cancelIndex();
        if (cancel >= 0)
            pane.answerAlert(cancel);
    }

    Flickable {
        id: words

        width: parent.width
        height: Math.min(column.implicitHeight + 44, alert.height - 32 - answers.height)
        contentHeight: column.implicitHeight + 44
        clip: true
        boundsBehavior: Flickable.StopAtBounds

        Column {
            id: column

            x: 24
            y: 24
            width: parent.width - 48
            spacing: 8

            Text {
                width: parent.width
                visible: text !== ""
                text: alert.shown.title
                textFormat: Text.PlainText
                color: Theme.text
                font.pixelSize: Theme.body
                font.weight: Font.DemiBold
                wrapMode: Text.Wrap
                horizontalAlignment: Text.AlignHCenter
                Accessible.role: Accessible.Heading
                Accessible.name: text
            }
            Text {
                width: parent.width
                visible: text !== ""
                text: alert.shown.message
                textFormat: Text.PlainText
                color: Theme.text
                font.pixelSize: Theme.small + 1
                lineHeight: 1.15
                wrapMode: Text.Wrap
                horizontalAlignment: Text.AlignHCenter
                Accessible.role: Accessible.StaticText
                Accessible.name: text
            }
        }
    }

    Flow {
        id: answers

        anchors.top: words.bottom
        width: parent.width
        padding: 8

        Repeater {
            id: answerButtons

            model: alert.shown.actions

            PushButton {
                required property int index
                required property var modelData

                objectName: "answer" + index
                width: alert.isAside ? (answers.width - 16) / 2 : answers.width - 16
                height: Math.max(48, implicitHeight)
                title: modelData.title
                isMain: !modelData.isCancel
                ringInside: true
                onPressed: pane.answerAlert(index)
            }
        }
    }
}
