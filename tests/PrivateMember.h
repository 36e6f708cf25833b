#ifndef WORDCATCHER_TESTS_PRIVATEMEMBER_H
#define WORDCATCHER_TESTS_PRIVATEMEMBER_H

namespace wordcatcher::testing {

/// Lets a test look at a private field: an explicit instantiation may name private members, and the
/// friend function that it injects hands the member pointer out. Use it as
///
///   struct Capacity { friend auto memberOf(Capacity); };
///   template struct PrivateMember<Capacity, &TinyCDB::blen>;  // in this namespace
///   ... table.*memberOf(Capacity()) ...
template <typename Tag, auto Member>
struct PrivateMember {
  friend auto memberOf(Tag /*tag*/) { return Member; }
};

}  // namespace wordcatcher::testing

#endif
