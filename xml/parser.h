#pragma once

#include <xml/tag.h>

class i_file;

namespace xml_parser {

/// Makes a tree of an XML file: a text, or one of the binary forms, which its first bytes tell apart. The
/// caller owns it; a tree that `*root` had is deleted first. False if the file is damaged or fails: `*root`
/// has what was read up to there. It may be null, even from a good file, where that is a binary one with
/// nothing in it. `line` and `column`, counted from 1, get where reading ended, in binary files the start.
bool Parse(tag** root, i_file* file, unsigned& line, unsigned& column);

}
