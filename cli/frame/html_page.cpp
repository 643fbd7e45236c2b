#include "cli/frame/html_page.h"

#include <fmt/format.h>

#include <filesystem>
#include <utility>

#include "cli/frame/base64.h"
#include "cli/frame/errors.h"
#include "cli/frame/file_bytes.h"

namespace fs = std::filesystem;

namespace pelorin::cli {
namespace {

constexpr std::string_view head = R"(<!DOCTYPE html>
<html lang="en">
<head>
<meta charset="utf-8">
<meta http-equiv="Content-Security-Policy"
 content="default-src 'none'; img-src data:; style-src 'unsafe-inline'; script-src 'unsafe-inline'">
<meta name="viewport" content="width=device-width, initial-scale=1">
<title>{0}</title>
<style>
:root {{ color-scheme: light dark; }}
body {{ font: 15px/1.45 system-ui, sans-serif; }}
body {{ margin: 2rem auto; max-width: 75rem; padding: 0 1rem; }}
section {{ border-top: 1px solid #8886; padding: 1rem 0; }}
:focus-visible {{ outline: 3px solid Highlight; outline-offset: 2px; }}
figure {{ margin: 0; }}
small {{ display: block; opacity: .75; }}
{1}</style>
</head>
<body>
<h1>{0}</h1>
)";

}  // namespace

std::string htmlHead(std::string_view title, std::string_view styles) {
  return fmt::format(head, title, styles);
}

std::string escapedHtml(std::string_view text) {
  std::string html;
  for (const char letter : text) {
    switch (letter) {
      case '&':
        html += "&amp;";
        break;
      case '<':
        html += "&lt;";
        break;
      case '>':
        html += "&gt;";
        break;
      case '"':
        html += "&quot;";
        break;
      default:
        html += letter;
    }
  }
  return html;
}

std::string jpegAddress(std::span<const std::uint8_t> file) {
  return "data:image/jpeg;base64," + base64(file);
}

void checkPage(const std::string& option, const std::string& page, bool overwrite, UsedFiles used) {
  const std::string extension = fs::path(page).extension().string();
  if (!extension.empty() && extension != ".html" && extension != ".htm") {
    throw UsageError(option + ": " + page + ": the page is no " + extension +
                     " file; name it .html");
  }
  if (page == "-") return;
  std::error_code ignored;
  if (page.ends_with('/') || fs::is_directory(page, ignored)) {
    throw UsageError(option + ": " + page + ": is a folder; name a file in it");
  }
  refuseSharedFiles({page}, std::move(used));
  if (!overwrite && fs::is_regular_file(page, ignored)) {
    throw UsageError(option + ": " + page + " exists; add --overwrite to replace it");
  }
}

void writePage(const std::string& page, const std::string& html, bool overwrite) {
  writeOutput(page, {reinterpret_cast<const std::uint8_t*>(html.data()), html.size()},
              {.mayReplace = overwrite});
}

}  // namespace pelorin::cli
