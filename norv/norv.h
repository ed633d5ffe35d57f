/* The C interface of the board's message-transport library, libnorv.so.
 *
 * Layouts and prototypes are the library's ABI, to the letter: a program built against this header runs
 * against any library that offers it. Statuses and queue handles are 32-bit unsigned. */
#ifndef NORV_NORV_H
#define NORV_NORV_H

#include <stdint.h>

#ifdef __cplusplus
extern "C" {
#endif

enum {
    NVSTATUS_OK = 0,
    NVSTATUS_ERROR = 2 /* the failure value; also what nvQueueOpen returns when it opens nothing */
};

enum {
    NVMSG_HEADER_SIZE = 24, /* octets before the body */
    NVMSG_OVERHEAD = 48     /* a buffer is at least this much longer than its body */
};

/* The address of one component instance. */
typedef struct NvCompDesc {
    uint16_t instance;
    uint8_t board;
    uint8_t unused3;
    uint8_t processor;
    uint8_t component;
    uint8_t node;
    uint8_t unused7;
} NvCompDesc;

/* A message buffer: this header, in host byte order, followed by `size` octets of body. Body fields are
 * little-endian, packed, in field order. */
typedef struct NvMsg32Bit {
    uint32_t transaction; /* bits 8 to 31: transaction id; bits 0 to 7: the library's own */
    uint32_t type;
    uint16_t sourceInstance;
    uint8_t sourceBoard;
    uint8_t sourceProcessor;
    uint16_t targetInstance;
    uint8_t targetBoard;
    uint8_t targetProcessor;
    uint8_t sourceNode;
    uint8_t sourceComponent;
    uint8_t targetNode;
    uint8_t targetComponent;
    uint32_t size; /* of the body, octets */
} NvMsg32Bit;

/* Makes the library ready for use; called once, with 0 and 0, before anything else. */
uint32_t nvDrvSetInterface(uint32_t, uint32_t);

/* *msg becomes a new buffer for a body of `size` octets, or stays as it is when there is no memory. */
uint32_t nvMsgAllocate(uint32_t size, NvMsg32Bit** msg);
/* Changes the body's size; the buffer may move. */
uint32_t nvMsgReallocate(uint32_t size, NvMsg32Bit** msg);
uint32_t nvMsgFree(NvMsg32Bit* msg);

/* One fixed field, by index. */
uint32_t nvMsgFieldGet(NvMsg32Bit* msg, uint32_t index, void* value);
uint32_t nvMsgFieldPut(NvMsg32Bit* msg, uint32_t index, void* value);

/* A run of body fields at *offset, which advances past them. Then come `count` pairs: a uint32_t descriptor
 * (bits 11 to 18: element count less one; bits 19 to 23: element type) and a void* to the elements. */
uint32_t nvMsgVarFieldGet(NvMsg32Bit* msg, uint32_t count, uint32_t* offset, ...);
uint32_t nvMsgVarFieldPut(NvMsg32Bit* msg, uint32_t count, uint32_t* offset, ...);

uint32_t nvQueueOpen(void);
/* Fills in the host address under which the queue receives. */
uint32_t nvQueueBind(uint32_t queue, NvCompDesc* host);
uint32_t nvQueueUnbind(uint32_t queue, NvCompDesc host);
uint32_t nvQueueClose(uint32_t queue);

/* Waits for the next message of the queue; the caller owns the buffer. */
uint32_t nvMsgRead(uint32_t queue, uint32_t zero, NvMsg32Bit** msg);
/* Sends the message to its target address; the library takes the buffer over. */
uint32_t nvMsgWrite(uint32_t queue, NvMsg32Bit* msg, uint32_t zero);

#ifdef __cplusplus
}

static_assert(sizeof(NvCompDesc) == 8, "the ABI's layout");
static_assert(sizeof(NvMsg32Bit) == NVMSG_HEADER_SIZE, "the ABI's layout");
#endif

#endif
