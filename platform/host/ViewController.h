#pragma once

#include "platform/PlatformServices.h"
#include "platform/host/Controller.h"
#include "platform/values/Text.h"
#include "platform/views/NavigationItem.h"

#include <memory>

namespace nimbra {

class AlertController;
class SetupController;
class ShareSheet;
class View;

/// What stands behind a view that fills the screen or a sheet. To be made as a shared object, over
/// services that outlive it. Main queue only, but for its release, which may happen on any queue.
class ViewController : public Controller, public std::enable_shared_from_this<ViewController> {
public:
    explicit ViewController(const PlatformServices& services);
    ~ViewController() override;

    /// Makes the view and tells the controller that it is there, where that has not been done: what
    /// the host does before it shows the view.
    void loadViewIfNeeded();
    /// The root of what is shown; null until it is loaded.
    [[nodiscard]] const std::shared_ptr<View>& view() const { return _view; }
    /// Runs a layout pass: where the view asks for a layout the controller goes first.
    void layoutViewIfNeeded();

    /// The view's life, in this order; the last two may alternate. An override calls its base's
    /// first, but for one of `loadView` that sets a view of its own.
    virtual void loadView();
    virtual void viewDidLoad();
    virtual void viewDidAppear(bool animated);
    virtual void viewDidDisappear(bool animated);
    /// The view is about to be laid out.
    virtual void viewWillLayoutSubviews();

    /// What the bar above the view says; absent for nothing.
    [[nodiscard]] const Text& title() const { return _title; }
    [[nodiscard]] NavigationItem& navigationItem() { return _navigationItem; }

    /// Whether it stands in a sheet over another page.
    [[nodiscard]] bool isPresentedAsModalSheet() const;

protected:
    [[nodiscard]] const PlatformServices& services() const { return _services; }

    /// Shows another view, which is not null.
    void setView(std::shared_ptr<View> view);
    void setTitle(Text title);

    /// Shows another controller over this one, asks the user something, or offers to share.
    void presentViewControllerAnimated(const std::shared_ptr<SetupController>& controller,
                                       bool animated) const;
    void presentViewControllerAnimated(const std::shared_ptr<AlertController>& alert,
                                       bool animated) const;
    void presentViewControllerAnimated(const std::shared_ptr<ShareSheet>& sheet,
                                       bool animated) const;
    /// Takes away what is presented over this page, or this page itself.
    void dismissViewControllerAnimated(bool animated) const;
    void dismissAnimated(bool animated) const;

private:
    PlatformServices _services;
    NavigationItem _navigationItem;
    Text _title;
    std::shared_ptr<View> _view;
};

} // namespace nimbra
