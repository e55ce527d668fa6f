import QtQuick
import Nimbra.Window

// The bar above a page: what it is called, where it came from, and what can be done with it.
Rectangle {
    id: bar

    property string title
    property string backTitle
    property bool hasBack: false
    property bool hasRefresh: false
    property bool isRefreshing: false
    signal back
    signal refresh

    implicitHeight: Math.max(56, titleLabel.implicitHeight + 16)
    color: Theme.page

    Pressable {
        id: backButton

        objectName: "back"
        anchors.left: parent.left
        anchors.leftMargin: 4
        anchors.verticalCenter: parent.verticalCenter
        width: Math.max(Theme.touch, backRow.implicitWidth + 20)
        height: Theme.touch
        visible: bar.hasBack
        title: bar.backTitle !== "" ? texts.text("back") + ", " + bar.backTitle : texts.text("back")
        ringInside: true
        onPressed: bar.back()

        Row {
            id: backRow

            anchors.centerIn: parent
            spacing: 8

            Chevron {
                anchors.verticalCenter: parent.verticalCenter
                back: true
                color: Theme.accent
            }
            Text {
                anchors.verticalCenter: parent.verticalCenter
                visible: bar.width > 480 * Theme.scale
                text: bar.backTitle
                textFormat: Text.PlainText
                color: Theme.accent
                font.pixelSize: Theme.body
                Accessible.ignored: true
            }
        }
    }

    Text {
        id: titleLabel

        readonly property real room: Math.max(backButton.visible ? backButton.width : 0, refreshButton.visible ? refreshButton.width : 0) + 12

        anchors.verticalCenter: parent.verticalCenter
        x: room
        width: parent.width - 2 * room
        text: bar.title
        textFormat: Text.PlainText
        color: Theme.text
        font.pixelSize: Theme.body
        font.weight: Font.DemiBold
        horizontalAlignment: Text.AlignHCenter
        wrapMode: Text.Wrap
        Accessible.role: Accessible.Heading
        Accessible.name: bar.title
    }

    Pressable {
        id: refreshButton

        objectName: "refresh"
        anchors.right: parent.right
        anchors.rightMargin: 4
        anchors.verticalCenter: parent.verticalCenter
        visible: bar.hasRefresh
        title: bar.isRefreshing ? texts.text("refreshing") : texts.text("refresh")
        ringInside: true
        onPressed: bar.refresh()

        Loader {
            anchors.centerIn: parent
            active: bar.isRefreshing
            sourceComponent: Spinner {
                color: Theme.accent
            }
        }
        RefreshMark {
            anchors.centerIn: parent
            visible: !bar.isRefreshing
        }
    }

    Rectangle {
        anchors.bottom: parent.bottom
        width: parent.width
        height: 1
        color: Theme.line
    }
}
