#pragma once

namespace apps {

/// Has the process take memory from the system in large steps and for all threads from one place. A load makes hundreds
/// of thousands of records on a thread of its own, for which the system would otherwise be asked page by page. Called
/// before there is a second thread.
void takeMemoryInLargeSteps();

} // namespace apps
