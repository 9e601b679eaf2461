#pragma once
// One process-wide instance per derived class, made on first use.
//
//   class CLyFoo : public CLySingleton<CLyFoo> {
//     friend class CLySingleton<CLyFoo>;   // when the constructor is private
//     ...
//   };
//   CLyFoo::getInstance()->...;
//   CLyFoo::destroyInstance();            // the next getInstance() makes a new one
//
// No locking: instances are created and destroyed on the main loop only.

template <typename T>
class CLySingleton {
 public:
  virtual ~CLySingleton() = default;

  CLySingleton(const CLySingleton&) = delete;
  CLySingleton& operator=(const CLySingleton&) = delete;

  static T* getInstance() {
    if (!sInstance) sInstance = new T();
    return sInstance;
  }

  // Whether an instance exists now, without making one.
  static bool hasInstance() { return sInstance != nullptr; }

  // Deletes the instance through its virtual destructor. The pointer is
  // cleared first, so a destructor that reaches for the singleton cannot see
  // the half-destroyed object, and a second call does nothing.
  static void destroyInstance() {
    T* instance = sInstance;
    sInstance = nullptr;
    delete instance;
  }

 protected:
  CLySingleton() = default;

 private:
  static inline T* sInstance = nullptr;
};
