// bench/boost_json.h: Boost.JSON behind a wall. It comes from a later Boost than ours, and the two
// must not meet in one translation unit or in one list of symbols.

#ifndef TARN_BENCH_BOOST_JSON_H
#define TARN_BENCH_BOOST_JSON_H

#if defined(__GNUC__)
#define TARN_BENCH_VISIBLE __attribute__((visibility("default")))
#else
#define TARN_BENCH_VISIBLE
#endif

namespace bench {

/// The documents of documents.h as Boost.JSON holds them.
struct TARN_BENCH_VISIBLE BoostJson {
    /// A document, copied and compared by Boost.JSON, in the memory of one of its values.
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
