#pragma once

namespace nimbra::bench {

class MeteredApplication;

/// Prints what very many rows of applications cost the window: to open them, to scroll through them
/// and to flip the switch over them. Throws `std::runtime_error` when that cannot be done.
void measureManyRows(MeteredApplication& application);

} // namespace nimbra::bench
