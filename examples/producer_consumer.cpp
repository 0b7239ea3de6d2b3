// One thread produces items, another consumes them, and the queue between them holds eight. The
// producer sleeps while it is full, the consumer while it is empty; neither polls.

#include <cstdio>
#include <thread>

#include "vidshow/platform/queue.h"

struct Item {
    int number;
    char text[28];
};

static void Produce(CLNrwqueue* queue, int count) {
    // In place: the item is made where it stays, and nothing is copied.
    for (int i = 0; i < count; ++i) {
        auto* item = static_cast<Item*>(queue->GetWriteItem());
        item->number = i;
        std::snprintf(item->text, sizeof item->text, "item %d", i);
        queue->CommitWriteItem();
    }
    queue->EndOfFile();
}

int main() {
    CLNrwqueue queue(8, sizeof(Item));
    std::thread producer(Produce, &queue, 1000);

    int items = 0;
    long sum = 0;
    bool inOrder = true;
    // Copying: once ReadItem returns, the slot is the producer's again.
    for (Item item; queue.ReadItem(&item) != 0; ++items) {
        inOrder = inOrder && item.number == items;
        sum += item.number;
    }
    producer.join();

    std::printf("%d items, sum %ld, in order: %s\n", items, sum, inOrder ? "yes" : "no");
    // The end stays until somebody writes again: no reader blocks on a queue that is finished.
    std::printf("after the end: %d\n", queue.ReadItem(nullptr));
    return 0;
}
