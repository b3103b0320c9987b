#pragma once

#include <tessella/font_base.h>

/// The table `fonts.xml`, which tells what device and what file serve a face. Rules rewrite a request first,
/// then the entry of the face that comes out of them is applied:
///
///     <fonts>
///         <substitute>
///             <font face="helvetica">
///                 <switch by="size">
///                     <case value="140"><font face="helvetica"/></case>
///                     <default><font face="scalable"/></default>
///                 </switch>
///             </font>
///         </substitute>
///         <font face="helvetica" type="cgf"/>
///         <font face="scalable" file="Nimbus_Sans.afm" type="ft"/>
///     </fonts>
///
/// A "font" sets what its attributes say, in the order of their names: "face", "file", "metrics", "size",
/// "weight" ("bold", or else regular) and "type" ("cgf" or "ft"). Then each "switch" in it chooses by the
/// "size" or "weight" ("bold" from 601 on, or "regular") of the request: the first child that is a "default",
/// or has what is looked for as its "value". The first "font" in there is applied, too. The application's
/// thread uses the table.

/// Reads the table of the language in force; a file in the working directory goes before those of the
/// archive. Damage is reported, and what comes before it taken.
void ReadFontTable();

/// False if no file was found, or there is nothing in it.
bool HasFontTable();

/// Applies to `resolved`, a copy of `request`, the first rule for the request's face or for all faces, and
/// then the entry of the face that this leaves. False, with a warning, if there is no such entry.
bool ResolveFace(GrFontDesc& resolved, GrFontDesc const& request);

/// Back to no table.
void ReleaseFontTable();
