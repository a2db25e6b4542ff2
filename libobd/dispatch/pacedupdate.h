#pragma once

#include <memory>

namespace obd {

class IObdProxy;
class IQuery;

// Runs a query, and after a success waits until 30 ms have passed since its start: some control modules and adapters
// misbehave under faster requests. After a failure it does not wait. True if the query succeeded.
bool pacedUpdate(IQuery& query, std::shared_ptr<IObdProxy> const& proxy);

} // namespace obd
