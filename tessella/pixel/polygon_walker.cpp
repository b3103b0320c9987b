#include <tessella/pixel/polygon_walker.h>

#include <tessella/coordinates.h>

#include <algorithm>
#include <cstddef>

int GrPolygonWalker::X(unsigned vertex) const { return Moved(vertices[std::size_t{2} * vertex], dx); }

int GrPolygonWalker::Y(unsigned vertex) const { return Moved(vertices[std::size_t{2} * vertex + 1], dy); }

GrPolygonWalker::GrPolygonWalker(std::int16_t const xy[], unsigned count, int originX, int originY)
    : vertices(xy), vertexCount(count), dx(originX), dy(originY), bounds{X(0), Y(0), X(0), Y(0)}
{
    unsigned top = 0;
    for (unsigned i = 1; i < count; ++i) {
        if (Y(i) < bounds.y1) top = i;
        bounds = {std::min(bounds.x1, X(i)), std::min(bounds.y1, Y(i)), std::max(bounds.x2, X(i)),
            std::max(bounds.y2, Y(i))};
    }
    y = bounds.y1;
    a.vertex = b.vertex = top;
    Advance(a, Lower(top));
    Advance(b, Higher(top));
}

/// The new edge begins in the present row, also if the vertex behind it lies above.
void GrPolygonWalker::Advance(Chain& chain, unsigned next) const
{
    chain.edge.Init(X(chain.vertex), y, X(next), Y(next));
    chain.vertex = next;
}

bool GrPolygonWalker::NextLine(GrRect& line)
{
    while (y >= Y(a.vertex)) {
        if (a.vertex == b.vertex) return false;
        Advance(a, Lower(a.vertex));
    }
    while (y >= Y(b.vertex))
        Advance(b, Higher(b.vertex));
    line = {std::min(a.edge.x, b.edge.x), y, std::max(a.edge.x, b.edge.x), y + 1};
    ++y;
    a.edge.Step();
    b.edge.Step();
    return true;
}
