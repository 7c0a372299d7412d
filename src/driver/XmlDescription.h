// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstddef>

// The driver's description for the host's configuration tools: its
// parameters, memory types, tag address fields, model and capabilities as an
// XML document, carried zlib-compressed in one constant block:
//   "<<TAVU_XML_START>>Name=VELT?FullName=Velt Conduit?Version=112?Platform=QX42_LIN" NUL
//   "compressedXML=" decimal stream length NUL
//   the zlib stream (begins 78 9C)
//   "<<TAVU_XML_END>>" NUL
// The block is generated at build time from driver/VeltDescription.xml; the
// library never inflates it.

// The whole block: a plain constant array, so its bytes are fixed at load
// time and sit in read-only data, with nothing to construct or free.
// NOLINTNEXTLINE(cppcoreguidelines-avoid-c-arrays)
extern const unsigned char Xml_VELT[];
// The number of bytes in Xml_VELT.
extern const std::size_t XmlSize_VELT;

// The first byte after the header's zero byte, i.e. the length line; always
// the same pointer, and no allocation. Protocol_VELT::GetXml returns it.
const char* GetXml_VELT();
