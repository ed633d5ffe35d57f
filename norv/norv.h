/* The C interface of the board's message-transport library, libnorv.so.
 *
 * Layouts and prototypes are exactly the library's binary interface: a program that is built with this header
 * runs with every library that offers the interface. Statuses and queue handles are 32-bit unsigned numbers.
 * A function without a comment on its result returns a status. */
#ifndef NORV_NORV_H
#define NORV_NORV_H

#include <stdint.h>

#ifdef __cplusplus
extern "C" {
#endif

enum {
    NVSTATUS_OK = 0,
    NVSTATUS_ERROR = 2 /* a failure; nvQueueOpen returns it too when it opens no queue */
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
    uint32_t transaction; /* bits 8 to 31: transaction number; bits 0 to 7: for the library's own use */
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

/* Makes the library ready for use. Call it once, with 0 and 0, before any other function. */
uint32_t nvDrvSetInterface(uint32_t, uint32_t);

/* Sets *msg to a new buffer for a body of `size` octets, which the caller owns. Leaves *msg unchanged when
 * there is no memory. */
uint32_t nvMsgAllocate(uint32_t size, NvMsg32Bit** msg);
/* Changes the size of the body. The buffer may move: *msg is set to its new place. */
uint32_t nvMsgReallocate(uint32_t size, NvMsg32Bit** msg);
uint32_t nvMsgFree(NvMsg32Bit* msg);

/* Reads or writes one fixed field, which is named by its index. */
uint32_t nvMsgFieldGet(NvMsg32Bit* msg, uint32_t index, void* value);
uint32_t nvMsgFieldPut(NvMsg32Bit* msg, uint32_t index, void* value);

/* Reads or writes body fields from *offset on, and advances *offset past them. The further arguments are
 * `count` pairs: a uint32_t descriptor (bits 11 to 18: number of elements less one; bits 19 to 23: element
 * type) and a void* to the elements. */
uint32_t nvMsgVarFieldGet(NvMsg32Bit* msg, uint32_t count, uint32_t* offset, ...);
uint32_t nvMsgVarFieldPut(NvMsg32Bit* msg, uint32_t count, uint32_t* offset, ...);

/* Returns the handle of a new queue, or NVSTATUS_ERROR. */
uint32_t nvQueueOpen(void);
/* Sets *host to the host address at which the queue receives. */
uint32_t nvQueueBind(uint32_t queue, NvCompDesc* host);
uint32_t nvQueueUnbind(uint32_t queue, NvCompDesc host);
uint32_t nvQueueClose(uint32_t queue);

/* Waits for the next message of the queue and sets *msg to its buffer, which the caller then owns. */
uint32_t nvMsgRead(uint32_t queue, uint32_t zero, NvMsg32Bit** msg);
/* Sends the message to its target address. The library becomes the owner of the buffer. */
uint32_t nvMsgWrite(uint32_t queue, NvMsg32Bit* msg, uint32_t zero);

#ifdef __cplusplus
}

static_assert(sizeof(NvCompDesc) == 8, "the ABI's layout");
static_assert(sizeof(NvMsg32Bit) == NVMSG_HEADER_SIZE, "the ABI's layout");
#endif

#endif
