#include "index/TypeTables.h"

namespace norvex {
namespace {

constexpr ExtensionRow extensionRows[] = {
    {"ipa", "com.brixo.sonpix.ipa"},     {"m4p", "audio/mp4"},
    {"vmdk", "application/x-vmdk-disk"}, {"vdi", "application/x-vdi-disk"},
    {"vhd", "application/x-vhd-disk"},   {"vhdx", "application/x-vhdx-disk"},
    {"qcow", "application/x-qemu-disk"}, {"qcow2", "application/x-qemu-disk"},
    {"hdd", "application/x-hdd-disk"},   {"appimage", "application/vnd.appimage"},
    {"snap", "application/vnd.snap"},
};

constexpr PackageRow packageRows[] = {
    {".app", "public.application-bundle", "Application"},
    {".appdir", "public.application-bundle", "Application"},
    {".bundle", "public.bundle", "Bundle"},
    {".framework", "public.framework", "Framework"},
    {".plugin", "public.plugin", "Plug-in"},
    {".vmwarevm", "com.vmware.vm-package", "Virtual Machine"},
    {".pvm", "com.parallels.vm.vmpackage", "Virtual Machine"},
    {".rtfd", "public.rich-text-package", "Rich text document"},
    {".picaralibrary", "public.photo-library", "Photo Library"},
    {".lumvialibrary", "public.photo-library", "Photo Library"},
    {".sonpixlibrary", "public.media-library", "Media Library"},
};

constexpr WellKnownRow wellKnownRows[] = {
    {"com.brixo.sonpix.ipa", "", "Phone Application"},
    {"application/x-vmdk-disk", "", "Virtual Disk Image"},
    {"application/x-vdi-disk", "", "Virtual Disk Image"},
    {"application/x-vhd-disk", "", "Virtual Disk Image"},
    {"application/x-vhdx-disk", "", "Virtual Disk Image"},
    {"application/x-qemu-disk", "", "Virtual Disk Image"},
    {"application/x-hdd-disk", "", "Virtual Disk Image"},
    {"image/jpeg", "public.jpeg", ""},
    {"image/png", "public.png", ""},
    {"image/tiff", "public.tiff", ""},
    {"image/gif", "public.gif", ""},
    {"image/webp", "public.webp", ""},
    {"image/heic", "public.heic", ""},
    {"image/heif", "public.heif", ""},
    {"image/svg+xml", "public.svg-image", ""},
    {"audio/mpeg", "public.mp3", "MP3 audio"},
    {"audio/mp4", "public.mpeg-4-audio", "MPEG-4 audio"},
    {"audio/x-wav", "public.wav", ""},
    {"video/mp4", "public.mpeg-4", "MPEG-4 movie"},
    {"video/mpeg", "public.mpeg", ""},
    {"video/x-msvideo", "public.avi", "AVI movie"},
    {"text/plain", "public.plain-text", "Plain text"},
    {"text/html", "public.html", "Web page"},
    {"text/vcard", "public.vcard", "Contact"},
    {"text/calendar", "", "Calendar"},
    {"text/x-csrc", "public.c-source", "C source code"},
    {"text/x-python", "public.python-script", "Python script"},
    {"application/x-shellscript", "public.shell-script", "Shell script"},
    {"application/json", "public.json", ""},
    {"application/xml", "public.xml", ""},
    {"application/rtf", "public.rtf", "Rich text document"},
    {"application/pdf", "public.pdf", ""},
    {"application/zip", "public.zip-archive", "ZIP archive"},
    {"application/x-tar", "public.tar-archive", "TAR archive"},
    {"message/rfc822", "public.email-message", ""},
};

// Moving pictures whose formats have no place for sound come before all other video.
constexpr ConformanceRow conformanceRows[] = {
    {"image/*", "public.image"},     {"audio/*", "public.audio"},        {"video/x-flic", "public.video"},
    {"video/x-mng", "public.video"}, {"video/x-mjpeg", "public.video"},  {"video/mjpeg", "public.video"},
    {"video/raw", "public.video"},   {"video/h26[1-6]", "public.video"}, {"video/av1", "public.video"},
    {"video/*", "public.movie"},     {"text/*", "public.text"},
};

constexpr std::string_view applicationTypes[] = {
    "application/vnd.appimage",
    "application/vnd.snap",
    "com.brixo.sonpix.ipa",
};

constexpr std::string_view messageTypes[] = {
    "message/rfc822",
    "application/mbox",
};

constexpr std::string_view databaseTypes[] = {
    "application/vnd.sqlite3",
    "application/x-sqlite[23]",
    "application/vnd.ms-access",
    "application/x-dbf",
    "application/vnd.oasis.opendocument.database",
    "application/vnd.oasis.opendocument.base",
    "application/x-kexiproject-sqlite*",
};

constexpr std::string_view contactAndCalendarTypes[] = {
    "text/vcard",    "text/x-vcard",     "application/vcard+*",    "text/directory",
    "text/calendar", "text/x-vcalendar", "application/calendar+*",
};

constexpr std::string_view sourceCodeTypes[] = {
    // like C
    "text/x-csrc",
    "text/x-chdr",
    "text/x-c++src",
    "text/x-c++hdr",
    "text/x-objcsrc",
    "text/x-objc++src",
    "text/x-opencl-src",
    "text/x-csharp",
    "text/x-dsrc",
    "text/x-dart",
    "text/x-go",
    "text/x-vala",
    "text/rust",
    "text/x-rust",
    "text/x-swift",
    "text/x-zig",
    "text/x-java",
    "text/x-kotlin",
    "text/x-scala",
    "text/x-groovy",
    "text/x-gradle",
    // scripts
    "text/x-python*",
    "text/x-sagemath",
    "text/x-lua",
    "text/x-tcl",
    "text/tcl",
    "text/x-nim",
    "text/x-crystal",
    "text/vbscript",
    "text/x-dcl",
    "text/x-genie",
    "application/x-ruby",
    "application/x-perl",
    "application/x-php",
    "application/x-awk",
    "application/x-asp",
    "application/x-shellscript",
    "application/x-csh",
    "application/x-fishscript",
    "application/x-powershell",
    "application/x-gdscript",
    "application/x-godot-shader",
    "application/javascript",
    "text/javascript",
    "application/ecmascript",
    "application/vnd.coffeescript",
    "application/typescript",
    "text/x-typescript",
    "text/jscript",
    // other languages
    "text/x-haskell",
    "text/x-literate-haskell",
    "text/x-ocaml",
    "text/x-erlang",
    "text/x-elixir",
    "text/x-common-lisp",
    "text/x-emacs-lisp",
    "text/x-scheme",
    "text/x-clojure",
    "text/x-fortran",
    "text/x-pascal",
    "text/x-cobol",
    "text/x-adasrc",
    "text/ada",
    "text/x-basic",
    "text/x-eiffel",
    "text/x-ooc",
    "text/x-matlab",
    "text/x-modelica",
    "text/x-verilog",
    "text/x-vhdl",
    "text/x-svsrc",
    "text/x-svhdr",
    "text/x-idl",
    "text/x-mof",
    "text/x-moc",
    "text/x-uil",
    "text/x-qml",
    "text/x-kaitai-struct",
    "text/x-gherkin",
    "text/x-twig",
    "application/sql",
    "text/x-sql",
    // building
    "text/x-makefile",
    "text/x-cmake",
    "text/x-meson",
    "text/x-scons",
    "text/x-rpm-spec",
    "text/x-maven+xml",
    "application/x-m4",
    "text/x-patch",
    "text/x-reject",
    // data and style sheets
    "application/json",
    "application/*+json",
    "text/css",
    "text/x-sass",
    "text/x-scss",
    "text/x-less",
    "application/toml",
    "application/x-yaml",
    "application/yaml",
    "application/raml+yaml",
    "application/xml",
    "text/xml",
    "application/xml-dtd",
    "application/xml-external-parsed-entity",
    "application/xslt+xml",
    "application/rdf+xml",
    "application/owl+xml",
    "application/atom+xml",
    "application/rss+xml",
    "application/gml+xml",
    "application/mathml+xml",
    "application/xliff+xml",
    "application/sparql-*",
    "application/relax-ng-compact-syntax",
    "text/x-xmi",
    "application/x-gtk-builder",
    "application/x-glade",
    "application/x-designer",
};

constexpr std::string_view movieTypes[] = {"video/*"};
constexpr std::string_view musicTypes[] = {"audio/*"};
constexpr std::string_view imageTypes[] = {"image/*"};

constexpr std::string_view libraryTypes[] = {
    "application/x-sharedlib",
    "application/x-shared-library-la",
    "application/x-object",
    "application/x-archive",
    "application/x-java",
    "application/x-java-archive",
    "application/java-archive",
    "application/x-java-pack200",
    "application/x-python-bytecode",
    "application/wasm",
};

constexpr std::string_view archiveTypes[] = {
    "application/zip",
    "application/gzip",
    "application/zlib",
    "application/zstd",
    "application/x-tar",
    "application/x-ustar",
    "application/x-tarz",
    "application/x-tzo",
    "application/x-compressed-tar",
    "application/x-*-compressed-tar",
    "application/x-7z-compressed",
    "application/vnd.rar",
    "application/x-rar",
    "application/x-bzip",
    "application/x-bzip[23]",
    "application/x-xz",
    "application/x-lzma",
    "application/x-lz4",
    "application/x-lzip",
    "application/x-lzop",
    "application/x-lrzip",
    "application/x-rzip",
    "application/x-compress",
    "application/x-lha",
    "application/x-lhz",
    "application/x-ace",
    "application/x-alz",
    "application/x-arj",
    "application/x-zoo",
    "application/x-stuffit",
    "application/x-cpio",
    "application/x-cpio-compressed",
    "application/x-bcpio",
    "application/x-sv4c*",
    "application/x-xar",
    "application/x-dar",
    "application/x-shar",
    "application/x-qpress",
    "application/x-asar",
    "application/x-par2",
    "application/x-rpm",
    "application/x-source-rpm",
    "application/vnd.debian.binary-package",
    "application/vnd.flatpak",
    "application/vnd.*.package-archive",
    "application/vnd.ms-cab-compressed",
};

constexpr std::string_view diskImageTypes[] = {
    "application/x-cd-image",
    "application/vnd.efi.iso",
    "application/vnd.efi.img",
    "application/x-compressed-iso",
    "application/x-discjuggler-cd-image",
    "application/x-raw-disk-image",
    "application/x-raw-disk-image-*",
    "application/x-raw-floppy-disk-image",
    "application/x-hfe-floppy-image",
    "application/x-amiga-disk-format",
    "application/x-*-diskimage",
    "application/x-*-disk",
    "application/x-ms-wim",
    "application/vnd.squashfs",
};

constexpr std::string_view fontTypes[] = {
    "font/*",
    "application/x-font-*",
    "application/x-gz-font-*",
    "application/vnd.ms-opentype",
    "application/vnd.ms-fontobject",
};

constexpr std::string_view pdfTypes[] = {
    "application/pdf",     "application/x-gzpdf", "application/x-bzpdf",
    "application/x-xzpdf", "application/x-lzpdf",
};

constexpr std::string_view wordProcessingTypes[] = {
    "application/msword",
    "application/msword-template",
    "application/vnd.ms-word.*",
    "application/vnd.openxmlformats-officedocument.wordprocessingml.*",
    "application/vnd.oasis.opendocument.text",
    "application/vnd.oasis.opendocument.text-*",
    "application/vnd.sun.xml.writer",
    "application/vnd.sun.xml.writer.*",
    "application/vnd.stardivision.writer",
    "application/vnd.wordperfect",
    "application/vnd.lotus-wordpro",
    "application/vnd.ms-works",
    "application/vnd.*.pages",
    "application/x-abiword",
    "application/x-kword",
    "application/x-applix-word",
    "application/x-amipro",
    "application/x-hwp",
    "application/x-hwt",
    "application/x-mswrite",
    "application/x-t602",
    "application/x-docbook+xml",
    "application/rtf",
    "text/rtf",
    "text/richtext",
    "application/epub+zip",
    "application/x-fictionbook+xml",
    "application/x-zip-compressed-fb2",
    "application/x-mobipocket-ebook",
    "application/vnd.*-ebook",
    "application/postscript",
    "application/x-gzpostscript",
    "application/x-bzpostscript",
    "application/oxps",
    "application/vnd.ms-xpsdocument",
    "text/x-tex",
    "text/x-texinfo",
    "text/x-bibtex",
    "application/x-lyx",
    "application/x-dvi",
    "application/x-gzdvi",
    "application/x-bzdvi",
};

constexpr std::string_view spreadsheetTypes[] = {
    "application/vnd.ms-excel",
    "application/vnd.ms-excel.*",
    "application/vnd.openxmlformats-officedocument.spreadsheetml.*",
    "application/vnd.oasis.opendocument.spreadsheet",
    "application/vnd.oasis.opendocument.spreadsheet-*",
    "application/vnd.sun.xml.calc",
    "application/vnd.sun.xml.calc.*",
    "application/vnd.stardivision.calc",
    "application/vnd.lotus-1-2-3",
    "application/vnd.*.numbers",
    "application/x-gnumeric",
    "application/x-kspread",
    "application/x-applix-spreadsheet",
    "application/x-quattropro",
    "application/x-planperfect",
    "application/x-siag",
    "application/x-oleo",
    "application/x-pyspread-*",
    "text/spreadsheet",
};

constexpr std::string_view presentationTypes[] = {
    "application/vnd.ms-powerpoint",
    "application/vnd.ms-powerpoint.*",
    "application/vnd.openxmlformats-officedocument.presentationml.*",
    "application/vnd.oasis.opendocument.presentation",
    "application/vnd.oasis.opendocument.presentation-*",
    "application/vnd.sun.xml.impress",
    "application/vnd.sun.xml.impress.*",
    "application/vnd.stardivision.impress",
    "application/vnd.*.keynote",
    "application/x-kpresenter",
    "application/x-magicpoint",
};

constexpr std::string_view textTypes[] = {
    "text/*",
    "application/xhtml+xml",
};

// In the order in which they are asked. Text comes last among the documents: it is what no other row names.
constexpr PositionRow positions[] = {
    {StoragePosition::applications, "Application", applicationTypes},
    {StoragePosition::messages, "Mail", messageTypes},
    {StoragePosition::databases, "Database", databaseTypes},
    {StoragePosition::contactsAndCalendars, "Contacts or calendar", contactAndCalendarTypes},
    {StoragePosition::sourceCode, "Source code", sourceCodeTypes},
    {StoragePosition::movies, "Movie", movieTypes},
    {StoragePosition::music, "Audio", musicTypes},
    {StoragePosition::images, "Image", imageTypes},
    {StoragePosition::libraries, "Library", libraryTypes},
    {StoragePosition::archives, "Archive", archiveTypes},
    {StoragePosition::diskImages, "Disk Image", diskImageTypes},
    {StoragePosition::fonts, "Font", fontTypes},
    {StoragePosition::pdf, "PDF document", pdfTypes},
    {StoragePosition::wordProcessing, "Document", wordProcessingTypes},
    {StoragePosition::spreadsheets, "Spreadsheet", spreadsheetTypes},
    {StoragePosition::presentations, "Presentation", presentationTypes},
    {StoragePosition::text, "Text document", textTypes},
};

constexpr std::string_view globs =
    "0:text/plain:*.txt\n"
    "0:text/x-log:*.log\n"
    "0:text/x-readme:readme*\n"
    "0:text/markdown:*.md\n"
    "0:text/html:*.html\n"
    "0:text/html:*.htm\n"
    "0:application/xhtml+xml:*.xhtml\n"
    "0:text/csv:*.csv\n"
    "0:text/css:*.css\n"
    "0:text/x-csrc:*.c:cs\n"
    "0:text/x-c++src:*.C:cs\n"
    "0:text/x-c++src:*.cpp\n"
    "0:text/x-c++src:*.cc\n"
    "0:text/x-c++src:*.cxx\n"
    "0:text/x-chdr:*.h\n"
    "0:text/x-c++hdr:*.hpp\n"
    "0:text/x-c++hdr:*.hh\n"
    "0:text/x-csharp:*.cs\n"
    "0:text/x-java:*.java\n"
    "0:text/x-kotlin:*.kt\n"
    "0:text/x-go:*.go\n"
    "0:text/rust:*.rs\n"
    "0:text/x-python:*.py\n"
    "0:text/x-lua:*.lua\n"
    "0:text/x-patch:*.diff\n"
    "0:text/x-patch:*.patch\n"
    "0:text/x-makefile:makefile\n"
    "0:text/x-cmake:cmakelists.txt\n"
    "0:text/x-cmake:*.cmake\n"
    "0:application/x-ruby:*.rb\n"
    "0:application/x-perl:*.pl\n"
    "0:application/x-perl:*.pm\n"
    "0:application/x-php:*.php\n"
    "0:application/x-shellscript:*.sh\n"
    "0:application/javascript:*.js\n"
    "0:application/javascript:*.mjs\n"
    "0:application/json:*.json\n"
    "0:application/xml:*.xml\n"
    "0:application/sql:*.sql\n"
    "0:application/toml:*.toml\n"
    "0:application/x-yaml:*.yaml\n"
    "0:application/x-yaml:*.yml\n"
    "0:application/x-object:*.o\n"
    "0:application/x-archive:*.a\n"
    "0:application/x-sharedlib:*.so\n"
    "0:application/x-sharedlib:*.so.[0-9]*\n"
    "0:application/x-java:*.class\n"
    "0:application/x-java-archive:*.jar\n"
    "0:application/x-python-bytecode:*.pyc\n"
    "0:message/rfc822:*.eml\n"
    "0:application/mbox:*.mbox\n"
    "0:text/vcard:*.vcf\n"
    "0:text/calendar:*.ics\n"
    "0:application/vnd.sqlite3:*.sqlite3\n"
    "0:application/vnd.ms-access:*.mdb\n"
    "0:application/vnd.oasis.opendocument.database:*.odb\n"
    "0:image/jpeg:*.jpg\n"
    "0:image/jpeg:*.jpeg\n"
    "0:image/jpeg:*.jpe\n"
    "0:image/png:*.png\n"
    "0:image/gif:*.gif\n"
    "0:image/tiff:*.tif\n"
    "0:image/tiff:*.tiff\n"
    "0:image/bmp:*.bmp\n"
    "0:image/webp:*.webp\n"
    "0:image/avif:*.avif\n"
    "0:image/heif:*.heic\n"
    "0:image/heif:*.heif\n"
    "0:image/svg+xml:*.svg\n"
    "0:image/svg+xml-compressed:*.svgz\n"
    "0:image/vnd.microsoft.icon:*.ico\n"
    "0:image/vnd.adobe.photoshop:*.psd\n"
    "0:image/x-xcf:*.xcf\n"
    "0:image/x-canon-cr2:*.cr2\n"
    "0:image/x-nikon-nef:*.nef\n"
    "0:image/x-sony-arw:*.arw\n"
    "0:image/x-adobe-dng:*.dng\n"
    "0:audio/mpeg:*.mp3\n"
    "0:audio/mp4:*.m4a\n"
    "0:audio/x-m4b:*.m4b\n"
    "0:audio/aac:*.aac\n"
    "0:audio/flac:*.flac\n"
    "0:audio/ogg:*.ogg\n"
    "0:audio/ogg:*.oga\n"
    "0:audio/ogg:*.opus\n"
    "0:audio/x-wav:*.wav\n"
    "0:audio/x-aiff:*.aiff\n"
    "0:audio/x-aiff:*.aif\n"
    "0:audio/x-ms-wma:*.wma\n"
    "0:audio/midi:*.mid\n"
    "0:audio/midi:*.midi\n"
    "0:video/mp4:*.mp4\n"
    "0:video/mp4:*.m4v\n"
    "0:video/quicktime:*.mov\n"
    "0:video/mpeg:*.mpg\n"
    "0:video/mpeg:*.mpeg\n"
    "0:video/mp2t:*.m2ts\n"
    "0:video/mp2t:*.mts\n"
    "0:video/x-msvideo:*.avi\n"
    "0:video/x-matroska:*.mkv\n"
    "0:video/webm:*.webm\n"
    "0:video/ogg:*.ogv\n"
    "0:video/x-flv:*.flv\n"
    "0:video/x-ms-wmv:*.wmv\n"
    "0:video/3gpp:*.3gp\n"
    "0:video/x-mng:*.mng\n"
    "0:font/ttf:*.ttf\n"
    "0:font/otf:*.otf\n"
    "0:font/collection:*.ttc\n"
    "0:font/woff:*.woff\n"
    "0:font/woff2:*.woff2\n"
    "0:application/zip:*.zip\n"
    "0:application/gzip:*.gz\n"
    "0:application/x-tar:*.tar\n"
    "0:application/x-compressed-tar:*.tar.gz\n"
    "0:application/x-compressed-tar:*.tgz\n"
    "0:application/x-bzip-compressed-tar:*.tar.bz2\n"
    "0:application/x-xz-compressed-tar:*.tar.xz\n"
    "0:application/x-zstd-compressed-tar:*.tar.zst\n"
    "0:application/x-bzip:*.bz2\n"
    "0:application/x-xz:*.xz\n"
    "0:application/zstd:*.zst\n"
    "0:application/x-7z-compressed:*.7z\n"
    "0:application/vnd.rar:*.rar\n"
    "0:application/x-rpm:*.rpm\n"
    "0:application/vnd.debian.binary-package:*.deb\n"
    "0:application/x-cd-image:*.iso\n"
    "0:application/x-raw-disk-image:*.img\n"
    "0:application/vnd.squashfs:*.sqsh\n"
    "0:application/pdf:*.pdf\n"
    "0:application/postscript:*.ps\n"
    "0:application/epub+zip:*.epub\n"
    "0:application/rtf:*.rtf\n"
    "0:text/x-tex:*.tex\n"
    "0:application/msword:*.doc\n"
    "0:application/vnd.openxmlformats-officedocument.wordprocessingml.document:*.docx\n"
    "0:application/vnd.oasis.opendocument.text:*.odt\n"
    "0:application/vnd.ms-excel:*.xls\n"
    "0:application/vnd.openxmlformats-officedocument.spreadsheetml.sheet:*.xlsx\n"
    "0:application/vnd.oasis.opendocument.spreadsheet:*.ods\n"
    "0:application/vnd.ms-powerpoint:*.ppt\n"
    "0:application/vnd.openxmlformats-officedocument.presentationml.presentation:*.pptx\n"
    "0:application/vnd.oasis.opendocument.presentation:*.odp\n"
    "0:application/x-ms-dos-executable:*.exe\n"
    "0:application/x-trash:*~\n"
    "0:application/x-trash:*.bak\n";

}  // namespace

std::span<const ExtensionRow> ownExtensions() {
  return extensionRows;
}
std::span<const PackageRow> packageTypes() {
  return packageRows;
}
std::span<const WellKnownRow> wellKnownTypes() {
  return wellKnownRows;
}
std::span<const ConformanceRow> conformances() {
  return conformanceRows;
}
std::span<const PositionRow> positionRows() {
  return positions;
}
std::string_view builtInGlobs() {
  return globs;
}

}  // namespace norvex
