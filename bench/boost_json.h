// bench/boost_json.h: an opaque wrapper around Boost.JSON. It comes from a later Boost than ours,
// and the two must not meet in one translation unit or symbol table.

#ifndef TARN_BENCH_BOOST_JSON_H
#define TARN_BENCH_BOOST_JSON_H

#if defined(__GNUC__)
#define TARN_BENCH_VISIBLE __attribute__((visibility("default")))
#else
#define TARN_BENCH_VISIBLE
#endif

namespace bench {

/// The documents of documents.h in Boost.JSON.
struct TARN_BENCH_VISIBLE BoostJson {
    /// A document, copied and compared by Boost.JSON; storage for one of its values.
    class TARN_BENCH_VISIBLE Node {
    public:
        struct Content;

        explicit Node(Content&& content) noexcept;
        Node(Node const& other);
        Node(Node&& other) noexcept;
        Node& operator=(Node const&) = delete;
        Node& operator=(Node&&) = delete;
        ~Node();

        bool operator==(Node const& other) const;

    private:
        Content& content();
        Content const& content() const;

        alignas(8) unsigned char memory[24];
    };

    static Node objects();
    static Node numbers();
    static Node catalogue();
};

}  // namespace bench

#endif
