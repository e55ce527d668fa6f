import QtQuick
import Nimbra.Window

// What can be pressed: with a finger, with the keyboard and by those who do not see it.
FocusScope {
    id: pressable

    property string title
    property string hint
    property bool ringInside: false
    readonly property bool isPressed: area.pressed
    signal pressed

    function press() {
        if (enabled)
            pressed();
    }

    implicitWidth: Theme.touch
    implicitHeight: Theme.touch
    activeFocusOnTab: enabled

    Accessible.role: Accessible.Button
    Accessible.name: title
    Accessible.description: hint
    Accessible.focusable: enabled
    Accessible.onPressAction: press()

    Keys.onPressed: event => {
        if (event.key === Qt.Key_Space || event.key === Qt.Key_Return || event.key === Qt.Key_Enter) {
            event.accepted = true;
            if (!event.isAutoRepeat)
                press();
        }
    }

    MouseArea {
        id: area

        anchors.fill: parent
        onClicked: {
            pressable.forceActiveFocus(Qt.MouseFocusReason);
            pressable.press();
        }
    }

    FocusRing {
        around: pressable
        inset: pressable.ringInside
    }
}
