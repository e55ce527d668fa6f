import QtQuick
import Nimbra.Window

// Narrows a list while one types.
FocusScope {
    id: field

    property string text: ""
    signal edited(string text)
    signal finished

    implicitHeight: Math.max(Theme.touch, input.implicitHeight + 16)

    // By way of the list, whose search the text is.
    function clear() {
        edited("");
    }

    Rectangle {
        anchors.fill: parent
        radius: Theme.radius
        color: Theme.card
        border.width: input.activeFocus ? (Theme.strong ? 4 : 3) : 1
        border.color: input.activeFocus ? Theme.accent : Theme.edge
    }

    // A looking glass.
    Item {
        id: glass

        anchors.left: parent.left
        anchors.leftMargin: 14
        anchors.verticalCenter: parent.verticalCenter
        width: 16 * Theme.symbol
        height: 16 * Theme.symbol

        Rectangle {
            width: 12 * Theme.symbol
            height: 12 * Theme.symbol
            radius: width / 2
            color: "transparent"
            border.width: 2 * Theme.symbol
            border.color: Theme.faint
        }
        Rectangle {
            x: 9 * Theme.symbol
            y: 11.5 * Theme.symbol
            width: 7 * Theme.symbol
            height: 2 * Theme.symbol
            radius: height / 2
            color: Theme.faint
            rotation: 45
            antialiasing: true
        }
    }

    TextInput {
        id: input

        objectName: "search"
        focus: true
        activeFocusOnTab: true
        anchors.left: glass.right
        anchors.leftMargin: 10
        anchors.right: clearButton.left
        anchors.verticalCenter: parent.verticalCenter
        height: Math.max(Theme.touch, implicitHeight)
        text: field.text
        color: Theme.text
        selectionColor: Theme.accent
        selectedTextColor: Theme.accentText
        font.pixelSize: Theme.body
        verticalAlignment: TextInput.AlignVCenter
        horizontalAlignment: TextInput.AlignLeft
        clip: true
        onTextChanged: field.edited(text)

        Accessible.role: Accessible.EditableText
        Accessible.name: texts.text("search")
        Accessible.searchEdit: true
        Accessible.focusable: true

        Keys.onEscapePressed: event => {
            if (text === "") {
                event.accepted = false;
                return;
            }
            field.clear();
        }
        Keys.onDownPressed: field.finished()
        Keys.onReturnPressed: field.finished()
    }
    Text {
        anchors.left: input.left
        anchors.right: parent.right
        anchors.rightMargin: 10
        // By the field's height: its own stays that of the large text where it is made smaller.
        anchors.top: parent.top
        anchors.bottom: parent.bottom
        verticalAlignment: Text.AlignVCenter
        horizontalAlignment: Text.AlignLeft
        visible: input.text === "" && input.preeditText === ""
        text: texts.text("search")
        color: Theme.faint
        font.pixelSize: Theme.body
        fontSizeMode: Text.HorizontalFit
        minimumPixelSize: Theme.small
        elide: Text.ElideRight
        Accessible.ignored: true
    }

    Pressable {
        id: clearButton

        objectName: "clear"
        anchors.right: parent.right
        anchors.verticalCenter: parent.verticalCenter
        visible: input.text !== ""
        title: texts.text("clear")
        ringInside: true
        onPressed: {
            field.clear();
            input.forceActiveFocus();
        }

        Repeater {
            model: 2

            Rectangle {
                required property int index

                anchors.centerIn: parent
                width: 14 * Theme.symbol
                height: 2 * Theme.symbol
                radius: height / 2
                color: Theme.faint
                rotation: index === 0 ? 45 : -45
                antialiasing: true
            }
        }
    }
}
