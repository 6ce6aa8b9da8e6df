// Engine/Document/document.h: graphs from JSON documents, and into them.
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

/// Why a document was not read or not written.
struct DocumentError {
    /// What is wrong, in one line without control characters.
    std::string message = {};
    /// Where: the JSON pointer (RFC 6901) of the value, or of what is around the place where the
    /// text is not JSON. Empty for the document as a whole.
    std::string pointer = {};
    /// Where that begins in the text, both from 1 on and columns in bytes; 0 where no text is to
    /// blame.
    std::size_t line = 0;
    std::size_t column = 0;
};

/// Writes "line 3, column 9: /root/id: the message", without what is missing; control characters of
/// the pointer as escapes.
TARN_DOCUMENT_API std::ostream& operator<<(std::ostream& stream, DocumentError const& error);

/// What a document has beside its graph, and what reading it changed.
struct DocumentInfo {
    /// The forms that are read.
    enum class Form : unsigned char {
        /// The one that `writeDocument` writes.
        Own = 0,
        /// An export of a browser-based node editor.
        NodeGraph = 1,
    };
    /// That of the document.
    Form form = Form::Own;
    /// Above 0.
    double framesPerSecond = 60.0;
    /// Of node graphs: nodes that got another identifier than the one given, links that were left
    /// out since they lead to or from nothing, and shared definitions that no node uses.
    std::size_t renumberedNodes = 0;
    std::size_t omittedLinks = 0;
    std::size_t unusedDefinitions = 0;
    /// The first hundred of those links, a line each: "/links/2: link 7 left out: there is no node
    /// 9".
    std::vector<std::string> notes = {};

    /// The counts in one line, "2 nodes renumbered, 1 link left out"; empty where all are 0.
    TARN_DOCUMENT_API std::string summary() const;
};

/// The graph of a document: of our own form, which docs/documents.md describes, or of a node graph
/// as browser-based node editors export it; which of them, the text shows. Empty for anything else:
/// then `*error`, where given, says why and where. `*info`, where given, is filled in otherwise.
///
/// A document of our own form is read exactly: what `writeDocument` wrote becomes an equal graph,
/// bit for bit, and anything unknown is refused. A node graph is read as far as it can be: nodes
/// get other identifiers where theirs are 0, negative, strings or repeated, and keep what was given
/// as the attribute "id"; what has no place in the records becomes attributes; each use of a
/// shared definition becomes a group with a copy of its inside.
///
/// Patches and model layers nest 10,000 levels at most, groups of a node graph 1,000, data as deep
/// as memory allows. Linear in a document of our own form, in a node graph and its copies of shared
/// definitions. Throws where memory fails, and nothing else.
TARN_DOCUMENT_API Optional<Patch>
readDocument(std::string_view text, DocumentError* error = nullptr, DocumentInfo* info = nullptr);

/// The document of our own form with this graph: UTF-8, the same bytes for graphs that are equal to
/// the last bit, a line for each record. Every graph of up to 10,000 levels can be written and read
/// back, whatever it holds; a frame rate that is not above 0 and
/// finite is left out. Linear; 8 MiB of stack are enough for 10,000 levels.
TARN_DOCUMENT_API std::string writeDocument(Patch const& root, double framesPerSecond = 60.0);

/// The same from a file.
TARN_DOCUMENT_API Optional<Patch> loadDocument(std::string const& fileName,
                                               DocumentError* error = nullptr,
                                               DocumentInfo* info = nullptr);

/// Writes the document into a file, as `replaceFile` does.
TARN_DOCUMENT_API bool saveDocument(std::string const& fileName, Patch const& root,
                                    double framesPerSecond = 60.0, DocumentError* error = nullptr);

/// Replaces the content of a file in one step, so that whoever reads it finds the old content or
/// the new one whole: it is written beside the file, flushed to the disk and renamed. The file
/// keeps its permissions, and where it is a symbolic link, that stays one. False where this fails,
/// for example on a full disk: then the file is as it was, and `*error`, where given, says why.
TARN_DOCUMENT_API bool replaceFile(std::string const& fileName, std::string_view content,
                                   DocumentError* error = nullptr);

/// The names that documents have for built-in kinds, "unknown" to "text". Empty for other numbers,
/// which documents write as such, and for other names.
TARN_DOCUMENT_API std::string kindToString(unsigned long long builtin);
TARN_DOCUMENT_API Optional<unsigned long long> stringToKind(std::string const& name);

}  // namespace tarn::engine

#endif
