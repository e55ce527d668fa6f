import QtQuick
import Nimbra.Window

Window {
    id: window

    property string notice
    readonly property bool isCovered: pane.alert !== null && pane.alert !== undefined || isBusy || presented.isShown || sharing.isShown
    readonly property bool isBusy: pane.activity !== null && pane.activity !== undefined

    // The topmost page with rows.
    function topPage() {
        if (pane.isDetailOpen && detailLoader.item)
            return detailLoader.item;
        return pane.isOpen && paneLoader.item ? paneLoader.item : accountLoader.item;
    }
    // Opens nothing: whether the pane that is open has the row.
    function showRow(label) {
        return paneLoader.item !== null && paneLoader.item.showRow(label);
    }
    // Whether the row of the pane is on the screen, be it under what stands over the page.
    function isRowShown(row) {
        return paneLoader.item !== null && paneLoader.visible && paneLoader.item.isRowShown(row);
    }
    function takeFocus() {
        if (pane.alert)
            alertSheet.takeFocus();
        else if (isBusy)
            busyCover.takeFocus();
        else if (sharing.isShown)
            shareCard.takeFocus();
        else if (presented.isShown)
            screenSheet.takeFocus();
        else
            topPage().forceActiveFocus(Qt.OtherFocusReason);
    }

    title: pane.isOpen ? pane.title : texts.text("settings")
    color: Theme.page
    minimumWidth: 320
    minimumHeight: 320

    Connections {
        target: pane
        function onAlertChanged() {
            if (pane.alert)
                alertSheet.make().shown = pane.alert;
            Qt.callLater(window.takeFocus);
        }
        function onFailed(problem) {
            window.notice = problem;
        }
        function onPaneOpened() {
            Qt.callLater(window.takeFocus);
        }
        function onPaneClosed() {
            Qt.callLater(window.takeFocus);
        }
        function onChanged() {
            if (window.isBusy)
                busyCover.make().message = pane.activity;
        }
    }
    Connections {
        target: sharing
        function onShared(told) {
            window.notice = told;
        }
    }
    Binding {
        target: pane
        property: "keepsClosed"
        value: Theme.calm > 0
    }
    onIsCoveredChanged: Qt.callLater(takeFocus)

    Shortcut {
        sequences: ["F5", "Ctrl+R"]
        enabled: pane.isOpen && !window.isCovered
        onActivated: pane.refreshPane()
    }
    Shortcut {
        sequence: "Ctrl+F"
        enabled: !window.isCovered
        onActivated: window.topPage().search()
    }
    Shortcut {
        sequences: ["Alt+Left", "Back"]
        enabled: !window.isCovered
        onActivated: pane.goBack()
    }
    Shortcut {
        sequences: ["Ctrl+W", "Ctrl+Q"]
        onActivated: window.close()
    }

    Item {
        id: everything

        anchors.fill: parent
        LayoutMirroring.enabled: texts.rightToLeft
        LayoutMirroring.childrenInherit: true

        FocusScope {
            id: pages

            anchors.fill: parent
            enabled: !window.isCovered
            focus: true
            Accessible.ignored: true
            Keys.onEscapePressed: pane.goBack()

            NoticeLine {
                id: noticeLine

                width: parent.width
                text: window.notice
                z: 2
                onDismissed: {
                    window.notice = "";
                    window.takeFocus();
                }
            }

            Item {
                id: stack

                anchors.top: noticeLine.bottom
                anchors.bottom: parent.bottom
                width: parent.width
                clip: true

                // Whoever leaves first waits for the other one.
                function settle() {
                    if (!paneSlide.running && !detailSlide.running)
                        pane.forgetClosed();
                }

                Loader {
                    id: accountLoader

                    // The window may open with the pane; the page stays once one has seen it.
                    active: !paneLoader.covers || item !== null
                    width: parent.width
                    height: parent.height
                    visible: !paneLoader.covers
                    enabled: !pane.isOpen
                    focus: !pane.isOpen
                    sourceComponent: ListPage {
                        objectName: "accountPage"
                        focus: true
                        title: texts.text("account")
                        rows: pane.accountRows
                    }
                }

                Loader {
                    id: paneLoader

                    // Slides in over the page that it was opened from, and out again.
                    readonly property bool covers: pane.isOpen && x === 0
                    readonly property real aside: texts.rightToLeft ? -stack.width : stack.width

                    width: stack.width
                    height: stack.height
                    x: pane.isOpen ? 0 : aside
                    active: pane.isPaneShown
                    visible: !detailLoader.covers
                    focus: pane.isOpen && !pane.isDetailOpen
                    enabled: pane.isOpen && !pane.isDetailOpen

                    Behavior on x {
                        enabled: Theme.calm > 0 && pane.isPaneShown
                        NumberAnimation {
                            id: paneSlide

                            duration: Theme.calm
                            easing.type: Easing.OutCubic
                            onRunningChanged: Qt.callLater(stack.settle)
                        }
                    }

                    sourceComponent: ListPage {
                        objectName: "panePage"
                        title: pane.title
                        backTitle: texts.text("account")
                        hasBack: true
                        canRefresh: true
                        isRefreshing: pane.isRefreshing
                        rows: pane.rows
                        onBack: pane.goBack()
                        onRefresh: pane.refreshPane()
                        function tellWidth() {
                            // None yet while the page is being made.
                            if (contentWidth > 0)
                                pane.setListWidth(contentWidth);
                        }
                        onContentWidthChanged: Qt.callLater(tellWidth)
                    }
                }

                Loader {
                    id: detailLoader

                    readonly property bool covers: pane.isDetailOpen && x === 0
                    readonly property real aside: texts.rightToLeft ? -stack.width : stack.width

                    width: stack.width
                    height: stack.height
                    x: pane.isDetailOpen ? 0 : aside
                    active: pane.isDetailShown
                    enabled: pane.isDetailOpen
                    focus: pane.isDetailOpen

                    Behavior on x {
                        enabled: Theme.calm > 0 && pane.isDetailShown
                        NumberAnimation {
                            id: detailSlide

                            duration: Theme.calm
                            easing.type: Easing.OutCubic
                            onRunningChanged: Qt.callLater(stack.settle)
                        }
                    }

                    onLoaded: Qt.callLater(window.takeFocus)
                    sourceComponent: ListPage {
                        objectName: "detailPage"
                        title: pane.detailTitle
                        backTitle: pane.title
                        hasBack: true
                        rows: pane.detailRows
                        onBack: pane.goBack()
                    }
                }
            }
        }

        LazySheet {
            id: screenSheet

            isShown: presented.isShown
            enabled: !sharing.isShown && !window.isBusy && !pane.alert
            sheet: "ScreenSheet.qml"
        }
        LazySheet {
            id: shareCard

            isShown: sharing.isShown
            enabled: !window.isBusy && !pane.alert
            sheet: "ShareCard.qml"
        }
        LazySheet {
            id: busyCover

            isShown: window.isBusy
            enabled: !pane.alert
            sheet: "BusyCover.qml"
        }
        LazySheet {
            id: alertSheet

            isShown: pane.alert !== null && pane.alert !== undefined
            sheet: "AlertSheet.qml"
        }
    }
}
