// Time that only passes when the code under test sleeps.

#ifndef VORN_TESTS_TABLE_FAKE_TIME_H
#define VORN_TESTS_TABLE_FAKE_TIME_H

#include <functional>
#include <vector>

class FakeTime {
  public:
    // fnAtPause runs at each pause, with its number from 1.
    explicit FakeTime(std::function<void(int)> fnAtPause = [](int) {});
    ~FakeTime();
    FakeTime(const FakeTime&) = delete;
    FakeTime& operator=(const FakeTime&) = delete;

    // The pauses so far, in milliseconds.
    const std::vector<long>& Pauses() const { return m_vecPauses; }

    void Sleep(long long nNanoseconds);
    long long Passed() const { return m_nPassed; }  // nanoseconds

  private:
    std::function<void(int)> m_fnAtPause;
    std::vector<long> m_vecPauses;
    long long m_nPassed = 0;
};

#endif  // VORN_TESTS_TABLE_FAKE_TIME_H
