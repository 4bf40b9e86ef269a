#include "tool/StoragePage.h"

#include <algorithm>
#include <array>
#include <utility>

#include "tool/FigureText.h"
#include "tool/HtmlText.h"
#include "tool/PageStyle.h"

namespace norvex {
namespace {

// Forbids every load; the style stands in the page itself.
constexpr const char* kContentPolicy = "default-src 'none'; style-src 'unsafe-inline'";

// The same thing has the same colour in every chart. Among the kinds, and among the places, no two are alike.
constexpr std::array<std::pair<std::string_view, int>, 14> kSeries{{
    {"music", 1},
    {"movies", 2},
    {"images", 3},
    {"apps", 4},
    {"messages", 5},
    {"documents", 6},
    {"other", 7},
    {"photoLibraries", 3},
    {"applicationBundles", 4},
    {"mobileDocuments", 5},
    {"library", 6},
    {"home", 1},
    {"usersShared", 2},
    {"elsewhere", 7},
}};

std::string seriesOf(std::string_view key) {
  const auto found =
      std::find_if(kSeries.begin(), kSeries.end(), [&](const auto& series) { return series.first == key; });
  return "s" + std::to_string(found == kSeries.end() ? 1 : found->second);
}

class StoragePage {
 public:
  StoragePage(const StorageReport& report, const PageFacts& facts) : report_(report), facts_(facts) {}

  std::string text() {
    writeHead();
    page_ += "<body>\n<main>\n<h1>Where the space went</h1>\n<p class=\"quiet\">Measured " +
             htmlText(localTime(facts_.measured)) + "</p>\n<div class=\"cards\">\n";
    writeVolumes();
    writeGroup(report_.categories, "Kind", " wide");
    for (const SizeGroup& kind : report_.media) writeGroup(kind, "Place", "");
    writeGroup(report_.purchases, "Kind", "");
    writeGroup(report_.places, "What", " wide");
    page_ +=
        "</div>\n<footer class=\"quiet\"><p>Made on this machine by norvexctl. The page loads nothing and "
        "sends nothing.</p></footer>\n</main>\n</body>\n</html>\n";
    return std::move(page_);
  }

 private:
  // A figure and its unit stay on one line.
  static std::string unbroken(std::string_view text) {
    std::string html;
    for (const char character : htmlText(text))
      html += character == ' ' ? std::string("&nbsp;") : std::string(1, character);
    return html;
  }
  static std::string shareText(std::uint64_t part, std::uint64_t whole) {
    return unbroken(roundedPercentage(part, whole));
  }
  std::string sizeText(std::uint64_t bytes) const { return unbroken(facts_.byteCounts.string(bytes)); }

  void writeHead() {
    page_ += std::string(
                 "<!DOCTYPE html>\n<html lang=\"en\">\n<head>\n<meta charset=\"utf-8\">\n"
                 "<meta name=\"viewport\" content=\"width=device-width, initial-scale=1\">\n"
                 "<meta http-equiv=\"Content-Security-Policy\" content=\"") +
             kContentPolicy +
             "\">\n<meta name=\"referrer\" content=\"no-referrer\">\n<title>Where the space went</title>\n"
             "<style>" +
             kPageStyle + "</style>\n</head>\n";
  }

  void writeVolumes() {
    page_ += "<section class=\"card wide\" aria-labelledby=\"volumes\">\n<h2 id=\"volumes\">Volumes</h2>\n";
    for (const VolumeSpace& volume : report_.volumes) writeVolume(volume);
    if (report_.volumes.empty()) page_ += "<p>No volume is included.</p>\n";
    page_ += "</section>\n";
  }

  void writeVolume(const VolumeSpace& volume) {
    const std::string used = sizeText(volume.used), all = sizeText(volume.capacity);
    const std::string share = percentage(volume.used, volume.capacity);
    page_ += "<div class=\"volume\">\n<h3>" + htmlText(volume.root) + "</h3>\n";
    beginStrip(htmlText(volume.root) + ": " + shareText(volume.used, volume.capacity) + " in use",
               used + " of " + all + " are in use, " + sizeText(volume.free()) + " are free.");
    page_ += "<rect class=\"track\" width=\"100%\" height=\"100%\"/><rect class=\"s1\" width=\"" + share +
             "\" height=\"100%\"/></svg>\n";
    page_ += "<p>" + used + " of " + all + " in use (" + shareText(volume.used, volume.capacity) + "), " +
             sizeText(volume.free()) + " free</p>\n</div>\n";
  }

  void writeGroup(const SizeGroup& group, const char* heading, const char* width) {
    const std::string id(group.key);
    page_ += "<section class=\"card" + std::string(width) + "\" aria-labelledby=\"" + id + "\">\n<h2 id=\"" +
             id + "\">" + htmlText(group.title) + "</h2>\n";
    const std::vector<LabelledSize> sizes = group.largestFirst();
    if (sizes.empty()) {
      page_ += "<p class=\"quiet\">Nothing.</p>\n</section>\n";
      return;
    }
    // Places overlap: there is no whole that they are parts of.
    const bool hasWhole = &group != &report_.places;
    if (hasWhole) writeStrip(group, sizes);
    writeTable(group, sizes, heading, hasWhole);
    if (!group.note.empty()) page_ += "<p class=\"quiet\">" + htmlText(group.note) + "</p>\n";
    page_ += "</section>\n";
  }

  // Opens a picture with its words for those who do not see it. Both are HTML.
  void beginStrip(const std::string& title, const std::string& description) {
    const std::string number = std::to_string(++pictures_);
    page_ += "<svg class=\"strip\" role=\"img\" aria-labelledby=\"t" + number + " d" + number +
             "\"><title id=\"t" + number + "\">" + title + "</title><desc id=\"d" + number + "\">" +
             description + "</desc>";
  }

  void writeStrip(const SizeGroup& group, const std::vector<LabelledSize>& sizes) {
    const std::uint64_t total = group.total();
    std::string description;
    for (const LabelledSize& size : sizes) {
      description +=
          (description.empty() ? "" : ", ") + htmlText(size.label) + " " + shareText(size.bytes, total);
    }
    beginStrip(htmlText(group.title) + ": " + sizeText(total), description + ".");
    std::uint64_t before = 0;
    for (const LabelledSize& size : sizes) {
      page_ += "<rect class=\"" + seriesOf(size.key) + "\" x=\"" + percentage(before, total) + "\" width=\"" +
               percentage(size.bytes, total) + "\" height=\"100%\"/>";
      before += size.bytes;
    }
    page_ += "</svg>\n";
  }

  void writeTable(const SizeGroup& group, const std::vector<LabelledSize>& sizes, const char* heading,
                  bool hasWhole) {
    page_ += "<table>\n<thead><tr><th scope=\"col\">" + std::string(heading) +
             "</th><th scope=\"col\">Size</th>" + (hasWhole ? "<th scope=\"col\">Share</th>" : "") +
             "</tr></thead>\n<tbody>\n";
    for (const LabelledSize& size : sizes) {
      page_ += "<tr><th scope=\"row\">" + htmlText(size.label) + bar(size, sizes.front().bytes) +
               "</th><td>" + sizeText(size.bytes) + "</td>" +
               (hasWhole ? "<td>" + shareText(size.bytes, group.total()) + "</td>" : "") + "</tr>\n";
    }
    page_ += "</tbody>\n</table>\n";
  }

  // Says nothing that the row does not say in words.
  static std::string bar(const LabelledSize& size, std::uint64_t largest) {
    return "<svg class=\"bar\" aria-hidden=\"true\" focusable=\"false\"><rect class=\"track\" width=\"100%\" "
           "height=\"100%\" rx=\"3\"/><rect class=\"" +
           seriesOf(size.key) + "\" width=\"" + percentage(size.bytes, largest) +
           "\" height=\"100%\" rx=\"3\"/></svg>";
  }

  const StorageReport& report_;
  const PageFacts& facts_;
  std::string page_;
  int pictures_ = 0;
};

}  // namespace

std::string storagePage(const StorageReport& report, const PageFacts& facts) {
  return StoragePage(report, facts).text();
}

}  // namespace norvex
