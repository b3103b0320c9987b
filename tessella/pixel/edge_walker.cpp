#include <tessella/pixel/edge_walker.h>

#include <cstdint>

void GrEdgeWalker::Init(int x1, int y1, int x2, int y2)
{
    std::int64_t const width = std::int64_t{x2} - x1;
    std::int64_t const rows = std::int64_t{y2} - y1;
    std::int64_t const wholeSteps = rows == 0 ? 0 : (width + (width >= 0 ? rows - 1 : 0)) / rows;
    x = x1;
    error = static_cast<int>(rows - 1);
    dy = static_cast<int>(rows);
    remainder = static_cast<int>(width - rows * wholeSteps);
    step = static_cast<int>(wholeSteps);
}
