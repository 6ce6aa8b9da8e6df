// Engine/Document/document.h: reads and writes graphs as JSON documents.
//
//     DocumentError error;
//     Optional<Patch> root = readDocument(text, &error);
//     if (!root) std::cerr << error << "\n";  // "line 3, column 9: /root/id: ..."

#ifndef TARN_ENGINE_DOCUMENT_DOCUMENT_H
#define TARN_ENGINE_DOCUMENT_DOCUMENT_H

#include <Engine/Base/optional.h>
#include <Engine/Base/patch.h>
#include <Engine/Document/export.h>

#include <cstddef>
#include <iosfwd>
#include <string>
#include <string_view>
#include <vector>

namespace tarn::engine {

/// Why a document could not be read or written.
struct DocumentError {
    /// What is wrong, in one line without control characters.
    std::string message = {};
    /// The JSON pointer (RFC 6901) of the value that is wrong; where the string is not JSON, of the
    /// value around that place. Empty for the document as a whole.
    std::string pointer = {};
    /// The position of that value in the string; where that is not JSON, of the first place that
    /// cannot be parsed. Both count from 1, columns in bytes. 0 where no place in a string is
    /// wrong.
    std::size_t line = 0;
    std::size_t column = 0;
};

/// Writes "line 3, column 9: /root/id: the message", without the parts that are missing. Control
/// characters of the pointer are escaped.
TARN_DOCUMENT_API std::ostream& operator<<(std::ostream& stream, DocumentError const& error);

/// What a document has in addition to its graph, and what reading it changed.
struct DocumentInfo {
    /// The supported formats.
    enum class Form : unsigned char {
        /// The format that `writeDocument` writes.
        Own = 0,
        /// An export of a browser-based node editor.
        NodeGraph = 1,
    };
    /// The format of the document.
    Form form = Form::Own;
    /// Greater than 0.
    double framesPerSecond = 60.0;
    /// For node graphs: nodes that got another identifier than the given one, links that were left
    /// out because an end does not exist, and shared definitions that no node uses.
    std::size_t renumberedNodes = 0;
    std::size_t omittedLinks = 0;
    std::size_t unusedDefinitions = 0;
    /// The first hundred of those links, one line each: "/links/2: link 7 left out: there is no
    /// node 9".
    std::vector<std::string> notes = {};

    /// The counts in one line, "2 nodes renumbered, 1 link left out"; empty where all are 0.
    TARN_DOCUMENT_API std::string summary() const;
};

/// Reads a document in our own format, which docs/documents.md describes, or a node graph as
/// browser-based node editors export it; the content shows which. Empty for anything else: then
/// `*error`, where given, says why and where. Otherwise `*info`, where given, is filled in.
///
/// Our own format is read exactly: what `writeDocument` wrote becomes an equal graph, bit for bit,
/// and anything unknown is an error. A node graph is read as far as possible. Nodes get other
/// identifiers where theirs are 0, negative, strings or repeated, and keep the given one as the
/// attribute "id". What does not fit into the records becomes attributes. Each use of a shared
/// definition becomes a group with a copy of its content.
///
/// Patches and model layers nest at most 10,000 levels, groups of a node graph at most 1,000, and
/// data as deep as memory allows. Linear in a document of our own format, and in a node graph plus
/// its copies of shared definitions. Throws only `std::bad_alloc`.
TARN_DOCUMENT_API Optional<Patch>
readDocument(std::string_view text, DocumentError* error = nullptr, DocumentInfo* info = nullptr);

/// Writes the graph in our own format: UTF-8, one line for each record, the same bytes for graphs
/// that are equal to the last bit. Every graph of up to 10,000 levels can be written and read back,
/// whatever it contains. A frame rate that is not above 0 and finite is left out. Linear.
/// Recursive: 8 MiB of stack are enough for 10,000 levels.
TARN_DOCUMENT_API std::string writeDocument(Patch const& root, double framesPerSecond = 60.0);

/// The same from a file.
TARN_DOCUMENT_API Optional<Patch> loadDocument(std::string const& fileName,
                                               DocumentError* error = nullptr,
                                               DocumentInfo* info = nullptr);

/// Writes the document to a file, as `replaceFile` does.
TARN_DOCUMENT_API bool saveDocument(std::string const& fileName, Patch const& root,
                                    double framesPerSecond = 60.0, DocumentError* error = nullptr);

/// Replaces the content of a file atomically: readers see either the old or the new content,
/// complete. It is written next to the file, flushed to the disk and renamed. The file keeps its
/// permissions, and a symbolic link stays a link. False on failure, for example on a full disk:
/// then the file is unchanged, and `*error`, where given, says why.
TARN_DOCUMENT_API bool replaceFile(std::string const& fileName, std::string_view content,
                                   DocumentError* error = nullptr);

/// The names of built-in kinds in documents, "unknown" to "text". Empty for other numbers, which
/// documents store as numbers, and for other names.
TARN_DOCUMENT_API std::string kindToString(unsigned long long builtin);
TARN_DOCUMENT_API Optional<unsigned long long> stringToKind(std::string const& name);

}  // namespace tarn::engine

#endif
