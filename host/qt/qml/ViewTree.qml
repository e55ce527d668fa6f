import QtQuick
import Nimbra.Window

// Views where their page has put them.
Item {
    id: tree

    property var views
    // What they say together, for those who cannot see them; empty where each speaks for itself.
    property string spokenText
    property color ground: Theme.page
    // How far down the lowest text comes that grows beyond its place.
    property real textBottom: 0
    // The button that had the focus when the views were drawn anew; empty for none.
    property string focusedButton
    signal touched(string button)
    // The button that had the focus has gone, and none is in its place.
    signal focusLost

    function buttons() {
        const found = [];
        for (let place = 0; place < drawn.count; ++place) {
            const item = drawn.itemAt(place);
            if (item && item.kind === "button" && item.control)
                found.push(item.control);
        }
        return found;
    }
    function restoreFocus() {
        const title = focusedButton;
        focusedButton = "";
        const now = Window.activeFocusItem;
        // Whoever has it by now keeps it.
        if (title === "" || !enabled || now && now.activeFocusOnTab)
            return;
        const usable = buttons().filter(button => button.enabled);
        const heir = usable.find(button => button.title === title) || usable[0];
        if (heir)
            heir.forceActiveFocus(Qt.OtherFocusReason);
        else
            focusLost();
    }

    Connections {
        target: tree.views
        function onModelAboutToBeReset() {
            const focused = tree.buttons().find(button => button.activeFocus);
            if (focused)
                tree.focusedButton = focused.title;
        }
        function onModelReset() {
            // The views of now come with it.
            Qt.callLater(tree.restoreFocus);
        }
    }

    Accessible.role: Accessible.StaticText
    Accessible.name: spokenText
    Accessible.ignored: spokenText === ""

    Repeater {
        id: drawn

        model: tree.views

        Item {
            id: view

            required property string kind
            required property rect frame
            required property string text
            required property string plainText
            required property var textFont
            required property real viewOpacity
            required property var isEnabled
            required property var progress
            required property var isProgressAnimated
            required property var isTurning
            required property var source

            readonly property Item control: loader.item
            readonly property bool isStatus: kind === "label" && tree.spokenText !== ""

            onYChanged: reach()
            onHeightChanged: reach()
            function reach() {
                if (isStatus)
                    tree.textBottom = y + height;
            }

            // Frames are as for a reader from left to right.
            x: texts.rightToLeft ? tree.width - frame.x - frame.width : frame.x
            y: frame.y
            width: frame.width
            // Pages count one line for what they say of themselves; here it may take more.
            height: isStatus ? Math.max(frame.height, loader.item ? loader.item.contentHeight : 0) : frame.height
            opacity: viewOpacity
            visible: opacity > 0

            Behavior on opacity {
                enabled: Theme.calm > 0
                NumberAnimation {
                    duration: Theme.calm
                }
            }

            Loader {
                id: loader

                anchors.fill: parent
                sourceComponent: view.kind === "label" ? label : (view.kind === "button" ? button : (view.kind === "bar" ? bar : (view.kind === "spinner" ? spinner : picture)))
            }

            Component {
                id: label

                Text {
                    text: view.text
                    textFormat: Text.RichText
                    font: view.textFont
                    color: tree.spokenText === "" ? Theme.text : Theme.faint
                    LayoutMirroring.enabled: false
                    // Of itself a rich text keeps standing in the width that it had at first.
                    onWidthChanged: forceLayout()
                    Accessible.role: Accessible.StaticText
                    Accessible.name: view.plainText
                    Accessible.ignored: tree.spokenText !== "" || view.plainText === ""
                }
            }
            Component {
                id: button

                PushButton {
                    objectName: "screenButton"
                    title: view.plainText
                    font: view.textFont
                    enabled: view.isEnabled === true
                    focus: true
                    onPressed: tree.touched(view.plainText)
                }
            }
            Component {
                id: bar

                Rectangle {
                    radius: height / 2
                    color: Theme.line

                    Accessible.role: Accessible.ProgressBar
                    Accessible.name: tree.spokenText

                    Rectangle {
                        x: texts.rightToLeft ? parent.width - width : 0
                        width: parent.width * (view.progress || 0)
                        height: parent.height
                        radius: height / 2
                        color: Theme.accent

                        Behavior on width {
                            enabled: Theme.calm > 0 && view.isProgressAnimated === true
                            NumberAnimation {
                                duration: Theme.calm
                            }
                        }
                    }
                }
            }
            Component {
                id: spinner

                Spinner {
                    running: view.isTurning === true
                }
            }
            Component {
                id: picture

                Image {
                    source: view.source || ""
                    fillMode: Image.PreserveAspectFit
                    smooth: true
                    mipmap: true
                    Accessible.ignored: true
                }
            }
        }
    }
}
