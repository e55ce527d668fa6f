import QtQuick
import Nimbra.Window

// The screen that the page has presented, in a sheet: a form on a wide window, all of a narrow one.
Sheet {
    id: sheet

    readonly property bool isForm: width >= 700

    title: presented.title
    sheetWidth: isForm ? 540 : width
    sheetHeight: isForm ? Math.min(620, height - 48) : height

    function takeFocus() {
        cancelButton.forceActiveFocus(Qt.OtherFocusReason);
    }
    function layOut() {
        if (isShown)
            presented.setSize(flick.width, flick.height);
    }

    onIsShownChanged: Qt.callLater(layOut)
    onEscaped: {
        if (presented.hasCancel)
            presented.cancel();
    }

    Item {
        id: bar

        // Where there is no room beside the way out, the title stands below it.
        readonly property bool isStacked: presented.hasCancel && titleMetrics.advanceWidth > width - 2 * cancelButton.width - 24

        TextMetrics {
            id: titleMetrics

            font: titleLabel.font
            text: presented.title
        }

        width: parent.width
        height: isStacked ? cancelButton.height + titleLabel.height + 20 : Math.max(56, titleLabel.height + 16)

        PushButton {
            id: cancelButton

            objectName: "screenCancel"
            anchors.left: parent.left
            anchors.leftMargin: 4
            y: bar.isStacked ? 4 : (bar.height - height) / 2
            visible: presented.hasCancel
            title: texts.text("cancel")
            ringInside: true
            onPressed: presented.cancel()
        }
        Text {
            id: titleLabel

            x: bar.isStacked ? Theme.gap : cancelButton.width + 12
            y: bar.isStacked ? cancelButton.height + 8 : (bar.height - height) / 2
            width: parent.width - 2 * x
            text: presented.title
            textFormat: Text.PlainText
            color: Theme.text
            font.pixelSize: Theme.body
            font.weight: Font.DemiBold
            wrapMode: Text.Wrap
            horizontalAlignment: Text.AlignHCenter
            Accessible.role: Accessible.Heading
            Accessible.name: text
        }
        Rectangle {
            anchors.bottom: parent.bottom
            width: parent.width
            height: 1
            color: Theme.line
        }
    }

    Flickable {
        id: flick

        anchors.top: bar.bottom
        anchors.bottom: parent.bottom
        width: parent.width
        contentHeight: presented.contentHeight
        boundsBehavior: Flickable.StopAtBounds
        clip: true
        onWidthChanged: Qt.callLater(sheet.layOut)
        onHeightChanged: Qt.callLater(sheet.layOut)

        ViewTree {
            width: flick.width
            height: presented.contentHeight
            views: presented.views
            onTouched: button => presented.touch(button)
            onFocusLost: sheet.takeFocus()
        }

        // The keyboard reaches what lies below.
        Keys.onDownPressed: contentY = Math.min(Math.max(0, contentHeight - height), contentY + 60)
        Keys.onUpPressed: contentY = Math.max(0, contentY - 60)
    }

    ScrollMark {
        view: flick
    }
}
