// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_WIRELESS_SYSTEM_QUEUE_H
#define TAVIWIRELESS_WIRELESS_SYSTEM_QUEUE_H

#include <taviwireless/wireless.h>

// Circular queues of links; an empty one is a head that leads to itself.
namespace taviwireless::wireless {

inline void MakeEmpty(WirelessLink& head) {
    head.next = head.previous = &head;
}

inline bool IsEmpty(const WirelessLink& head) {
    return head.next == &head;
}

// Before the head is the tail.
inline void InsertBefore(WirelessLink& place, WirelessLink& member) {
    member.previous = place.previous;
    member.next = &place;
    place.previous->next = &member;
    place.previous = &member;
}

// A list that frees its members when it goes.
template <typename T>
class OwnedList {
  public:
    OwnedList() { MakeEmpty(head_); }
    ~OwnedList() { WIRELESS_FREE_LIST(&head_, T); }
    OwnedList(const OwnedList&) = delete;
    OwnedList& operator=(const OwnedList&) = delete;

    WirelessLink* Head() { return &head_; }

    class Iterator {
      public:
        explicit Iterator(WirelessLink* member) : member_(member) {}
        T& operator*() const { return *WIRELESS_RECORD(member_, T); }
        Iterator& operator++() {
            member_ = member_->next;
            return *this;
        }
        bool operator!=(const Iterator& other) const { return member_ != other.member_; }

      private:
        WirelessLink* member_;
    };
    Iterator begin() { return Iterator(head_.next); }
    Iterator end() { return Iterator(&head_); }

  private:
    WirelessLink head_;
};

}  // namespace taviwireless::wireless

#endif
