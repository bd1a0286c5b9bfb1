#ifndef NIB_TESTS_COST_ALLOCATION_COUNT_H
#define NIB_TESTS_COST_ALLOCATION_COUNT_H

/// How often the calling thread has called operator new, which this program replaces.
long AllocationsSoFar();

#endif
