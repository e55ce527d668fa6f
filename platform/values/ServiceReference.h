#pragma once

namespace nimbra {

/// A reference that can be assigned: names a service that somebody else owns. Never null.
template <class Service>
class ServiceReference {
public:
    // NOLINTNEXTLINE(google-explicit-constructor): it is the service by another name
    ServiceReference(Service& service) : _service(&service) {}

    // NOLINTNEXTLINE(google-explicit-constructor)
    operator Service&() const { return *_service; }
    Service* operator->() const { return _service; }

private:
    Service* _service;
};

} // namespace nimbra
