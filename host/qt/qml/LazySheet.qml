import QtQuick

// Makes a sheet when it is first to be shown: a window comes without any, and without reading what
// they are like.
Loader {
    id: lazy

    // The sheet's own file.
    required property string sheet
    property bool isShown: false

    // The sheet, which is there from now on.
    function make() {
        source = sheet;
        return item;
    }
    function takeFocus() {
        make().takeFocus();
    }

    anchors.fill: parent
    onIsShownChanged: {
        if (isShown)
            make();
    }
    Component.onCompleted: {
        if (isShown)
            make();
    }
    // It comes as every other time.
    onLoaded: item.isShown = Qt.binding(() => lazy.isShown)
}
