import QtQuick
import Nimbra.Window

// Says what the page is busy with; until then nothing of it can be used.
Sheet {
    id: cover

    // Kept while the cover goes.
    property string message

    title: message !== "" ? message : texts.text("working")
    sheetWidth: Math.min(parent.width - 64, Math.max(120, label.implicitWidth + 64))
    sheetHeight: column.implicitHeight + 48

    function takeFocus() {
        column.forceActiveFocus(Qt.OtherFocusReason);
    }

    Column {
        id: column

        x: 24
        y: 24
        width: parent.width - 48
        spacing: label.text === "" ? 0 : 14
        Accessible.role: Accessible.AlertMessage
        Accessible.name: cover.title

        Spinner {
            anchors.horizontalCenter: parent.horizontalCenter
            width: 36
            height: 36
            running: cover.isShown
        }
        Text {
            id: label

            width: parent.width
            visible: text !== ""
            text: cover.message
            textFormat: Text.PlainText
            color: Theme.text
            font.pixelSize: Theme.body
            wrapMode: Text.Wrap
            horizontalAlignment: Text.AlignHCenter
            Accessible.ignored: true
        }
    }
}
