#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <string_view>

#include "cli/frame/used_files.h"

namespace pelorin::cli {

// Pages that are one file each: they hold their pictures and ask nothing of a network, which the page
// itself forbids them.

/// The page up to its heading, which is the title.
/// @param styles  CSS, after what all pages have.
std::string htmlHead(std::string_view title, std::string_view styles);

/// UTF-8 text for HTML, also within quotes.
std::string escapedHtml(std::string_view text);

/// A JPEG file as an address for `src`, which holds it.
std::string jpegAddress(std::span<const std::uint8_t> file);

/// Looks at where a page is to go, before any work.
/// @param option  that named it: "--html".
/// @param used    the files that it must not replace.
/// @throws UsageError for a name that is that of something else, for one of the files `used`, and for a
///         file that is there already, without `overwrite`.
void checkPage(const std::string& option, const std::string& page, bool overwrite, UsedFiles used);

/// Writes a page. @throws as `writeOutput`.
void writePage(const std::string& page, const std::string& html, bool overwrite);

}  // namespace pelorin::cli
