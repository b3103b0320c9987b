#pragma once

#include <tessella/pixel/edge_walker.h>
#include <tessella/types.h>

#include <cstdint>

/// Follows two chains of a polygon's edges downward from its top vertex, A to lower indices, B to higher
/// ones, and gives what lies between them, a line in each row.
class GrPolygonWalker {
public:
    /// The polygon has at least one vertex; `xy` holds the x and the y of each, to be moved by the origin,
    /// and must outlive the walker.
    GrPolygonWalker(std::int16_t const xy[], unsigned count, int originX, int originY);

    /// Around all vertices, the largest coordinates excluded.
    GrRect const& Bounds() const { return bounds; }

    /// False if there are no more lines. A line may be empty or lie outside the bounds.
    bool NextLine(GrRect& line);

private:
    /// One of the two, with the vertex that its edge leads to.
    struct Chain {
        unsigned vertex;
        GrEdgeWalker edge;
    };

    int X(unsigned vertex) const;
    int Y(unsigned vertex) const;
    unsigned Lower(unsigned vertex) const { return vertex == 0 ? vertexCount - 1 : vertex - 1; }
    unsigned Higher(unsigned vertex) const { return vertex == vertexCount - 1 ? 0 : vertex + 1; }
    void Advance(Chain& chain, unsigned next) const;

    std::int16_t const* const vertices;
    unsigned const vertexCount;
    int const dx, dy;
    GrRect bounds;
    int y;
    Chain a, b;
};
