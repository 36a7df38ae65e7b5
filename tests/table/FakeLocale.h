// A decimal comma, as a locale that may not be installed has it.

#ifndef VORN_TESTS_TABLE_FAKE_LOCALE_H
#define VORN_TESTS_TABLE_FAKE_LOCALE_H

class FakeLocale {
  public:
    // blMisread: connections that are opened now read fractions inside of JSON as those versions of
    // SQLite do that take the C library's word for them.
    explicit FakeLocale(bool blMisread = true);
    ~FakeLocale();
    FakeLocale(const FakeLocale&) = delete;
    FakeLocale& operator=(const FakeLocale&) = delete;
};

#endif  // VORN_TESTS_TABLE_FAKE_LOCALE_H
