#pragma once

#include <tessella/region.h>

#include <string>
#include <vector>

/// The region operations written as plain steps: every range and every slot moved on its own, growth by 10
/// slots whenever it is due, a check in full at the end. Slow on purpose, sharing no code with the library
/// beyond the layout of a region, and kept as the judge of whatever is faster: bands, counts and capacities
/// must agree, those of spare slots included.
namespace judge {

void AddRange(GrRegion::Band& band, int a, int b);
void AddBand(GrRegion::Band& band, GrRegion::Band const& other);
void RemoveBand(GrRegion::Band& band, GrRegion::Band const& other);
void IntersectBand(GrRegion::Band& band, GrRegion::Band const& other);

void Assign(GrRegion& region, GrRegion const& other);
void Assign(GrRegion& region, GrRect const& rect);
void Add(GrRegion& region, GrRegion const& other);
void Add(GrRegion& region, GrRect const& rect);
void Subtract(GrRegion& region, GrRegion const& other);
void Subtract(GrRegion& region, GrRect const& rect);
void Intersect(GrRegion& region, GrRegion const& other);
void Intersect(GrRegion& region, GrRect const& rect);

/// The expression texts of the assertions that failed since the last call.
std::vector<std::string> TakeReports();

}
